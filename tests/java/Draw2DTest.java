import static org.junit.jupiter.api.Assertions.*;

import org.junit.jupiter.api.AfterEach;
import org.junit.jupiter.api.BeforeAll;
import org.junit.jupiter.api.BeforeEach;
import org.junit.jupiter.api.Test;

/**
 * The 2D entries of the toolkit, clipping masks and the three fonts, each
 * drawn into an offscreen sprite target and read back with the toolkit's
 * pixel read-back.
 */
class Draw2DTest {
    static final int W = 40, H = 30;

    OffscreenTarget target;
    ja tk;
    ba pool;

    @BeforeAll
    static void load() {
        TestSupport.load();
    }

    @BeforeEach
    void target() {
        target = new OffscreenTarget(W, H);
        tk = target.tk;
        pool = target.pool;
    }

    @AfterEach
    void release() {
        target.close();
    }

    int[] pixels() {
        return tk.E(0, 0, W, H);
    }

    int at(int[] p, int x, int y) {
        return p[y * W + x];
    }

    /** Pixels that differ from colour 0, as "x,y" strings in row order. */
    String drawn() {
        int[] p = pixels();
        StringBuilder b = new StringBuilder();
        for (int y = 0; y < H; ++y)
            for (int x = 0; x < W; ++x)
                if (p[y * W + x] != 0) b.append(x).append(',').append(y).append(' ');
        return b.toString().trim();
    }

    // ---------------------------------------------------------------- toolkit

    @Test
    void rectanglesInEveryMode() {
        tk.B(0, 0, W, H, 0xFF0000FF, 0);
        tk.B(2, 2, 3, 3, 0x80FF0000, 1);
        tk.B(10, 10, 2, 2, 0x00808080, 0);
        tk.B(10, 10, 1, 1, 0x00909090, 2);
        tk.B(-5, -5, 7, 7, 0xFF123456, 1);
        int[] p = pixels();
        assertEquals(0x807F007F, at(p, 3, 3));
        assertEquals(0x00FFFFFF, at(p, 10, 10));
        assertEquals(0x00808080, at(p, 11, 11));
        assertEquals(0xFF123456, at(p, 0, 0));
        assertEquals(0xFF123456, at(p, 1, 1));
        assertEquals(0xFF0000FF, at(p, 2, 0));
        assertThrows(IllegalArgumentException.class, () -> tk.B(-100, -100, 5, 5, 0, 3));
        assertArrayEquals(p, pixels(), "a rejected mode draws nothing");
    }

    @Test
    void clearsRespectTheClipAndFlags() {
        tk.B(0, 0, W, H, 0x11111111, 0);
        tk.r(10, 10, 20, 20);
        tk.ba(1, 0xFFABCDEF);
        int[] p = pixels();
        for (int y = 0; y < H; ++y)
            for (int x = 0; x < W; ++x) {
                boolean inside = x >= 10 && x < 20 && y >= 10 && y < 20;
                assertEquals(inside ? 0xFFABCDEF : 0x11111111, at(p, x, y), x + "," + y);
            }
        tk.L();
        tk.ba(0, 0x22222222);
        assertArrayEquals(p, pixels(), "no flags, no clear");
        tk.ba(2, 0x22222222);
        assertArrayEquals(p, pixels(), "the depth flag leaves the colours");
        // with the depth cleared to far, a disc (drawn at depth 0) passes the depth test
        tk.CA(5, 5, 0, 0xFF00FF00, 0);
        assertEquals(0xFF00FF00, at(pixels(), 5, 5));
    }

    @Test
    void linesAndRuns() {
        tk.YA(0, 0, 3, 1, -1, 0);
        assertEquals("0,0 1,0 2,1 3,1", drawn());
        tk.ba(1, 0);
        tk.YA(5, 5, 5, 5, -1, 0);
        assertEquals("5,5", drawn());
        tk.ba(1, 0);
        tk.XA(-2, 3, 5, 7, 0);
        tk.G(30, 28, 5, 9, 0);
        assertEquals("0,3 1,3 2,3 30,28 30,29", drawn());
        tk.XA(0, -1, 10, 7, 3);  // row outside the clip: the mode is not looked at
        tk.G(W, 0, 10, 7, 3);
        assertThrows(IllegalArgumentException.class, () -> tk.XA(0, 1, 10, 7, 3));
        assertThrows(IllegalArgumentException.class, () -> tk.YA(-9, -9, -5, -9, 7, 3));
        // long lines never reach outside the clip
        tk.ba(1, 0);
        tk.r(5, 5, 35, 25);
        tk.YA(-60000, -40000, 60000, 40000, -1, 0);
        tk.YA(Integer.MIN_VALUE, 10, Integer.MAX_VALUE, 12, -1, 0);
        int[] p = pixels();
        for (int y = 0; y < H; ++y)
            for (int x = 0; x < W; ++x)
                if (p[y * W + x] != 0) assertTrue(x >= 5 && x < 35 && y >= 5 && y < 25, x + "," + y);
    }

