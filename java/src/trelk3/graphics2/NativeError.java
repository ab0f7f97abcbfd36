package trelk3.graphics2;

/**
 * Raised by the native library for an internal error. The library prints
 * "Throwing: " and the message on standard output before raising it.
 */
public class NativeError extends RuntimeException {
    private static final long serialVersionUID = 1L;

    /** @param message text of the native error */
    public NativeError(String message) {
        super(message);
    }
}
