/**
 * Peer of the native {@code SseFontPaletted}: a font whose glyph bytes index a palette.
 * A glyph index is the low 16 bits of the argument as a signed short.
 */
public class ia {
    /** Address of the native font; 0 when none. Written by the library only. */
    public long nativeid;

    /**
     * Creates the font (arrays copied into the pool) and binds it.
     *
     * @param unused not read
     * @param pool memory pool
     * @param glyphs pixel bytes per glyph (a null element is an empty glyph)
     * @param palette ARGB colour per index (index 0 is never drawn)
     */
    public native void EA(Object unused, ba pool, byte[][] glyphs, int[] palette, int[] widths, int[] heights,
            int[] xoffsets, int[] yoffsets);

    /** Draws a glyph at (x, y). @param flag true: every non-zero glyph pixel in {@code colour}; false: palette colours */
    public native void UA(int glyph, int x, int y, int colour, boolean flag);

    /** Draws a glyph confined by a clipping mask placed at (maskx, masky). @param mask mask peer; null: unmasked */
    public native void GA(int glyph, int x, int y, int colour, boolean flag, wa mask, int maskx, int masky);

    /** Draws a glyph rotated to run upwards. */
    public native void f(int glyph, int x, int y, int colour, boolean flag);

    /** Destroys the font if bound and clears {@link #nativeid}. */
    public native void ma();
}
