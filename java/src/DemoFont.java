/**
 * A 5 × 7 pixel font for the demo, built into glyph tables for the three font
 * kinds: on/off bytes (mono), coverage bytes (alpha, smoothed) and palette
 * indices (paletted, shaded top to bottom). Glyph index = character code;
 * lower case is drawn as upper case.
 */
final class DemoFont {
    static final int COLS = 5, ROWS = 7, GLYPHS = 128;
    private static final String CHARS = "0123456789ABCDEFGHIJKLMNOPQRSTUVWXYZ.:-/%()=+";
    private static final int[][] ROWS_OF = {
        {0x0E, 0x11, 0x13, 0x15, 0x19, 0x11, 0x0E}, {0x04, 0x0C, 0x04, 0x04, 0x04, 0x04, 0x0E},
        {0x0E, 0x11, 0x01, 0x02, 0x04, 0x08, 0x1F}, {0x1F, 0x02, 0x04, 0x02, 0x01, 0x11, 0x0E},
        {0x02, 0x06, 0x0A, 0x12, 0x1F, 0x02, 0x02}, {0x1F, 0x10, 0x1E, 0x01, 0x01, 0x11, 0x0E},
        {0x06, 0x08, 0x10, 0x1E, 0x11, 0x11, 0x0E}, {0x1F, 0x01, 0x02, 0x04, 0x08, 0x08, 0x08},
        {0x0E, 0x11, 0x11, 0x0E, 0x11, 0x11, 0x0E}, {0x0E, 0x11, 0x11, 0x0F, 0x01, 0x02, 0x0C},
        {0x0E, 0x11, 0x11, 0x11, 0x1F, 0x11, 0x11}, {0x1E, 0x11, 0x11, 0x1E, 0x11, 0x11, 0x1E},
        {0x0E, 0x11, 0x10, 0x10, 0x10, 0x11, 0x0E}, {0x1C, 0x12, 0x11, 0x11, 0x11, 0x12, 0x1C},
        {0x1F, 0x10, 0x10, 0x1E, 0x10, 0x10, 0x1F}, {0x1F, 0x10, 0x10, 0x1E, 0x10, 0x10, 0x10},
        {0x0E, 0x11, 0x10, 0x17, 0x11, 0x11, 0x0F}, {0x11, 0x11, 0x11, 0x1F, 0x11, 0x11, 0x11},
        {0x0E, 0x04, 0x04, 0x04, 0x04, 0x04, 0x0E}, {0x07, 0x02, 0x02, 0x02, 0x02, 0x12, 0x0C},
        {0x11, 0x12, 0x14, 0x18, 0x14, 0x12, 0x11}, {0x10, 0x10, 0x10, 0x10, 0x10, 0x10, 0x1F},
        {0x11, 0x1B, 0x15, 0x15, 0x11, 0x11, 0x11}, {0x11, 0x11, 0x19, 0x15, 0x13, 0x11, 0x11},
        {0x0E, 0x11, 0x11, 0x11, 0x11, 0x11, 0x0E}, {0x1E, 0x11, 0x11, 0x1E, 0x10, 0x10, 0x10},
        {0x0E, 0x11, 0x11, 0x11, 0x15, 0x12, 0x0D}, {0x1E, 0x11, 0x11, 0x1E, 0x14, 0x12, 0x11},
        {0x0F, 0x10, 0x10, 0x0E, 0x01, 0x01, 0x1E}, {0x1F, 0x04, 0x04, 0x04, 0x04, 0x04, 0x04},
        {0x11, 0x11, 0x11, 0x11, 0x11, 0x11, 0x0E}, {0x11, 0x11, 0x11, 0x11, 0x11, 0x0A, 0x04},
        {0x11, 0x11, 0x11, 0x15, 0x15, 0x15, 0x0A}, {0x11, 0x11, 0x0A, 0x04, 0x0A, 0x11, 0x11},
        {0x11, 0x11, 0x11, 0x0A, 0x04, 0x04, 0x04}, {0x1F, 0x01, 0x02, 0x04, 0x08, 0x10, 0x1F},
        {0x00, 0x00, 0x00, 0x00, 0x00, 0x0C, 0x0C}, {0x00, 0x0C, 0x0C, 0x00, 0x0C, 0x0C, 0x00},
        {0x00, 0x00, 0x00, 0x1F, 0x00, 0x00, 0x00}, {0x00, 0x01, 0x02, 0x04, 0x08, 0x10, 0x00},
        {0x18, 0x19, 0x02, 0x04, 0x08, 0x13, 0x03}, {0x02, 0x04, 0x08, 0x08, 0x08, 0x04, 0x02},
        {0x08, 0x04, 0x02, 0x02, 0x02, 0x04, 0x08}, {0x00, 0x00, 0x1F, 0x00, 0x1F, 0x00, 0x00},
        {0x00, 0x04, 0x04, 0x1F, 0x04, 0x04, 0x00},
    };

