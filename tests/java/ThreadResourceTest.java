import static org.junit.jupiter.api.Assertions.*;

import org.junit.jupiter.api.AfterEach;
import org.junit.jupiter.api.BeforeAll;
import org.junit.jupiter.api.BeforeEach;
import org.junit.jupiter.api.Test;

/**
 * The thread resource peer: creation and destruction, coloured triangles and
 * thick lines drawn into an offscreen target and read back.
 */
class ThreadResourceTest {
    static final int W = 48, H = 32;

    OffscreenTarget target;
    ja tk;
    ba pool;
    a tr;

    @BeforeAll
    static void load() {
        TestSupport.load();
    }

    @BeforeEach
    void target() {
        target = new OffscreenTarget(W, H);
        tk = target.tk;
        pool = target.pool;
        tr = new a();
        tr.ha(0, 0, 0, 1, 2);
    }

    @AfterEach
    void release() {
        if (tr.nativeid != 0) tr.R(tr.nativeid);
        target.close();
    }

    int[] pixels() {
        return tk.E(0, 0, W, H);
    }

    @Test
    void createsDestroysAndRejectsZeroIds() {
        a other = new a();
        other.ha(7, 7, 7, 3, 4);
        assertNotEquals(0, tr.nativeid);
        assertNotEquals(tr.nativeid, other.nativeid);
        other.R(other.nativeid);
        assertEquals(0, other.nativeid);
        assertThrows(NullPointerException.class, () -> tr.K(0, 0, 0, 0, 10, 10, -1, 3, 0));
        assertThrows(NullPointerException.class, () -> tr.JA(0));
    }

    @Test
    void colouredTriangleAndThickLine() {
        int c = 0x80FF4020;
        tr.ra(tr.nativeid, 0, 0, W, 0, 0, H, c, c, c);
        int[] p = pixels();
        assertEquals(c, p[10 * W + 20]);
        assertEquals(0, p[(H - 1) * W + W - 1]);  // beyond the hypotenuse
        tk.ba(3, 0);
        tr.K(tr.nativeid, 0, 5, 10, 35, 10, 0xFF00FF00, 4, 0);
        p = pixels();
        for (int y = 0; y < H; ++y)
            for (int x = 0; x < W; ++x)
                assertEquals(y >= 8 && y < 12 && x >= 5 && x < 35, p[y * W + x] == 0xFF00FF00, x + "," + y);
    }

    @Test
    void noBuffersOrExtremeCoordinatesAreHarmless() {
        tk.d(0, 0);
        tr.ra(tr.nativeid, 0, 0, W, 0, 0, H, -1, -1, -1);
        tr.K(tr.nativeid, 0, 0, 0, W, H, -1, 10, 0);
        tk.d(target.sprite.nativeid, target.depth.nativeid);
        for (int v : pixels()) assertEquals(0, v);
        int[] e = {Integer.MIN_VALUE, -70000, -1, 0, 20, 70000, Integer.MAX_VALUE};
        for (int i = 0; i < e.length; ++i)
            for (int j = 0; j < e.length; ++j) {
                tr.ra(tr.nativeid, e[i], e[j], e[j], e[i], 20, 20, -1, -1, -1);
                tr.K(tr.nativeid, 0, e[i], e[j], e[j], e[i], 0xFF00FF00, e[(i + j) % e.length], 0);
            }
        assertEquals(W * H, pixels().length);
    }
}
