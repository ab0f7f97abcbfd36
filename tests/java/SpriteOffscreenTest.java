import static org.junit.jupiter.api.Assertions.*;

import org.junit.jupiter.api.AfterEach;
import org.junit.jupiter.api.BeforeAll;
import org.junit.jupiter.api.BeforeEach;
import org.junit.jupiter.api.Test;

/**
 * Sprites, depth buffers and offscreen targets driven through their peers:
 * creation from ARGB and palettised arrays, pixel write and read-back,
 * screen grabs, copies between a pair and the target, every drawing entry,
 * and bad input (short arrays, odd sizes, missing targets).
 */
class SpriteOffscreenTest {
    private ja tk;
    private final fa sp = new fa();

    @BeforeAll
    static void load() {
        TestSupport.load();
    }

    @BeforeEach
    void createToolkit() {
        tk = Pavoqen.createToolkit(null, 0);
    }

    @AfterEach
    void destroy() {
        tk.d(0, 0);
        tk.ma();
    }

    /** A bound sprite of w x h filled with `fill`, made the target together with a depth buffer (when given). */
    private fa target(int w, int h, int fill, oa depth) {
        fa s = new fa();
        int[] px = new int[w * h];
        java.util.Arrays.fill(px, fill);
        s.RA(null, px, 0, w, w, h, false);
        tk.d(s.nativeid, depth == null ? 0 : depth.nativeid);
        return s;
    }

    @Test
    void spritesFromArgbAndPalettisedArrays() {
        int[] px = {0x00000000, 0x00123456, 0x80FFFFFF, 7, 0x11111111, 0x22222222, 0x01000000, 0, 9, 9};
        int[] palette = {0x00C0FFEE, 0x00112233, 0x80445566};
        byte[] idx = {0, 1, 2, 1};
        byte[] alpha = {0x10, 0x20, (byte) 0xF0, 0};
        fa plain = new fa(), keyed = new fa(), pal = new fa(), opaque = new fa();
        plain.RA(null, px, 0, 5, 3, 2, false);  // stride 5: the last two words of each row are not used
        keyed.RA(null, px, 0, 5, 3, 2, true);
        pal.EA(null, palette, idx, alpha, 0, 2, 2, 2);
        opaque.EA(null, palette, idx, null, 0, 2, 2, 2);  // index 0 transparent, the rest opaque
        try {
            assertEquals(3, plain.da(plain.nativeid));
            assertEquals(2, plain.GA(plain.nativeid));
            tk.d(plain.nativeid, 0);
            assertArrayEquals(new int[] {0, 0x00123456, 0x80FFFFFF, 0x22222222, 0x01000000, 0}, tk.E(0, 0, 3, 2));
            tk.d(keyed.nativeid, 0);
            assertArrayEquals(new int[] {0, 0xFF123456, 0xFFFFFFFF, 0xFF222222, 0xFF000000, 0}, tk.E(0, 0, 3, 2));
            tk.d(pal.nativeid, 0);
            assertArrayEquals(new int[] {0x10C0FFEE, 0x20112233, 0xF0445566, 0x00112233}, tk.E(0, 0, 2, 2));
            tk.d(opaque.nativeid, 0);
            assertArrayEquals(new int[] {0, 0xFF112233, 0xFF445566, 0xFF112233}, tk.E(0, 0, 2, 2));
        } finally {
            tk.d(0, 0);
            plain.M(plain.nativeid);
            keyed.M(keyed.nativeid);
            pal.M(pal.nativeid);
            opaque.M(opaque.nativeid);
        }
        assertEquals(0L, plain.nativeid);
        // an index beyond the palette or a short array is refused before a sprite exists
        fa c = new fa();
        assertThrows(ArrayIndexOutOfBoundsException.class, () -> c.EA(null, palette, new byte[] {3}, null, 0, 1, 1, 1));
        assertThrows(ArrayIndexOutOfBoundsException.class, () -> c.EA(null, palette, idx, alpha, 0, 2, 2, 3));
        assertEquals(0L, c.nativeid);
    }

    @Test
    void trimsAndFullSize() {
        sp.UA(0, 10, 4);
        try {
            sp.U(sp.nativeid, 2, 1, 3, 5);
            int[] out = new int[4];
            sp.F(sp.nativeid, out);
            assertArrayEquals(new int[] {2, 1, 3, 5}, out);
            assertEquals(15, sp.WA(sp.nativeid));
            assertEquals(10, sp.ba(sp.nativeid));
            assertThrows(ArrayIndexOutOfBoundsException.class, () -> sp.F(sp.nativeid, new int[3]));
        } finally {
            sp.M(sp.nativeid);
        }
        assertThrows(NullPointerException.class, () -> sp.da(0));
    }

