import java.awt.Canvas;
import java.awt.EventQueue;
import java.awt.Frame;
import java.awt.Graphics;
import java.util.Locale;

/**
 * Presentation benchmark: flips per second of a W x H canvas (default
 * 1024 x 768) through shared-memory images and through the plain XPutImage
 * path, on the display in DISPLAY. Two figures per path:
 *   - stream: N flips back to back, then one round trip to the server, so the
 *     time covers the server's work too;
 *   - synced: a round trip after every flip (the server has finished copying
 *     before the next frame is drawn).
 * Prints a table, then "ratio" lines (shared memory / plain, higher is better).
 *
 *   FlipBench [W H]
 */
public final class FlipBench {
    static final class Surface extends Canvas {
        @Override public void update(Graphics g) {}
        @Override public void paint(Graphics g) {}
    }

    public static void main(String[] args) throws Exception {
        int w = args.length > 1 ? Integer.parseInt(args[0]) : 1024;
        int h = args.length > 1 ? Integer.parseInt(args[1]) : 768;
        Pavoqen.loadLibrary();
        Frame frame = new Frame("pavoqen flip benchmark");
        Surface canvas = new Surface();
        canvas.setSize(w, h);
        EventQueue.invokeAndWait(() -> {
            frame.setUndecorated(true);
            frame.add(canvas);
            frame.pack();
            frame.setVisible(true);
        });
        long deadline = System.nanoTime() + 10_000_000_000L;
        while (!canvas.isShowing() && System.nanoTime() < deadline) Thread.sleep(10);
        if (!canvas.isShowing()) throw new IllegalStateException("window never appeared");
        ja tk = Pavoqen.createToolkit(null, 0);

        double[] shm = run(tk, canvas, w, h, false);
        double[] plain = run(tk, canvas, w, h, true);

        System.out.printf(Locale.ROOT, "%-28s %14s %14s%n", "flip " + w + "x" + h, "stream flips/s", "synced flips/s");
        System.out.printf(Locale.ROOT, "%-28s %14.1f %14.1f%s%n", "shared memory (MIT-SHM)", shm[0], shm[1],
                          shm[2] == 0 ? "   (server refused: plain path)" : "");
        System.out.printf(Locale.ROOT, "%-28s %14.1f %14.1f%n", "plain (XPutImage)", plain[0], plain[1]);
        System.out.printf(Locale.ROOT, "ratio flip_%dx%d_shm_vs_plain %.2f%n", w, h, shm[0] / plain[0]);
        System.out.printf(Locale.ROOT, "ratio flip_synced_%dx%d_shm_vs_plain %.2f%n", w, h, shm[1] / plain[1]);

        tk.ma();
        EventQueue.invokeAndWait(frame::dispose);
        System.exit(0);
    }

    /** {stream flips/s, synced flips/s, 1 if shared memory was used}. */
    static double[] run(ja tk, Canvas canvas, int w, int h, boolean plain) {
        if (plain) System.setProperty("pavoqen.noshm", "true");
        else System.clearProperty("pavoqen.noshm");
        za cv = new za();
        cv.n(null, canvas, w, h);
        tk.PA(cv);
        tk.B(0, 0, w, h, 0xFF336699, 0);
        long before = WindowNatives.colourBuffer(tk.nativeid);
        cv.H(0, 0, w, h);
        boolean usedShm = WindowNatives.colourBuffer(tk.nativeid) != before;
        tk.B(0, 0, w, h, 0xFF996633, 0);
        for (int i = 0; i < 50; i++) cv.H(0, 0, w, h);  // warm-up
        WindowNatives.sync(canvas);

        int n = 0;
        long t0 = System.nanoTime(), t1;
        do {
            for (int i = 0; i < 20; i++) cv.H(0, 0, w, h);
            n += 20;
            WindowNatives.sync(canvas);
            t1 = System.nanoTime();
        } while (t1 - t0 < 2_000_000_000L);
        double stream = n * 1e9 / (t1 - t0);

        n = 0;
        t0 = System.nanoTime();
        do {
            cv.H(0, 0, w, h);
            WindowNatives.sync(canvas);
            n++;
            t1 = System.nanoTime();
        } while (t1 - t0 < 2_000_000_000L);
        double synced = n * 1e9 / (t1 - t0);
        cv.ma();
        System.clearProperty("pavoqen.noshm");
        return new double[] {stream, synced, usedShm ? 1 : 0};
    }
}
