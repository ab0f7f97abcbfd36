import static org.junit.jupiter.api.Assertions.*;

import org.junit.jupiter.api.AfterEach;
import org.junit.jupiter.api.BeforeAll;
import org.junit.jupiter.api.BeforeEach;
import org.junit.jupiter.api.Test;

/**
 * The toolkit's state entries in a JVM: clipping, viewport, camera and
 * projection, point lights, with short and null arrays refused before anything
 * is read or written. The target is a 640 × 480 offscreen sprite and depth buffer.
 */
class ToolkitStateTest {
    static final int W = 640, H = 480;
    ja tk;
    fa sprite;
    oa depth;

    @BeforeAll
    static void load() {
        TestSupport.loadTestNatives();
    }

    @BeforeEach
    void createToolkitWithTarget() {
        tk = Pavoqen.createToolkit(null, 0);
        sprite = new fa();
        sprite.UA(0, W, H);
        depth = new oa();
        depth.g(W, H);
        tk.d(sprite.nativeid, depth.nativeid);
    }

    @AfterEach
    void destroy() {
        tk.d(0, 0);
        sprite.M(sprite.nativeid);
        depth.za(depth.nativeid);
        tk.ma();
    }

    static int[] sentinel(int n) {
        int[] a = new int[n];
        java.util.Arrays.fill(a, 0x5a5a5a5a);
        return a;
    }

    @Test
    void clippingAndViewportAreClampedIntersectedResetAndReadBackSafely() {
        tk.r(10, 20, 300, 200);
        tk.o(100, 0, 400, 150);
        assertArrayEquals(new int[] {100, 20, 300, 150}, Pavoqen.clipping(tk));
        tk.o(500, 300, 600, 400); // disjoint: empty, left > right
        int[] c = Pavoqen.clipping(tk);
        assertTrue(c[0] > c[2] && c[1] > c[3], java.util.Arrays.toString(c));
        tk.r(-5, -5, 10000, 10000);
        int[] longer = sentinel(6);
        tk.qa(longer);
        assertArrayEquals(new int[] {0, 0, W, H, 0x5a5a5a5a, 0x5a5a5a5a}, longer);
        tk.A(1, 2, 300, 200);
        tk.GA(0.25f, 0.75f); // keeps the rectangle
        assertArrayEquals(new int[] {1, 2, 300, 200}, Pavoqen.viewport(tk));
        tk.k();
        assertArrayEquals(new int[] {0, 0, W, H}, Pavoqen.viewport(tk));
        int[] three = sentinel(3);
        assertThrows(ArrayIndexOutOfBoundsException.class, () -> tk.qa(three));
        assertThrows(ArrayIndexOutOfBoundsException.class, () -> tk.xa(three));
        assertArrayEquals(sentinel(3), three);
        assertThrows(NullPointerException.class, () -> tk.qa(null));
        assertThrows(NullPointerException.class, () -> tk.xa(null));
    }

    static float[] slice(float[] a, int from) {
        return java.util.Arrays.copyOfRange(a, from, from + 16);
    }

    @Test
    void cameraAndProjectionAreTakenRowByRowAndShortArraysRefused() {
        float[] camera = {1, 2, 0, 0, -1, 1, 3, 0, 0, 0, 2, 0, 10, -20, 30, 1};
        float[] projection = {2, 0, 0, 0, 0, 3, 0, 0, 0, 0, 1, 1, 0, 0, -4, 0};
        Pavoqen.setCamera(tk, camera);
        Pavoqen.setProjection(tk, projection);
        float[] m = TestNatives.matrices(tk.nativeid);
        assertArrayEquals(camera, slice(m, 0));
        assertArrayEquals(projection, slice(m, 16));
        float[] vp = new float[16];  // view-projection = camera × projection
        for (int r = 0; r < 4; ++r)
            for (int k = 0; k < 4; ++k)
                vp[4 * r + k] = (camera[4 * r] * projection[k] + camera[4 * r + 1] * projection[4 + k])
                        + (camera[4 * r + 2] * projection[8 + k] + camera[4 * r + 3] * projection[12 + k]);
        assertArrayEquals(vp, slice(m, 32));
        assertThrows(ArrayIndexOutOfBoundsException.class, () -> tk.AA(new float[15]));
        assertThrows(ArrayIndexOutOfBoundsException.class, () -> tk.wa(new float[15]));
        assertThrows(NullPointerException.class, () -> tk.wa(null));
        assertArrayEquals(m, TestNatives.matrices(tk.nativeid), "nothing changed");
    }

    @Test
    void pointLightsAreClampedToFourAndShortArraysRefused() {
        assertThrows(ArrayIndexOutOfBoundsException.class, () -> tk.Q(2, new int[9], new float[2]));
        assertThrows(ArrayIndexOutOfBoundsException.class, () -> tk.Q(2, new int[10], new float[1]));
        assertThrows(NullPointerException.class, () -> tk.Q(1, new int[5], null));
        assertEquals(0f, TestNatives.pointLights(tk.nativeid)[0], "refused calls set nothing");
        int[] lights = new int[35];
        float[] intensities = new float[7];
        for (int i = 0; i < 7; ++i) {
            int[] l = {100 * i, -50 * i, 7 + i, 10 * (i + 1), 0x00102030 + i};  // x, y, z, radius, colour
            System.arraycopy(l, 0, lights, 5 * i, 5);
            intensities[i] = i == 2 ? 2.5f : 0.5f;  // 2.5 counts as 1.0
        }
        tk.Q(7, lights, intensities);
        float[] p = TestNatives.pointLights(tk.nativeid);
        assertEquals(4f, p[0]);
        for (int i = 0; i < 4; ++i)
            assertArrayEquals(new float[] {100 * i, -50 * i, 7 + i, (i == 2 ? 1f : 0.5f) * (100 * (i + 1) * (i + 1)) * 256f},
                    java.util.Arrays.copyOfRange(p, 1 + 4 * i, 5 + 4 * i), "light " + i);
        assertArrayEquals(new int[] {0x00102030, 0x00102031, 0x00102032, 0x00102033},
                TestNatives.pointLightColours(tk.nativeid));
        tk.Q(-3, null, null); // a count below zero is stored as given
        assertEquals(-3f, TestNatives.pointLights(tk.nativeid)[0]);
    }
}
