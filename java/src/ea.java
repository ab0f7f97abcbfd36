/**
 * Peer of the native {@code SseFontAlpha}: a font whose glyph bytes are alpha values.
 * A glyph index is the low 16 bits of the argument as a signed short.
 */
public class ea {
    /** Address of the native font; 0 when none. Written by the library only. */
    public long nativeid;

    /**
     * Creates the font (arrays copied into the pool) and binds it.
     *
     * @param unused not read
     * @param pool memory pool
     * @param glyphs pixel bytes per glyph (a null element is an empty glyph)
     */
    public native void n(Object unused, ba pool, byte[][] glyphs, int[] widths, int[] heights, int[] xoffsets,
            int[] yoffsets);

    /** Draws a glyph at (x, y). @param flag not read by this font */
    public native void UA(int glyph, int x, int y, int colour, boolean flag);

    /** Draws a glyph confined by a clipping mask placed at (maskx, masky). @param mask mask peer; null: unmasked */
    public native void P(int glyph, int x, int y, int colour, boolean flag, wa mask, int maskx, int masky);

    /** Draws a glyph rotated to run upwards. */
    public native void f(int glyph, int x, int y, int colour, boolean flag);

    /** Destroys the font if bound and clears {@link #nativeid}. */
    public native void ma();
}