    @Test
    void areaWriteReadAndBadInput() {
        fa s = target(8, 8, 0x01010101, null);
        try {
            int[] in = new int[3 + 5 * 3];
            for (int i = 0; i < in.length; ++i) in[i] = 0x5A000000 + i;
            tk.BA(5, 6, 4, 3, in, 3, 5);  // offset 3, stride 5, partly outside
            int[] back = tk.E(5, 6, 4, 3);
            assertEquals(in[3 + 5 + 2], back[4 + 2]);
            assertEquals(0, back[2 * 4 + 3], "outside the target reads back as 0");
            int[] before = tk.E(0, 0, 8, 8);
            assertThrows(ArrayIndexOutOfBoundsException.class, () -> tk.BA(0, 0, 4, 4, new int[15], 0, 4));
            assertThrows(ArrayIndexOutOfBoundsException.class, () -> tk.BA(0, 0, 4, 4, new int[16], -1, 4));
            assertThrows(ArrayIndexOutOfBoundsException.class, () -> tk.BA(0, 0, 4, 2, new int[16], 0, -4));
            assertThrows(NullPointerException.class, () -> tk.BA(0, 0, 4, 4, null, 0, 4));
            assertThrows(ArrayIndexOutOfBoundsException.class, () -> s.na(s.nativeid, 0, 0, 3, 3, new int[8], 0, 3));
            assertArrayEquals(before, tk.E(0, 0, 8, 8), "nothing written by the refused calls");
            assertThrows(IllegalArgumentException.class, () -> tk.E(0, 0, -1, 4));
            assertThrows(IllegalArgumentException.class, () -> tk.E(0, 0, 65536, 65536));
            fa t = new fa();
            assertThrows(IllegalArgumentException.class, () -> t.UA(0, 65536, 16384));
            assertThrows(ArrayIndexOutOfBoundsException.class, () -> t.RA(null, new int[11], 0, 4, 4, 3, false));
            assertThrows(IllegalArgumentException.class, () -> new oa().g(-2, 2));
            assertEquals(0L, t.nativeid);
            // the decorated screen grab is not bound by name
            assertThrows(UnsatisfiedLinkError.class, () -> t.K(null, null, 0, 0, 2, 2, false));
        } finally {
            tk.d(0, 0);
            s.M(s.nativeid);
        }
    }

    @Test
    void grabFromTheScreen() {
        fa screen = target(16, 12, 0, null);
        fa grab = new fa();
        grab.UA(0, 6, 4);
        try {
            int[] px = new int[16 * 12];
            for (int i = 0; i < px.length; ++i) px[i] = (i % 3 == 0) ? 0 : 0x00100000 + i;
            tk.BA(0, 0, 16, 12, px, 0, 16);
            int[] fill = new int[24];
            java.util.Arrays.fill(fill, 0x77777777);
            grab.na(grab.nativeid, 0, 0, 6, 4, fill, 0, 6);
            grab.ea(grab.nativeid, 1, 0, 4, 3, 13, 10);  // clipped at the screen's edges, keyed
            grab.j(grab.nativeid, 0, 0, 1);  // alpha from the screen's green channel
            assertThrows(IllegalArgumentException.class, () -> grab.j(grab.nativeid, 0, 0, 4));
            tk.d(grab.nativeid, 0);
            int[] got = tk.E(0, 0, 6, 4);
            for (int y = 0; y < 4; ++y)
                for (int x = 0; x < 6; ++x) {
                    int sx = x - 1 + 13, sy = y + 10, expect = 0x77777777;
                    if (x >= 1 && x < 5 && y < 3 && sx < 16 && sy < 12) {
                        int v = px[sy * 16 + sx];
                        expect = v == 0 ? 0 : v | 0xFF000000;
                    }
                    expect = (expect & 0xFFFFFF) | ((px[y * 16 + x] & 0xFF00) << 16);
                    assertEquals(expect, got[y * 6 + x], "at " + x + "," + y);
                }
        } finally {
            tk.d(0, 0);
            screen.M(screen.nativeid);
            grab.M(grab.nativeid);
        }
    }

    @Test
    void noColourBufferAfterDestroyOrWithDepthOnly() {
        fa s = target(4, 4, 1, null);
        s.M(s.nativeid);
        Exception e = assertThrows(Exception.class, () -> tk.E(0, 0, 1, 1));
        assertEquals(Exception.class, e.getClass());
        assertEquals("No colour buffer", e.getMessage());
        oa depth = new oa();
        depth.g(24, 16);
        fa grab = new fa();
        grab.UA(0, 2, 2);
        try {
            tk.d(0, depth.nativeid);
            assertArrayEquals(new int[] {0, 0, 24, 16}, Pavoqen.clipping(tk));
            e = assertThrows(Exception.class, () -> grab.ea(grab.nativeid, 0, 0, 1, 1, 0, 0));
            assertEquals("No colour buffer", e.getMessage());
            tk.BA(0, 0, 1, 1, new int[1], 0, 1);  // nothing to write into: harmless
            tk.ba(2, 0);  // depth clear works
        } finally {
            tk.d(0, 0);
            grab.M(grab.nativeid);
            depth.za(depth.nativeid);
        }
        assertEquals(0L, depth.nativeid);
    }

