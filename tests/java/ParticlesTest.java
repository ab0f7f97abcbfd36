import static org.junit.jupiter.api.Assertions.*;

import org.junit.jupiter.api.AfterEach;
import org.junit.jupiter.api.BeforeAll;
import org.junit.jupiter.api.BeforeEach;
import org.junit.jupiter.api.Test;

/**
 * The particle entry: discs and textured particles drawn into an offscreen
 * target, a missing texture uploaded by Java from inside the draw call (the
 * run's -Xcheck:jni reports any JNI call made while an array is pinned), and
 * short arrays refused before anything is drawn.
 */
class ParticlesTest {
    static final int W = 64, H = 48;

    ja tk;
    fa sprite;
    oa depth;
    a tr;
    int requests;

    @BeforeAll
    static void load() {
        TestSupport.load();
    }

    /** 128 x 128 opaque texels of one colour. */
    static int[] texture(int argb) {
        int[] px = new int[128 * 128];
        java.util.Arrays.fill(px, argb);
        return px;
    }

    @BeforeEach
    void target() {
        tk = Pavoqen.createToolkit((t, id) -> {
            ++requests;
            if (id != 7) return false;
            t.F(id, texture(0xFF40C080), 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0);
            return true;
        }, 100);
        sprite = new fa();
        sprite.UA(0, W, H);
        depth = new oa();
        depth.g(W, H);
        tk.GA(0f, 1f);
        // world (x, y, z) lands on pixel (x, y) at depth z / 2 + 1/2; the camera's right axis is +x
        tk.wa(new float[] {2f / W, 0, 0, 0, 0, 2f / H, 0, 0, 0, 0, 1, 0, -1, -1, 0, 1});
        tk.AA(new float[] {1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1});
        tk.d(sprite.nativeid, depth.nativeid);
        tk.ba(2, 0);
        tk.B(0, 0, W, H, 0xFF000000, 0);
        tr = new a();
        tr.ha(0, 0, 0, 0, 0);
    }

    @AfterEach
    void release() {
        tr.R(tr.nativeid);
        tk.d(0, 0);
        sprite.M(sprite.nativeid);
        depth.za(depth.nativeid);
        tk.ma();
    }

    static int fx(int v) {
        return v << 12;
    }

    int pixel(int x, int y) {
        return tk.E(x, y, 1, 1)[0];
    }

    @Test
    void discsAndTexturedParticles() {
        int[] pos = {fx(12), fx(12), 0, fx(40), fx(24), 0, fx(30), fx(40), 0};
        int[] colours = {0xFFFF0000, 0xFFFFFFFF, 0xFFFFFFFF};
        int[] sizes = {20480, 20480, 20480};  // 10 pixels across
        short[] textures = {-1, 7, 9};
        tr.b(tr.nativeid, 0, pos, colours, sizes, textures, 3);
        assertEquals(0xFFFF0000, pixel(12, 12), "disc");
        assertEquals(0xFF000000, pixel(12, 12 + 6), "outside the disc of radius 5");
        // texture 7 arrives during the call; the blit modulates by white and blends
        int t = pixel(40, 24);
        assertNotEquals(0xFF000000, t);
        assertEquals(0xFE, t >>> 24, "alpha blended with the texture alpha x 255/256");
        assertTrue(((t >> 8) & 0xFF) > 0x80, "green from the texture");
        assertEquals(0xFF000000, pixel(30, 40), "texture 9 is refused: not drawn");
        assertEquals(2, requests);
        tr.b(tr.nativeid, 0, pos, colours, sizes, textures, 2);
        assertEquals(2, requests, "texture 7 stays resident");
    }

    @Test
    void shortArraysAreRefusedBeforeDrawing() {
        int[] pos = {fx(12), fx(12), 0, fx(40), fx(24)};  // 5 of 6 coordinates
        int[] colours = {0xFFFF0000, 0xFFFF0000};
        int[] sizes = {20480, 20480};
        short[] textures = {-1, -1};
        assertThrows(ArrayIndexOutOfBoundsException.class, () -> tr.b(tr.nativeid, 0, pos, colours, sizes, textures, 2));
        assertThrows(ArrayIndexOutOfBoundsException.class,
                () -> tr.b(tr.nativeid, 0, new int[6], colours, sizes, new short[1], 2));
        assertThrows(NullPointerException.class, () -> tr.b(tr.nativeid, 0, new int[6], null, sizes, textures, 2));
        assertEquals(0xFF000000, pixel(12, 12), "nothing drawn");
        tr.b(tr.nativeid, 0, null, null, null, null, 0);  // nothing to draw: no arrays needed
    }
}
