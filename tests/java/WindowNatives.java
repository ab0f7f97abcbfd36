import java.awt.Component;

/**
 * Test-only natives (libpavoqen_testnatives) for the window tests and the
 * presentation benchmark: read back a component's window through AWT's own X
 * connection, and reach the toolkit's current colour buffer through the
 * toolkit peer's native id.
 */
final class WindowNatives {
    static {
        TestSupport.loadTestNatives();
    }

    private WindowNatives() {}

    /** Window pixels as 0x00RRGGBB, row by row; null when unreadable. */
    static native int[] grab(Component c, int x, int y, int w, int h);

    static native boolean serverHasShm(Component c);

    /** Waits until the X server has carried out everything sent so far. */
    static native void sync(Component c);

    static native long colourBuffer(long toolkit);

    static native void fill(long toolkit, int x, int y, int w, int h, int colour);

    /** Pixel (x, y) becomes (x << 12) | y. */
    static native void coordinates(long toolkit);
}
