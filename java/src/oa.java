/**
 * Peer of the native {@code SseDepthBuffer}: a float depth buffer used with an
 * offscreen sprite as a render target ({@link ja#d}).
 */
public class oa {
    /** Address of the native depth buffer; 0 when none. Written by the library only. */
    public long nativeid;

    /** Creates a depth buffer of width × height and binds it. */
    public native void g(int width, int height);

    /** Destroys the depth buffer (if non-zero) and clears {@link #nativeid}. @param depthbuffer its native id */
    public native void za(long depthbuffer);
}