    @Test
    void copiesBetweenPairAndTarget() {
        oa screenDepth = new oa(), pairDepth = new oa();
        screenDepth.g(20, 12);
        pairDepth.g(13, 8);  // a different width than the pair's sprite
        fa screen = target(20, 12, 0x11111111, screenDepth);
        fa pair = new fa();
        int[] px = new int[9 * 7];
        for (int i = 0; i < px.length; ++i) px[i] = 0x22000000 + i;
        pair.RA(null, px, 0, 9, 9, 7, false);
        o copier = new o();
        try {
            copier.BA(tk.nativeid, pair.nativeid, pairDepth.nativeid, 2, 1, 30, 30, 15, 8, true, false);
            int[] got = tk.E(0, 0, 20, 12);
            for (int y = 0; y < 12; ++y)
                for (int x = 0; x < 20; ++x) {
                    int sx = x - 15 + 2, sy = y - 8 + 1;
                    boolean in = x >= 15 && y >= 8 && sx < 9 && sy < 7;
                    assertEquals(in ? 0x22000000 + sy * 9 + sx : 0x11111111, got[y * 20 + x]);
                }
            // and back: from the target into the pair, at a negative source corner
            copier.AA(tk.nativeid, pair.nativeid, pairDepth.nativeid, -2, -1, 5, 5, 0, 0, true, true);
            tk.d(pair.nativeid, 0);
            got = tk.E(0, 0, 9, 7);
            assertEquals(0x22000000, got[0], "outside the source: untouched");
            assertEquals(0x11111111, got[4 * 9 + 4]);
            assertEquals(0x22000000 + 4 * 9 + 5, got[4 * 9 + 5]);
            // a toolkit id that is not the toolkit is refused
            assertThrows(IllegalArgumentException.class,
                    () -> copier.BA(tk.nativeid + 16, pair.nativeid, 0, 0, 0, 1, 1, 0, 0, true, false));
        } finally {
            tk.d(0, 0);
            screen.M(screen.nativeid);
            pair.M(pair.nativeid);
            screenDepth.za(screenDepth.nativeid);
            pairDepth.za(pairDepth.nativeid);
        }
    }

    @Test
    void everyDrawingEntryDrawsIntoAnOffscreenTarget() {
        oa depth = new oa();
        depth.g(32, 32);
        fa screen = target(32, 32, 0, depth);
        fa s = new fa();
        int[] red = new int[4 * 4];
        java.util.Arrays.fill(red, 0xFFFF0000);
        s.RA(null, red, 0, 4, 4, 4, false);
        ba pool = new ba();
        pool.sa(0, 1 << 16);
        wa mask = new wa();
        mask.l(null, pool, 32, 2, new int[] {1, 0}, new int[] {2, 32});
        try {
            s.Y(s.nativeid, 0, 0, 1, 0, 0);  // plain copy at (0, 0)
            assertEquals(0xFFFF0000, tk.E(3, 3, 1, 1)[0]);
            assertEquals(0, tk.E(4, 4, 1, 1)[0]);
            s.Y(s.nativeid, 0, 0, 1, 0, 7);  // unknown blend: nothing
            s.ha(s.nativeid, 8, 0, 8, 2, 0, 0xFFFFFFFF, 0);  // scaled, modulated by white
            assertEquals(0xFEFE0000, tk.E(15, 1, 1, 1)[0]);
            assertEquals(0, tk.E(16, 1, 1, 1)[0]);
            // depth-tested: the depth buffer is cleared to 3.4e38, so depth 5 passes
            tk.ba(2, 0);
            s.G(s.nativeid, 0, 8, 5, 4, 4, 1, 0, 0);
            assertEquals(0xFFFF0000, tk.E(0, 8, 1, 1)[0]);
            s.aa(s.nativeid, 0, 16, 10, 3, 1, 0, 2);  // tiled, added
            assertEquals(0xFFFF0000, tk.E(9, 18, 1, 1)[0]);
            assertEquals(0, tk.E(10, 18, 1, 1)[0]);
            s.e(s.nativeid, 20, 20, 24, 20, 20, 24, 1, 0, 0);  // axis-aligned parallelogram
            assertEquals(0xFFFF0000, tk.E(23, 23, 1, 1)[0]);
            // masked: row 0 covers x 1..2 from mask x 24
            s.o(s.nativeid, 24, 0, mask.nativeid, 24, 0);
            int[] row = tk.E(24, 0, 4, 1);
            assertTrue(row[0] == 0 && row[1] != 0 && row[2] != 0 && row[3] == 0);
            s.FA(s.nativeid, 24, 4, 28, 4, 24, 8, 0, mask.nativeid, 24, 4, true);
            row = tk.E(24, 4, 4, 1);
            assertArrayEquals(new int[] {0, 0xFFFF0000, 0xFFFF0000, 0}, row);
        } finally {
            tk.d(0, 0);
            mask.ma();
            pool.ma();
            s.M(s.nativeid);
            screen.M(screen.nativeid);
            depth.za(depth.nativeid);
        }
    }
}