    @Test
    void circles() {
        tk.CA(20, 15, 0, 0xFFFFFFFF, 0);
        assertEquals("20,15", drawn());
        tk.ba(1, 0);
        tk.CA(20, 15, 6, 0xFFFFFFFF, 0);
        int[] p = pixels();
        for (int y = 0; y < H; ++y)
            for (int x = 0; x < W; ++x) {
                double d = Math.hypot(x - 20, y - 15);
                if (d <= 5) assertEquals(-1, at(p, x, y), x + "," + y);
                if (d > 7) assertEquals(0, at(p, x, y), x + "," + y);
            }
        tk.b(20, 15, 6, 0x12345678, 9);  // the outline draws nothing and checks nothing
        assertArrayEquals(p, pixels());
        assertThrows(IllegalArgumentException.class, () -> tk.CA(-100, -100, 3, 0, 5));
    }

    // ------------------------------------------------------------------ masks

    wa mask(int[] starts, int[] lengths) {
        wa m = new wa();
        m.l(null, pool, 10, 10, starts, lengths);
        return m;
    }

    @Test
    void maskedClearAndLine() {
        wa m = mask(new int[] {0, 1, 2}, new int[] {3, 3, 0});
        try {
            tk.DA(0xFFFFFFFF, m, 4, 5);
            assertEquals("4,5 5,5 6,5 5,6 6,6 7,6", drawn());
            tk.ba(1, 0);
            tk.R(0, 5, 30, 5, 0xFFFFFFFF, 0, m, 4, 5);  // horizontal line through row 0 of the mask
            tk.R(6, 0, 6, 29, 0xFFFFFFFF, 0, m, 4, 5);  // vertical line through column 6
            assertEquals("4,5 5,5 6,5 6,6", drawn());
            assertThrows(IllegalArgumentException.class, () -> tk.R(0, 0, 1, 1, 0, 3, m, 0, 0));
            assertThrows(NullPointerException.class, () -> tk.DA(0, null, 0, 0));
        } finally {
            m.ma();
        }
        assertEquals(0L, m.nativeid);
        m.ma();
        assertThrows(NullPointerException.class, () -> tk.DA(0, m, 0, 0), "an unbound mask");
    }

    @Test
    void maskCreationChecksItsArrays() {
        wa bad = new wa();
        assertThrows(IllegalArgumentException.class, () -> bad.l(null, pool, 1, 1, new int[] {1, 2}, new int[] {1}));
        assertEquals(0L, bad.nativeid);
        wa empty = mask(null, null);
        assertNotEquals(0L, empty.nativeid);
        tk.DA(-1, empty, 0, 0);
        assertEquals("", drawn());
        empty.ma();
        ba unbound = new ba();
        assertThrows(NullPointerException.class, () -> new wa().l(null, unbound, 1, 1, null, null));
    }

    // ------------------------------------------------------------------ fonts

    static final byte[] L_GLYPH = {1, 0, 1, 0, 1, 1};  // 2 wide, 3 high

    @Test
    void monoFont() {
        m f = new m();
        f.n(null, pool, new byte[][] {L_GLYPH, null}, new int[] {2, 0}, new int[] {3, 0}, new int[] {1, 0},
                new int[] {2, 0});
        try {
            f.UA(0, 10, 10, 0xFF00FF00, false);
            assertEquals("11,12 11,13 11,14 12,14", drawn());
            tk.B(0, 0, W, H, 0xFF808080, 0);
            f.UA(0, 0, 0, 0x00FFFFFF, false);
            assertEquals(0xFF808080, at(pixels(), 1, 2), "alpha 0 draws nothing");
            wa all = mask(new int[] {0, 0, 0, 0, 0}, new int[] {W, W, W, W, W});
            f.MA(0, 0, 0, 0x00FFFFFF, false, all, 0, 0);
            assertEquals(0x007F7F7F, at(pixels(), 1, 2), "masked alpha 0 scales");
            f.MA(0, 0, 0, 0x00FFFFFF, false, null, 0, 0);  // no mask: plain plot, nothing at alpha 0
            all.ma();
            tk.ba(1, 0);
            // upwards: rows 5-6, columns 5-7; the glyph's right column on row 5; alpha ignored
            f.f(0, 5, 5, 0x00112233, false);
            assertEquals("7,5 5,6 6,6 7,6", drawn());
            assertEquals(0x00112233, at(pixels(), 7, 5));
            tk.ba(1, 0);
            f.UA(1, 5, 5, -1, false);
            f.UA(2, 5, 5, -1, false);
            f.UA(-1, 5, 5, -1, false);
            f.UA(0x10000, 5, 5, -1, false);  // low 16 bits: glyph 0
            assertEquals("6,7 6,8 6,9 7,9", drawn());
        } finally {
            f.ma();
        }
        assertEquals(0L, f.nativeid);
    }

