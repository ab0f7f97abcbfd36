/**
 * Peer of the native {@code SseOffScreenFrameBuffer}: copies between an
 * offscreen sprite and depth buffer pair and the toolkit's current target. All
 * objects are passed as native ids.
 */
public class o {
    /** Native id slot kept for symmetry with the other peers; the library does not bind this class. */
    public long nativeid;

    /** Copies a rectangle from the pair into the current target. */
    public native void BA(long toolkit, long sprite, long depthbuffer, int srcx, int srcy, int width, int height,
            int dstx, int dsty, boolean colour, boolean depth);

    /** Copies a rectangle from the current target into the pair. */
    public native void AA(long toolkit, long sprite, long depthbuffer, int srcx, int srcy, int width, int height,
            int dstx, int dsty, boolean colour, boolean depth);
}
