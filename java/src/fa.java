/**
 * Peer of the native {@code SseSprite}: a 32-bit ARGB image with trim offsets,
 * also usable as an offscreen colour target ({@link ja#d}). Entries that act on
 * an existing sprite take its {@link #nativeid}.
 */
public class fa {
    /** Address of the native sprite; 0 when none. Written by the library only. */
    public long nativeid;

    /** @return stored width in pixels */
    public native int da(long sprite);

    /** @return stored height in pixels */
    public native int GA(long sprite);

    /** @return full width including the trimmed columns */
    public native int WA(long sprite);

    /** @return full height including the trimmed rows */
    public native int ba(long sprite);

    /** Sets the four trim offsets. */
    public native void U(long sprite, int left, int top, int right, int bottom);

    /** Reads the trim offsets. @param out receives left, top, right, bottom */
    public native void F(long sprite, int[] out);

    /** Creates a sprite of width × height (undefined pixels) and binds it. @param unused not read */
    public native void UA(int unused, int width, int height);

    /**
     * Creates a sprite from ARGB pixels and binds it.
     *
     * @param unused not read
     * @param pixels source pixels from index 0
     * @param unused2 not read
     * @param stride source row stride in pixels
     * @param key true: 0 stays 0, other pixels get alpha 0xFF
     */
    public native void RA(Object unused, int[] pixels, int unused2, int stride, int width, int height, boolean key);

    /**
     * Creates a sprite from palettised pixels and binds it.
     *
     * @param unused not read
     * @param palette ARGB colours
     * @param indices palette index per pixel
     * @param alpha alpha per pixel; may be null (index 0 is then transparent)
     * @param unused2 not read
     * @param stride source row stride
     */
    public native void EA(Object unused, int[] palette, byte[] indices, byte[] alpha, int unused2, int stride,
            int width, int height);

    /**
     * Creates a sprite from a rectangle of the current colour buffer. Exported only
     * under a decorated native symbol, so the JVM never binds this method: calling
     * it raises {@link UnsatisfiedLinkError}.
     */
    public native void K(Object a, Object b, int x, int y, int width, int height, boolean key);

    /** Copies a rectangle of the colour buffer at (screenx, screeny) into the sprite at (x, y). */
    public native void ea(long sprite, int x, int y, int width, int height, int screenx, int screeny);

    /** Replaces the sprite's alpha from the colour buffer. @param channel 0 red, 1 green, 2 blue, 3 non-zero */
    public native void j(long sprite, int screenx, int screeny, int channel);

    /** Copies pixels[offset + j·stride + i] into the sprite's rectangle at (x, y). */
    public native void na(long sprite, int x, int y, int width, int height, int[] pixels, int offset, int stride);

    /** Destroys the sprite and clears {@link #nativeid}. */
    public native void M(long sprite);

    /** Draws the sprite at (x, y). @param op colour operation 0-4 @param blend blend mode 0-2 */
    public native void Y(long sprite, int x, int y, int op, int colour, int blend);

    /** Draws the sprite scaled to width × height. */
    public native void ha(long sprite, int x, int y, int width, int height, int op, int colour, int blend);

    /** Draws the sprite scaled and depth-tested at {@code depth}. */
    public native void G(long sprite, int x, int y, int depth, int width, int height, int op, int colour,
            int blend);

    /** Draws the sprite alpha-blended inside a clipping mask. @param mask native id of the mask */
    public native void o(long sprite, int x, int y, long mask, int maskx, int masky);

    /** Tiles the sprite over a rectangle. */
    public native void aa(long sprite, int x, int y, int width, int height, int op, int colour, int blend);

    /** Draws the sprite as a parallelogram with corners P0 (top-left), P1 (top-right), P2 (bottom-left). */
    public native void e(long sprite, float x0, float y0, float x1, float y1, float x2, float y2, int op,
            int colour, int blend);

    /**
     * Draws the sprite as a parallelogram inside a clipping mask.
     *
     * @param unused not read
     * @param mask native id of the mask
     * @param replace true: replace pixels; false: alpha-blend
     */
    public native void FA(long sprite, float x0, float y0, float x1, float y1, float x2, float y2, int unused,
            long mask, int maskx, int masky, boolean replace);
}