    @Test
    void alphaFont() {
        ea f = new ea();
        f.n(null, pool, new byte[][] {{(byte) 255, 0, (byte) 128}}, new int[] {3}, new int[] {1}, new int[] {0},
                new int[] {0});
        try {
            tk.B(0, 0, W, H, 0xFF000000, 0);
            f.UA(0, 0, 0, 0xFFFFFFFF, false);
            int[] p = pixels();
            assertEquals(0x00FEFEFE, at(p, 0, 0));
            assertEquals(0xFF000000, at(p, 1, 0));
            assertEquals(0x007F7F7F, at(p, 2, 0));
            wa row = mask(new int[] {1}, new int[] {5});
            tk.B(0, 0, W, H, 0xFF000000, 0);
            f.P(0, 0, 0, 0xFFFFFFFF, false, row, 0, 0);
            p = pixels();
            assertEquals(0xFF000000, at(p, 0, 0), "outside the mask");
            assertEquals(0x007F7F7F, at(p, 2, 0));
            row.ma();
            tk.B(0, 0, W, H, 0xFF000000, 0);
            f.f(0, 4, 4, 0xFFFFFFFF, false);  // upwards: one column, three rows
            p = pixels();
            assertEquals(0x007F7F7F, at(p, 4, 4));
            assertEquals(0xFF000000, at(p, 4, 5));
            assertEquals(0x00FEFEFE, at(p, 4, 6));
        } finally {
            f.ma();
        }
    }

    @Test
    void palettedFont() {
        ia f = new ia();
        f.EA(null, pool, new byte[][] {{0, 1, 2}}, new int[] {0xFFFFFFFF, 0x01020304, 0x80FF00FF}, new int[] {3},
                new int[] {1}, new int[] {0}, new int[] {0});
        try {
            tk.B(0, 0, W, H, 0xAAAAAAAA, 0);
            f.UA(0, 0, 0, 0x55555555, false);
            int[] p = pixels();
            assertEquals(0xAAAAAAAA, at(p, 0, 0), "index 0 is transparent");
            assertEquals(0x01020304, at(p, 1, 0));
            assertEquals(0x80FF00FF, at(p, 2, 0));
            f.UA(0, 0, 1, 0x55555555, true);
            f.GA(0, 0, 2, 0x55555555, true, new wa(), 0, 0);  // unbound mask: plain plot
            f.f(0, 10, 10, 0x55555555, true);
            p = pixels();
            assertEquals(0xAAAAAAAA, at(p, 0, 1));
            assertEquals(0x55555555, at(p, 1, 1));
            assertEquals(0x55555555, at(p, 2, 2));
            assertEquals(0x55555555, at(p, 10, 10));
            assertEquals(0x55555555, at(p, 10, 11));
            assertEquals(0xAAAAAAAA, at(p, 10, 12));
        } finally {
            f.ma();
        }
    }

    @Test
    void fontCreationRejectsShortBitmaps() {
        m f = new m();
        assertThrows(IllegalArgumentException.class,
                () -> f.n(null, pool, new byte[][] {{1, 1, 1}}, new int[] {2}, new int[] {2}, new int[] {0}, new int[] {0}));
        assertEquals(0L, f.nativeid);
        ea g = new ea();
        assertThrows(IllegalArgumentException.class,
                () -> g.n(null, pool, new byte[][] {null}, new int[] {1}, new int[] {1}, new int[] {0}, new int[] {0}));
        assertEquals(0L, g.nativeid);
        ia h = new ia();
        h.EA(null, pool, null, null, null, null, null, null);  // no glyphs at all
        h.UA(0, 0, 0, -1, true);
        assertEquals("", drawn());
        h.ma();
    }
}
