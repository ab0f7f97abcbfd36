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
    void clippingIsClampedIntersectedAndReset() {
        tk.r(-5, -5, 10000, 10000);
        assertArrayEquals(new int[] {0, 0, W, H}, Pavoqen.clipping(tk));
        tk.r(10, 20, 300, 200);
        tk.o(100, 0, 400, 150);
        assertArrayEquals(new int[] {100, 20, 300, 150}, Pavoqen.clipping(tk));
        tk.o(500, 300, 600, 400); // disjoint: empty, left > right
        int[] c = Pavoqen.clipping(tk);
        assertTrue(c[0] > c[2] && c[1] > c[3], java.util.Arrays.toString(c));
        tk.L();
        assertArrayEquals(new int[] {0, 0, W, H}, Pavoqen.clipping(tk));
        int[] longer = sentinel(6);
        tk.qa(longer);
        assertArrayEquals(new int[] {0, 0, W, H, 0x5a5a5a5a, 0x5a5a5a5a}, longer);
    }

    @Test
    void clippingReadBackRefusesShortAndNullArrays() {
        int[] three = sentinel(3);
        assertThrows(ArrayIndexOutOfBoundsException.class, () -> tk.qa(three));
        assertArrayEquals(sentinel(3), three);
        assertThrows(NullPointerException.class, () -> tk.qa(null));
    }

    @Test
    void viewportRectangleAndDepthRange() {
        assertArrayEquals(new int[] {0, 0, W, H}, Pavoqen.viewport(tk));
        tk.A(1, 2, 300, 200);
        tk.GA(0.25f, 0.75f); // keeps the rectangle
        assertArrayEquals(new int[] {1, 2, 300, 200}, Pavoqen.viewport(tk));
        tk.k();
        assertArrayEquals(new int[] {0, 0, W, H}, Pavoqen.viewport(tk));

        int[] three = sentinel(3);
        assertThrows(ArrayIndexOutOfBoundsException.class, () -> tk.xa(three));
        assertArrayEquals(sentinel(3), three);
        assertThrows(NullPointerException.class, () -> tk.xa(null));
    }

    static float[] multiply(float[] a, float[] b) {
        float[] out = new float[16];
        for (int r = 0; r < 4; ++r)
            for (int c = 0; c < 4; ++c)
                out[4 * r + c] = (a[4 * r] * b[c] + a[4 * r + 1] * b[4 + c])
                        + (a[4 * r + 2] * b[8 + c] + a[4 * r + 3] * b[12 + c]);
        return out;
    }

    static float[] slice(float[] a, int from) {
        return java.util.Arrays.copyOfRange(a, from, from + 16);
    }

    @Test
    void cameraAndProjectionAreTakenRowByRow() {
        float[] identity = {1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1};
        float[] m = TestNatives.matrices(tk.nativeid);
        assertArrayEquals(identity, slice(m, 0), "camera starts as identity");
        assertArrayEquals(identity, slice(m, 16), "projection starts as identity");

        float[] camera = {1, 2, 0, 0, -1, 1, 3, 0, 0, 0, 2, 0, 10, -20, 30, 1};
        float[] projection = {2, 0, 0, 0, 0, 3, 0, 0, 0, 0, 1, 1, 0, 0, -4, 0};
        Pavoqen.setCamera(tk, camera);
        Pavoqen.setProjection(tk, projection);
        m = TestNatives.matrices(tk.nativeid);
        assertArrayEquals(camera, slice(m, 0));
        assertArrayEquals(projection, slice(m, 16));
        assertArrayEquals(multiply(camera, projection), slice(m, 32), "view-projection = camera × projection");
    }

    @Test
    void cameraAndProjectionRefuseShortAndNullArrays() {
        float[] before = TestNatives.matrices(tk.nativeid);
        float[] fifteen = new float[15];
        java.util.Arrays.fill(fifteen, 7f);
        assertThrows(ArrayIndexOutOfBoundsException.class, () -> tk.AA(fifteen));
        assertThrows(ArrayIndexOutOfBoundsException.class, () -> tk.wa(fifteen));
        assertThrows(NullPointerException.class, () -> tk.AA(null));
        assertThrows(NullPointerException.class, () -> tk.wa(null));
        assertArrayEquals(before, TestNatives.matrices(tk.nativeid), "nothing changed");
    }

    @Test
    void pointLightsAreClampedToFour() {
        int[] lights = new int[35];
        float[] intensities = new float[7];
        for (int i = 0; i < 7; ++i) {
            lights[5 * i] = 100 * i;
            lights[5 * i + 1] = -50 * i;
            lights[5 * i + 2] = 7 + i;
            lights[5 * i + 3] = 10 * (i + 1); // radius
            lights[5 * i + 4] = 0x00102030 + i;
            intensities[i] = 0.5f;
        }
        intensities[2] = 2.5f; // counts as 1.0
        tk.Q(7, lights, intensities);
        float[] p = TestNatives.pointLights(tk.nativeid);
        assertEquals(4f, p[0]);
        for (int i = 0; i < 4; ++i) {
            float r2 = (10 * (i + 1)) * (10 * (i + 1));
            float intensity = i == 2 ? 1f : 0.5f;
            assertArrayEquals(new float[] {100 * i, -50 * i, 7 + i, intensity * r2 * 256f},
                    java.util.Arrays.copyOfRange(p, 1 + 4 * i, 5 + 4 * i), "light " + i);
        }
        assertArrayEquals(new int[] {0x00102030, 0x00102031, 0x00102032, 0x00102033},
                TestNatives.pointLightColours(tk.nativeid));
    }

    @Test
    void pointLightsRefuseShortArraysAndAcceptNoLights() {
        int[] lights = new int[9]; // two lights need 10 ints
        assertThrows(ArrayIndexOutOfBoundsException.class, () -> tk.Q(2, lights, new float[2]));
        assertThrows(ArrayIndexOutOfBoundsException.class, () -> tk.Q(2, new int[10], new float[1]));
        assertThrows(ArrayIndexOutOfBoundsException.class, () -> tk.Q(9, new int[19], new float[4]));
        assertThrows(NullPointerException.class, () -> tk.Q(1, null, new float[1]));
        assertThrows(NullPointerException.class, () -> tk.Q(1, new int[5], null));
        assertEquals(0f, TestNatives.pointLights(tk.nativeid)[0], "refused calls set nothing");

        tk.Q(0, null, null);
        assertEquals(0f, TestNatives.pointLights(tk.nativeid)[0]);
        tk.Q(-3, null, null); // a count below zero is stored as given
        assertEquals(-3f, TestNatives.pointLights(tk.nativeid)[0]);
    }
}
