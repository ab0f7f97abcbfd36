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

    int at(int x, int y) {
        return tk.E(0, 0, W, H)[y * W + x];
    }

    /** Pixels that differ from colour 0, as "x,y" strings in row order; clears them afterwards. */
    String drawn() {
        int[] p = tk.E(0, 0, W, H);
        StringBuilder b = new StringBuilder();
        for (int i = 0; i < W * H; ++i)
            if (p[i] != 0) b.append(i % W).append(',').append(i / W).append(' ');
        tk.ba(1, 0);
        return b.toString().trim();
    }

    wa mask(int[] starts, int[] lengths) {
        wa m = new wa();
        m.l(null, pool, 10, 10, starts, lengths);
        return m;
    }

    @Test
    void rectanglesClearsLinesAndCircles() {
        tk.B(0, 0, W, H, 0xFF0000FF, 0);
        tk.B(2, 2, 3, 3, 0x80FF0000, 1);
        tk.B(10, 10, 1, 1, 0x00909090, 0);
        tk.B(10, 10, 1, 1, 0x00808080, 2);
        assertEquals(0x807F007F, at(3, 3));
        assertEquals(0x00FFFFFF, at(10, 10));
        int[] before = tk.E(0, 0, W, H);
        assertThrows(IllegalArgumentException.class, () -> tk.B(-100, -100, 5, 5, 0, 3));
        tk.ba(0, 0x22222222);  // no flags, no clear
        tk.ba(2, 0x22222222);  // the depth flag leaves the colours
        assertArrayEquals(before, tk.E(0, 0, W, H));
        tk.r(10, 10, 20, 20);
        tk.ba(1, 0xFFABCDEF);
        assertEquals(0xFFABCDEF, at(10, 10));
        assertEquals(0xFF0000FF, at(20, 19));
        tk.L();
        tk.ba(1, 0);
        tk.YA(0, 0, 3, 1, -1, 0);
        assertEquals("0,0 1,0 2,1 3,1", drawn());
        tk.XA(-2, 3, 5, 7, 0);
        tk.G(30, 28, 5, 9, 0);
        tk.XA(0, -1, 10, 7, 3);  // row outside the clip: the mode is not looked at
        assertEquals("0,3 1,3 2,3 30,28 30,29", drawn());
        assertThrows(IllegalArgumentException.class, () -> tk.XA(0, 1, 10, 7, 3));
        tk.CA(20, 15, 0, 0xFFFFFFFF, 0);  // drawn at depth 0 over the cleared depth
        assertEquals("20,15", drawn());
        tk.b(20, 15, 6, 0x12345678, 9);  // the outline draws nothing and checks nothing
        assertEquals("", drawn());
        assertThrows(IllegalArgumentException.class, () -> tk.CA(-100, -100, 3, 0, 5));
    }

    @Test
    void masksClearAndClipLines() {
        wa m = mask(new int[] {0, 1, 2}, new int[] {3, 3, 0});
        try {
            tk.DA(0xFFFFFFFF, m, 4, 5);
            assertEquals("4,5 5,5 6,5 5,6 6,6 7,6", drawn());
            tk.R(0, 5, 30, 5, 0xFFFFFFFF, 0, m, 4, 5);  // horizontal line through row 0 of the mask
            tk.R(6, 0, 6, 29, 0xFFFFFFFF, 0, m, 4, 5);  // vertical line through column 6
            assertEquals("4,5 5,5 6,5 6,6", drawn());
            assertThrows(IllegalArgumentException.class, () -> tk.R(0, 0, 1, 1, 0, 3, m, 0, 0));
            assertThrows(NullPointerException.class, () -> tk.DA(0, null, 0, 0));
        } finally {
            m.ma();
        }
        assertEquals(0L, m.nativeid);
        assertThrows(NullPointerException.class, () -> tk.DA(0, m, 0, 0), "an unbound mask");
        wa bad = new wa();
        assertThrows(IllegalArgumentException.class, () -> bad.l(null, pool, 1, 1, new int[] {1, 2}, new int[] {1}));
        assertEquals(0L, bad.nativeid);
        assertThrows(NullPointerException.class, () -> new wa().l(null, new ba(), 1, 1, null, null));
    }

    @Test
    void fonts() {
        m mono = new m();
        mono.n(null, pool, new byte[][] {{1, 0, 1, 0, 1, 1}}, new int[] {2}, new int[] {3}, new int[] {1}, new int[] {2});
        ea alpha = new ea();
        alpha.n(null, pool, new byte[][] {{(byte) 255, 0, (byte) 128}}, new int[] {3}, new int[] {1}, new int[] {0},
                new int[] {0});
        ia pal = new ia();
        pal.EA(null, pool, new byte[][] {{0, 1, 2}}, new int[] {0xFFFFFFFF, 0x01020304, 0x80FF00FF}, new int[] {3},
                new int[] {1}, new int[] {0}, new int[] {0});
        try {
            mono.UA(0x10000, 10, 10, 0xFF00FF00, false);  // low 16 bits: glyph 0
            mono.UA(1, 10, 10, -1, false);
            mono.UA(-1, 10, 10, -1, false);
            assertEquals("11,12 11,13 11,14 12,14", drawn());
            mono.f(0, 5, 5, 0x00112233, false);  // upwards: the glyph's right column on row 5; alpha ignored
            assertEquals(0x00112233, at(7, 5));
            assertEquals("7,5 5,6 6,6 7,6", drawn());
            tk.B(0, 0, W, H, 0xFF808080, 0);
            mono.UA(0, 0, 0, 0x00FFFFFF, false);
            assertEquals(0xFF808080, at(1, 2), "alpha 0 draws nothing");
            wa all = mask(new int[] {0, 0, 0}, new int[] {W, W, W});
            mono.MA(0, 0, 0, 0x00FFFFFF, false, all, 0, 0);
            assertEquals(0x007F7F7F, at(1, 2), "masked alpha 0 scales");
            all.ma();
            tk.B(0, 0, W, H, 0xFF000000, 0);
            alpha.UA(0, 0, 0, 0xFFFFFFFF, false);
            alpha.f(0, 4, 4, 0xFFFFFFFF, false);  // upwards: one column, three rows
            assertEquals(0x00FEFEFE, at(0, 0));
            assertEquals(0xFF000000, at(1, 0));
            assertEquals(0x007F7F7F, at(2, 0));
            assertEquals(0x007F7F7F, at(4, 4));
            assertEquals(0x00FEFEFE, at(4, 6));
            wa row = mask(new int[] {1}, new int[] {5});
            tk.B(0, 0, W, H, 0xFF000000, 0);
            alpha.P(0, 0, 0, 0xFFFFFFFF, false, row, 0, 0);
            row.ma();
            assertEquals(0xFF000000, at(0, 0), "outside the mask");
            assertEquals(0x007F7F7F, at(2, 0));
            tk.B(0, 0, W, H, 0xAAAAAAAA, 0);
            pal.UA(0, 0, 0, 0x55555555, false);
            pal.GA(0, 0, 1, 0x55555555, true, new wa(), 0, 0);  // unbound mask: plain plot
            pal.f(0, 10, 10, 0x55555555, true);
            assertEquals(0xAAAAAAAA, at(0, 0), "index 0 is transparent");
            assertEquals(0x01020304, at(1, 0));
            assertEquals(0x80FF00FF, at(2, 0));
            assertEquals(0xAAAAAAAA, at(0, 1));
            assertEquals(0x55555555, at(2, 1));
            assertEquals(0x55555555, at(10, 10));
            assertEquals(0xAAAAAAAA, at(10, 12));
        } finally {
            mono.ma();
            alpha.ma();
            pal.ma();
        }
        assertEquals(0L, mono.nativeid);
        m bad = new m();
        assertThrows(IllegalArgumentException.class,
                () -> bad.n(null, pool, new byte[][] {{1, 1, 1}}, new int[] {2}, new int[] {2}, new int[] {0}, new int[] {0}));
        assertEquals(0L, bad.nativeid);
        ia none = new ia();
        none.EA(null, pool, null, null, null, null, null, null);  // no glyphs at all
        tk.ba(1, 0);
        none.UA(0, 0, 0, -1, true);
        assertEquals("", drawn());
        none.ma();
    }
}