    /** Glyph bitmaps, widths, heights and offsets ready for the font peers. */
    static final class Tables {
        final byte[][] glyphs = new byte[GLYPHS][];
        final int[] widths = new int[GLYPHS], heights = new int[GLYPHS];
        final int[] xoffsets = new int[GLYPHS], yoffsets = new int[GLYPHS];
        /** Horizontal pen advance per character. */
        final int advance;

        Tables(int advance) {
            this.advance = advance;
        }
    }

    private DemoFont() {}

    private static boolean bit(int code, int col, int row) {
        int i = CHARS.indexOf(Character.toUpperCase((char) code));
        if (i < 0 || col < 0 || col >= COLS || row < 0 || row >= ROWS) return false;
        return (ROWS_OF[i][row] >> (COLS - 1 - col) & 1) != 0;
    }

    private static boolean drawable(int code) {
        return CHARS.indexOf(Character.toUpperCase((char) code)) >= 0;
    }

    /** On/off glyphs, each font pixel a scale × scale block. */
    static Tables mono(int scale) {
        Tables t = new Tables((COLS + 1) * scale);
        for (int c = 0; c < GLYPHS; c++) {
            if (!drawable(c)) continue;
            int w = COLS * scale, h = ROWS * scale;
            byte[] g = new byte[w * h];
            for (int y = 0; y < h; y++)
                for (int x = 0; x < w; x++) g[y * w + x] = (byte) (bit(c, x / scale, y / scale) ? 1 : 0);
            put(t, c, g, w, h, 0);
        }
        return t;
    }

    /** Coverage glyphs: scaled up, then smoothed with a 3 × 3 binomial filter. */
    static Tables alpha(int scale) {
        Tables t = new Tables((COLS + 1) * scale);
        for (int c = 0; c < GLYPHS; c++) {
            if (!drawable(c)) continue;
            int w = COLS * scale + 2, h = ROWS * scale + 2;
            byte[] g = new byte[w * h];
            int[] k = {1, 2, 1};
            for (int y = 0; y < h; y++)
                for (int x = 0; x < w; x++) {
                    int sum = 0;
                    for (int j = -1; j <= 1; j++)
                        for (int i = -1; i <= 1; i++) {
                            int sx = x + i - 1, sy = y + j - 1;
                            if (sx >= 0 && sy >= 0 && bit(c, sx / scale, sy / scale)) sum += k[i + 1] * k[j + 1];
                        }
                    g[y * w + x] = (byte) Math.min(255, sum * 255 / 16);
                }
            put(t, c, g, w, h, -1);
        }
        return t;
    }

    /** Palette-index glyphs: index 1 + (row * 7 / height), shading the letter top to bottom. */
    static Tables paletted(int scale) {
        Tables t = new Tables((COLS + 1) * scale);
        for (int c = 0; c < GLYPHS; c++) {
            if (!drawable(c)) continue;
            int w = COLS * scale, h = ROWS * scale;
            byte[] g = new byte[w * h];
            for (int y = 0; y < h; y++)
                for (int x = 0; x < w; x++)
                    g[y * w + x] = (byte) (bit(c, x / scale, y / scale) ? 1 + y * 7 / h : 0);
            put(t, c, g, w, h, 0);
        }
        return t;
    }

    /** Eight entries: 0 unused, 1..7 from {@code top} to {@code bottom}. */
    static int[] gradient(int top, int bottom) {
        int[] p = new int[8];
        for (int i = 1; i < 8; i++) {
            int r = lerp(top >> 16 & 255, bottom >> 16 & 255, i - 1, 6);
            int g = lerp(top >> 8 & 255, bottom >> 8 & 255, i - 1, 6);
            int b = lerp(top & 255, bottom & 255, i - 1, 6);
            p[i] = 0xFF000000 | r << 16 | g << 8 | b;
        }
        return p;
    }

    private static int lerp(int a, int b, int i, int n) {
        return a + (b - a) * i / n;
    }

    private static void put(Tables t, int c, byte[] g, int w, int h, int offset) {
        t.glyphs[c] = g;
        t.widths[c] = w;
        t.heights[c] = h;
        t.xoffsets[c] = offset;
        t.yoffsets[c] = offset;
    }
}
