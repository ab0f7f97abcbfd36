import static org.junit.jupiter.api.Assertions.*;
import static org.junit.jupiter.api.Assumptions.assumeTrue;

import java.awt.Canvas;
import java.awt.EventQueue;
import java.awt.Frame;
import java.awt.Graphics;
import java.awt.GraphicsEnvironment;
import java.awt.Toolkit;

import org.junit.jupiter.api.AfterAll;
import org.junit.jupiter.api.AfterEach;
import org.junit.jupiter.api.BeforeAll;
import org.junit.jupiter.api.Tag;
import org.junit.jupiter.api.Test;
import org.junit.jupiter.api.Timeout;

/**
 * Presentation into a real X window: a Frame with a Canvas on the display the
 * test runner started (Xvfb), read back with XGetImage. Skipped without a
 * display. The runner says what the server allows with
 * -Dpavoqen.test.expect=shm|plain; "plain" covers both a server without
 * MIT-SHM and one that refuses the attach.
 */
@Tag("window")
@Timeout(60)
class CanvasWindowTest {
    static final int W = 320, H = 240;
    static ja tk;
    static Frame frame;
    static Canvas awt;
    za cv;

    /** A canvas that AWT never erases; the library draws all of it. */
    static final class Surface extends Canvas {
        @Override public void update(Graphics g) {}
        @Override public void paint(Graphics g) {}
    }

    @BeforeAll
    static void open() throws Exception {
        assumeTrue(!GraphicsEnvironment.isHeadless() && System.getenv("DISPLAY") != null,
                   "no display: window tests run under tests/java/run_window_tests.sh");
        Pavoqen.loadLibrary();
        tk = Pavoqen.createToolkit(null, 0);
        EventQueue.invokeAndWait(() -> {
            frame = new Frame("pavoqen canvas test");
            frame.setUndecorated(true);
            awt = new Surface();
            awt.setSize(W, H);
            frame.add(awt);
            frame.pack();
            frame.setLocation(0, 0);
            frame.setVisible(true);
        });
        long deadline = System.nanoTime() + 10_000_000_000L;
        while (!awt.isShowing() && System.nanoTime() < deadline) Thread.sleep(20);
        assertTrue(awt.isShowing(), "canvas never became visible");
        Toolkit.getDefaultToolkit().sync();
        EventQueue.invokeAndWait(() -> {});
    }

    @AfterAll
    static void close() throws Exception {
        if (frame != null) EventQueue.invokeAndWait(frame::dispose);
        if (tk != null) tk.ma();
    }

    @AfterEach
    void destroyCanvas() {
        System.clearProperty("pavoqen.noshm");
        if (cv != null && cv.nativeid != 0) cv.ma();
        cv = null;
    }

    static boolean expectShm() {
        return "shm".equals(System.getProperty("pavoqen.test.expect", "shm"))
                && !"true".equals(System.getProperty("pavoqen.noshm"));
    }

    za makeCanvas(int w, int h) {
        za c = new za();
        c.n(null, awt, w, h);
        assertNotEquals(0L, c.nativeid);
        return c;
    }

    static int[] grab(int x, int y, int w, int h) {
        int[] px = WindowNatives.grab(awt, x, y, w, h);
        assertNotNull(px, "window could not be read back");
        return px;
    }

    /** Fills the whole target with one colour, flips it all, and waits until it shows (first frames only). */
    void showSolid(int colour, int w, int h) throws InterruptedException {
        long deadline = System.nanoTime() + 5_000_000_000L;
        int[] px;
        do {
            WindowNatives.fill(tk.nativeid, 0, 0, w, h, colour);
            cv.H(0, 0, w, h);
            px = grab(0, 0, w, h);
            if (java.util.Arrays.stream(px).allMatch(p -> p == (colour & 0xFFFFFF))) return;
            Thread.sleep(50);
        } while (System.nanoTime() < deadline);
        assertSolid(px, colour, "never shown");
    }

    static void assertSolid(int[] px, int colour, String what) {
        int v = colour & 0xFFFFFF;
        for (int i = 0; i < px.length; i++)
            if (px[i] != v)
                fail(what + ": pixel " + i + " is " + Integer.toHexString(px[i]) + ", expected " + Integer.toHexString(v));
    }

    void quadrantsShowUp(boolean shm) throws InterruptedException {
        cv = makeCanvas(W, H);
        tk.PA(cv);
        showSolid(0x202020, W, H);
        // Four quadrants; the alpha byte is not shown.
        int[] colours = {0xFFFF0000, 0x0000FF00, 0x800000FF, 0x00FFFFFF};
        for (int q = 0; q < 4; q++) WindowNatives.fill(tk.nativeid, q % 2 * W / 2, q / 2 * H / 2, W / 2, H / 2, colours[q]);
        cv.H(0, 0, W, H);
        int[] px = grab(0, 0, W, H);
        for (int y = 0; y < H; y++)
            for (int x = 0; x < W; x++) {
                int q = (y < H / 2 ? 0 : 2) + (x < W / 2 ? 0 : 1);
                assertEquals(colours[q] & 0xFFFFFF, px[y * W + x], "pixel " + x + "," + y);
            }

        // Buffer addresses: with shared memory each flip moves the toolkit to the
        // other image and two flips return it; otherwise it never moves.
        long a0 = WindowNatives.colourBuffer(tk.nativeid);
        cv.H(0, 0, W, H);
        long a1 = WindowNatives.colourBuffer(tk.nativeid);
        cv.H(0, 0, W, H);
        long a2 = WindowNatives.colourBuffer(tk.nativeid);
        assertEquals(a0, a2);
        if (shm) assertNotEquals(a0, a1, "shared-memory flip kept the colour buffer");
        else assertEquals(a0, a1, "plain flip moved the colour buffer");

        // What is drawn after a flip lands in the image the next flip shows.
        for (int c : new int[] {0x111111, 0x222222}) {
            WindowNatives.fill(tk.nativeid, 0, 0, W, H, c);
            cv.H(0, 0, W, H);
            assertSolid(grab(0, 0, W, H), c, "frame");
        }
        // A flip with nothing drawn shows the current buffer again: the frame
        // before last with shared memory, the last frame otherwise.
        cv.H(0, 0, W, H);
        assertSolid(grab(0, 0, W, H), shm ? 0x111111 : 0x222222, "undrawn frame");
    }

