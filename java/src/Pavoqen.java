/**
 * Small helpers for clients of the native renderer: loading the library and the
 * few calls whose short native names are hardest to remember. Each peer class
 * documents its own native methods.
 */
public final class Pavoqen {
    private static volatile boolean loaded;

    private Pavoqen() {}

    /**
     * Loads {@code libpavoqen_sse} from {@code java.library.path}. The AWT native
     * interface is loaded first when available (it is missing or unusable in a
     * headless JVM, which then simply has no canvas support). Calling it again does
     * nothing.
     */
    public static synchronized void loadLibrary() {
        if (loaded) return;
        try {
            System.loadLibrary("jawt");
        } catch (UnsatisfiedLinkError | SecurityException e) {
            // headless: no window presentation
        }
        System.loadLibrary("pavoqen_sse");
        loaded = true;
    }

    /**
     * Creates the toolkit (always the first native object).
     *
     * @param source texture source; null creates no texture cache
     * @param textureIds number of texture ids the cache keeps metrics for
     * @return the bound toolkit peer
     */
    public static ja createToolkit(ja.TextureSource source, int textureIds) {
        ja tk = new ja(source);
        tk.q(source, textureIds);
        return tk;
    }

    /** @return the clipping rectangle: left, top, right (exclusive), bottom (exclusive) */
    public static int[] clipping(ja tk) {
        int[] out = new int[4];
        tk.qa(out);
        return out;
    }

    /** @return the viewport: x, y, width, height */
    public static int[] viewport(ja tk) {
        int[] out = new int[4];
        tk.xa(out);
        return out;
    }

    /** Sets the camera (view) matrix from 16 floats, row by row. */
    public static void setCamera(ja tk, float[] m) {
        tk.AA(m);
    }

    /** Sets the projection matrix from 16 floats, row by row. */
    public static void setProjection(ja tk, float[] m) {
        tk.wa(m);
    }

    /** Sets the clipping rectangle (right and bottom exclusive). */
    public static void setClipping(ja tk, int left, int top, int right, int bottom) {
        tk.r(left, top, right, bottom);
    }
}
