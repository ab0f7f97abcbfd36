/**
 * Peer of the native {@code SseClippingMask}: per-row spans that confine 2D
 * drawing, placed at a screen position by each drawing call.
 */
public class wa {
    /** Address of the native mask; 0 when none. Written by the library only. */
    public long nativeid;

    /**
     * Creates the mask (copied into the pool) and binds it.
     *
     * @param unused not read
     * @param pool memory pool
     * @param starts per row, x of the first covered pixel; may be null (no rows)
     * @param lengths per row, number of covered pixels
     */
    public native void l(Object unused, ba pool, int width, int height, int[] starts, int[] lengths);

    /** Destroys the mask if bound and clears {@link #nativeid} (harmless twice). */
    public native void ma();
}