    @Test
    void framesReachTheWindowInTheServersMode() throws Exception {
        quadrantsShowUp(expectShm());
    }

    @Test
    void forcedPlainPathPresentsTheSame() throws Exception {
        System.setProperty("pavoqen.noshm", "true");
        quadrantsShowUp(false);
    }

    @Test
    void sourceRectangleLandsAtTheTopLeft() throws Exception {
        cv = makeCanvas(W, H);
        tk.PA(cv);
        showSolid(0x303030, W, H);
        WindowNatives.coordinates(tk.nativeid);
        cv.H(10, 20, 100, 50);
        int[] px = grab(0, 0, W, H);
        for (int y = 0; y < H; y++)
            for (int x = 0; x < W; x++) {
                int expected = x < 100 && y < 50 ? ((x + 10) << 12) | (y + 20) : 0x303030;
                assertEquals(expected, px[y * W + x], "pixel " + x + "," + y);
            }
        // A rectangle reaching past the buffer is cut off, not read beyond it.
        WindowNatives.coordinates(tk.nativeid);
        cv.H(W - 30, H - 10, 100, 100);
        px = grab(0, 0, 40, 20);
        for (int y = 0; y < 20; y++)
            for (int x = 0; x < 40; x++) {
                int expected = x < 30 && y < 10 ? ((x + W - 30) << 12) | (y + H - 10)
                             : x < 100 && y < 50 ? ((x + 10) << 12) | (y + 20) : 0x303030;
                assertEquals(expected, px[y * 40 + x], "cut pixel " + x + "," + y);
            }
    }

    @Test
    void resizedCanvasDrawsAtTheNewSizeAfterActivation() throws Exception {
        cv = makeCanvas(W, H);
        tk.PA(cv);
        showSolid(0x000000, W, H);
        WindowNatives.fill(tk.nativeid, 0, 0, W, H, 0xA0B0C0);  // dirty-rectangle flips present nothing
        long before = WindowNatives.colourBuffer(tk.nativeid);
        cv.CA(0, 0, W, H, 0, 0);
        cv.CA(-5, 7, 1 << 30, -1, 3, 9);
        assertSolid(grab(0, 0, W, H), 0x000000, "after CA");
        assertEquals(before, WindowNatives.colourBuffer(tk.nativeid));
        cv.wa(awt, 200, 150);
        // Until it is activated again the toolkit has no target at all.
        assertArrayEquals(new int[] {0, 0, 0, 0}, Pavoqen.clipping(tk));
        tk.PA(cv);
        assertArrayEquals(new int[] {0, 0, 200, 150}, Pavoqen.clipping(tk));
        WindowNatives.fill(tk.nativeid, 0, 0, 200, 150, 0x00C08040);
        cv.H(0, 0, W, H);  // larger than the buffer: cut to 200 x 150
        int[] px = grab(0, 0, W, H);
        for (int y = 0; y < H; y++)
            for (int x = 0; x < W; x++)
                assertEquals(x < 200 && y < 150 ? 0xC08040 : 0x000000, px[y * W + x], "pixel " + x + "," + y);
    }

    @Test
    void badSizesAndComponentsRaiseAndBindNothing() throws Exception {
        for (int[] size : new int[][] {{0, 10}, {5, -7}, {32768, 16384}, {65536, 65536}}) {
            za c = new za();
            assertThrows(IllegalArgumentException.class, () -> c.n(null, awt, size[0], size[1]),
                         size[0] + "x" + size[1]);
            assertEquals(0L, c.nativeid);
        }
        za c = new za();
        assertThrows(NullPointerException.class, () -> c.n(null, null, 10, 10));
        // A canvas with no parent window has no drawing surface.
        assertEquals(RuntimeException.class, assertThrows(RuntimeException.class, () -> c.n(null, new Canvas(), 10, 10)).getClass());
        assertEquals(0L, c.nativeid);

        // A bad resize leaves the canvas as it was.
        cv = makeCanvas(W, H);
        tk.PA(cv);
        assertThrows(IllegalArgumentException.class, () -> cv.wa(awt, 0, 100));
        assertThrows(NullPointerException.class, () -> cv.wa(null, 100, 100));
        showSolid(0x123456, W, H);

        // Destroying the active canvas leaves the toolkit without a target, and a
        // destroyed peer raises instead of flipping freed memory.
        cv.ma();
        assertEquals(0L, cv.nativeid);
        assertArrayEquals(new int[] {0, 0, 0, 0}, Pavoqen.clipping(tk));
        assertEquals(0L, WindowNatives.colourBuffer(tk.nativeid));
        assertThrows(IllegalStateException.class, () -> cv.H(0, 0, 10, 10));
        tk.PA(cv);  // an unbound peer: no target
        assertArrayEquals(new int[] {0, 0, 0, 0}, Pavoqen.clipping(tk));
    }
}
