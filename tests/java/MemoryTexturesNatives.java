/**
 * Test-only natives (tests/java/native/MemoryTexturesNatives.cpp) that allocate
 * blocks in the pool behind a pool peer and fetch textures through a product
 * toolkit's texture cache.
 */
final class MemoryTexturesNatives {
    private MemoryTexturesNatives() {}

    /** Allocates {@code size} bytes filled with a pattern; returns the holder's handle. */
    static native long allocate(ba pool, int size);
    /** True when the holder still sees its pattern at its block's current address. */
    static native boolean intact(long holder);
    static native void release(long holder);
    static native int capacity(ba pool);
    /** Native address of the toolkit's pool, and of a pool peer's pool. */
    static native long toolkitPool(long toolkit);
    static native long poolAddress(ba pool);
    /** {texel (0,0), texel (127,127), average HSL, scroll offset u} of the fetched slot, or null. */
    static native int[] gettex(long toolkit, int id);
    /** {average HSL, transparency, wrapu, scrollu} of an id's metrics, or null. */
    static native int[] metrics(long toolkit, int id);
}
