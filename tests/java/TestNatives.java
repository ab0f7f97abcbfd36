/**
 * Test-only natives (tests/java/native, libpavoqen_testnatives.so) that drive the
 * Java bridge directly: exception kinds, zero results, peer binding and the
 * array wrappers, and a read-only view of a product toolkit's state.
 */
final class TestNatives {
    private TestNatives() {}

    // Exception kinds understood by raise() and the *Result() methods.
    static final int EXCEPTION = 0, RUNTIME = 1, CLASS_CAST = 2, NULL_POINTER = 3, OUT_OF_MEMORY = 4,
            ILLEGAL_ARGUMENT = 5, ILLEGAL_STATE = 6, NUMBER_FORMAT = 7, INDEX_5_OF_3 = 8, NATIVE_ERROR = 9,
            STD_EXCEPTION = 10, NOT_AN_EXCEPTION = 11;
    /** A kind below 0 makes the *Result() methods succeed. */
    static final int NONE = -1;

    // Bound classes understood by bind()/lookup().
    static final int TOOLKIT = 0, MEMORYPOOL = 1, MODEL = 2, SPRITE = 3, DEPTHBUFFER = 4, CLIPPINGMASK = 5,
            GROUND = 6, FONT_MONO = 7, FONT_PALETTED = 8, FONT_ALPHA = 9, SHADOW = 10, THREADRESOURCE = 11,
            CANVAS = 12;

    /** Throws the native exception of {@code kind} with {@code message} through the entry wrapper. */
    static native void raise(int kind, String message);

    /** 42, or the wrapper's result after throwing {@code kind}. */
    static native int intResult(int kind);
    static native boolean booleanResult(int kind);
    static native int[] arrayResult(int kind);
    static native Object objectResult(Object value, int kind);
    /** What the last *Result() call returned to Java (readable after its exception). */
    static native int lastInt();
    static native boolean lastBoolean();
    static native boolean lastArrayWasNull();
    static native boolean lastObjectWasNull();

    /** Redirects the process's standard output (file descriptor 1) into a file until endCapture(). */
    static native void captureStdout();
    static native String endCapture();

    /** objconvert set_X / get_X for bound class {@code cls}. */
    static native void bind(int cls, Object peer, long address);
    static native long lookup(int cls, Object peer);

    /** Adds 1 to (or toggles) every element through a copied or pinned wrapper; returns the length seen. */
    static native int copiedInts(int[] a, boolean readOnly);
    static native int copiedBytes(byte[] a, boolean readOnly);
    static native int copiedBooleans(boolean[] a, boolean readOnly);
    static native int copiedFloats(float[] a, boolean readOnly);
    static native int pinnedInts(int[] a, boolean readOnly);
    static native int pinnedBooleans(boolean[] a, boolean readOnly);

    /** Pins (or copies) {@code a} read-write, sets a[0] = 99, then throws {@code kind}. */
    static native void pinThenRaise(int[] a, int kind);
    static native void copyThenRaise(int[] a, int kind);
    /** Pins both arrays together after checking n elements in each; adds 1 to every element. */
    static native void pinTwo(int[] a, float[] b, int n);
    /** pin_count() seen inside the last pinThenRaise or pinTwo (-1: pinTwo pinned nothing). */
    static native int pinsInside();
    /** Arrays pinned at this moment by the test library's wrappers (the product library counts its own). */
    static native int pinCount();
    /** {length, elements == null ? 1 : 0, change of pin_count} for a pinned null array. */
    static native int[] pinnedNull();
    /** The wrappers' length checks. */
    static native void need(int[] a, int n);
    static native void needRange(int[] a, int offset, int n);

    /** Camera, projection and view-projection: 48 floats, row by row. */
    static native float[] matrices(long toolkit);
    /** Point light count, then x, y, z, scale of each of the four lights. */
    static native float[] pointLights(long toolkit);
    static native int[] pointLightColours(long toolkit);
}
