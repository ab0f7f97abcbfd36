import java.io.File;
import java.io.IOException;


/**
 * A 2D test card: rectangles in the three modes (replace, blend, add), lines,
 * discs, shapes confined by a clipping mask, and text in the three font kinds,
 * normal and upwards. Drawn into an offscreen sprite and written as a PNG.
 */
public final class TestCard2D {
    private TestCard2D() {}

    /** 5 x 7 letters, one string per row, '#' set. */
    private static final String CHARS = "PAVOQEN2D ";
    private static final String[][] SHAPES = {
        {"####.", "#...#", "#...#", "####.", "#....", "#....", "#...."},
        {".###.", "#...#", "#...#", "#####", "#...#", "#...#", "#...#"},
        {"#...#", "#...#", "#...#", "#...#", ".#.#.", ".#.#.", "..#.."},
        {".###.", "#...#", "#...#", "#...#", "#...#", "#...#", ".###."},
        {".###.", "#...#", "#...#", "#...#", "#.#.#", "#..#.", ".##.#"},
        {"#####", "#....", "#....", "####.", "#....", "#....", "#####"},
        {"#...#", "##..#", "#.#.#", "#..##", "#...#", "#...#", "#...#"},
        {".###.", "#...#", "....#", "...#.", "..#..", ".#...", "#####"},
        {"####.", "#...#", "#...#", "#...#", "#...#", "#...#", "####."},
        {".....", ".....", ".....", ".....", ".....", ".....", "....."},
    };

    /** Glyph bytes: set pixels get {@code on}, their right and lower neighbours {@code edge} when empty. */
    private static byte[][] glyphs(int on, int edge) {
        byte[][] g = new byte[SHAPES.length][];
        for (int c = 0; c < SHAPES.length; ++c) {
            g[c] = new byte[5 * 7];
            for (int y = 0; y < 7; ++y)
                for (int x = 0; x < 5; ++x) {
                    boolean set = SHAPES[c][y].charAt(x) == '#';
                    boolean near = (x > 0 && SHAPES[c][y].charAt(x - 1) == '#')
                            || (y > 0 && SHAPES[c][y - 1].charAt(x) == '#');
                    g[c][y * 5 + x] = (byte) (set ? on : near ? edge : 0);
                }
        }
        return g;
    }

    private static int[] filled(int n, int v) {
        int[] a = new int[n];
        java.util.Arrays.fill(a, v);
        return a;
    }

    private interface Plot {
        void letter(int glyph, int x, int y);
    }

    private static void text(String s, int x, int y, int dx, int dy, Plot p) {
        for (int i = 0; i < s.length(); ++i) {
            int g = CHARS.indexOf(s.charAt(i));
            if (g >= 0) p.letter(g, x + i * dx, y + i * dy);
        }
    }

    /** Draws the card over the whole current target of {@code tk} (at least 320 x 240). */
    public static void draw(ja tk, ba pool, int w, int h) {
        tk.L();
        tk.ba(3, 0xFF202830);
        // rectangles: replace, blend and add over a striped ground
        for (int i = 0; i < 8; ++i) tk.B(10 + i * 12, 10, 6, 90, 0xFFC0C0C0, 0);
        tk.B(10, 10, 90, 25, 0xFFD02020, 0);
        tk.B(10, 40, 90, 25, 0x8020D020, 1);
        tk.B(10, 70, 90, 25, 0x00303090, 2);
        // lines: a fan, and runs
        for (int a = 0; a < 16; ++a) {
            double t = a * Math.PI / 30;
            tk.YA(110, 100, 110 + (int) (90 * Math.cos(t)), 100 - (int) (90 * Math.sin(t)), 0xFFFFFF00, 0);
        }
        tk.XA(10, 105, 200, 0xFF00FFFF, 0);
        tk.G(205, 10, 95, 0x80FF00FF, 1);
        // discs in the three modes
        tk.CA(250, 50, 30, 0xFF3060F0, 0);
        tk.CA(275, 60, 25, 0x80F0F060, 1);
        tk.CA(260, 80, 20, 0x00606060, 2);
        // a diamond mask: a masked clear and masked lines through it
        int rows = 61;
        int[] starts = new int[rows], lengths = new int[rows];
        for (int r = 0; r < rows; ++r) {
            int half = 30 - Math.abs(r - 30);
            starts[r] = 30 - half;
            lengths[r] = 2 * half + 1;
        }
        wa mask = new wa();
        mask.l(null, pool, 61, 61, starts, lengths);
        try {
            tk.DA(0xFF405060, mask, 20, 120);
            for (int i = 0; i < 61; i += 4) tk.R(10, 120 + i, 90, 120 + i + 20, 0xFFFF8000, 0, mask, 20, 120);
            // text in the three font kinds, one of them confined by the mask
            int n = SHAPES.length;
            m mono = new m();
            mono.n(null, pool, glyphs(1, 0), filled(n, 5), filled(n, 7), filled(n, 0), filled(n, 0));
            ea alpha = new ea();
            alpha.n(null, pool, glyphs(255, 96), filled(n, 5), filled(n, 7), filled(n, 0), filled(n, 0));
            ia pal = new ia();
            pal.EA(null, pool, glyphs(1, 2), new int[] {0, 0xFFFFD040, 0xFF603000}, filled(n, 5), filled(n, 7),
                    filled(n, 0), filled(n, 0));
            try {
                text("PAVOQEN 2D", 110, 130, 7, 0, (g, x, y) -> mono.UA(g, x, y, 0xFFFFFFFF, false));
                text("PAVOQEN 2D", 110, 145, 7, 0, (g, x, y) -> mono.UA(g, x, y, 0x80FFFFFF, false));
                text("PAVOQEN 2D", 110, 160, 7, 0, (g, x, y) -> alpha.UA(g, x, y, 0xFF80FF80, false));
                text("PAVOQEN 2D", 110, 175, 7, 0, (g, x, y) -> pal.UA(g, x, y, 0, false));
                text("PAVOQEN 2D", 110, 190, 7, 0, (g, x, y) -> pal.UA(g, x, y, 0xFFFF4040, true));
                text("PAVOQEN", 12, 140, 7, 0, (g, x, y) -> mono.MA(g, x, y, 0xFF000000, false, mask, 20, 120));
                text("PAVOQEN 2D", 190, 230, 0, -6, (g, x, y) -> mono.f(g, x, y, 0xFFFFFFFF, false));
                text("PAVOQEN 2D", 200, 230, 0, -6, (g, x, y) -> alpha.f(g, x, y, 0xFFFFA0A0, false));
                text("PAVOQEN 2D", 210, 230, 0, -6, (g, x, y) -> pal.f(g, x, y, 0, false));
            } finally {
                mono.ma();
                alpha.ma();
                pal.ma();
            }
        } finally {
            mask.ma();
        }
    }

    /** Renders the card offscreen at width x height and writes it to {@code png}. */
    public static void renderPng(ja tk, int width, int height, File png) throws IOException {
        OffscreenPng.render(tk, width, height, 1 << 20, png, TestCard2D::draw);
    }
}
