import java.awt.Canvas;
import java.awt.Dimension;
import java.awt.EventQueue;
import java.awt.Frame;
import java.awt.Graphics;
import java.awt.GraphicsEnvironment;
import java.awt.event.WindowAdapter;
import java.awt.event.WindowEvent;
import java.awt.image.BufferedImage;
import java.io.File;
import java.io.IOException;
import java.util.Locale;

import javax.imageio.ImageIO;

/**
 * Demo client. Drives the library through its peer classes the way a game
 * client does: toolkit, memory pool, canvas, and per frame activate, draw,
 * flip. The scene is {@link DemoScene}.
 *
 * <pre>
 *   Demo [--window | --headless] [--frames N] [--size WxH] [--fps N] [--out FILE]
 * </pre>
 *
 * --window shows the animated scene in an AWT window (the default when a
 * display is available); it runs until the window is closed or N frames have
 * been shown, at most --fps frames per second (default 60, 0: unlimited).
 * --headless renders N frames (default 60) into an offscreen sprite and writes
 * the last one to FILE (default out/demo.png). Both print the frame rate and
 * the time per frame.
 */
public final class Demo {
    private int frames = -1;
    private int width = 800, height = 600;
    private int fpsCap = 60;
    private String out = "out/demo.png";
    private Boolean window;

    private volatile boolean running = true;

    public static void main(String[] args) throws Exception {
        Demo d = new Demo();
        try {
            d.parse(args);
        } catch (IllegalArgumentException e) {
            System.err.println("demo: " + e.getMessage());
            System.err.println("usage: Demo [--window | --headless] [--frames N] [--size WxH] [--fps N] [--out FILE]");
            System.exit(2);
        }
        boolean display = !GraphicsEnvironment.isHeadless() && System.getenv("DISPLAY") != null;
        boolean useWindow = d.window != null ? d.window : display;
        if (useWindow && !display) {
            System.err.println("demo: --window needs a display (DISPLAY is not set)");
            System.exit(2);
        }
        Pavoqen.loadLibrary();
        if (useWindow) d.runWindow();
        else d.runHeadless();
        System.exit(0);  // AWT threads would keep the JVM alive
    }

    private void parse(String[] args) {
        for (int i = 0; i < args.length; i++) {
            String a = args[i];
            switch (a) {
                case "--window": window = true; break;
                case "--headless": window = false; break;
                case "--frames": frames = positive(value(args, ++i, a), a); break;
                case "--fps": fpsCap = Integer.parseInt(value(args, ++i, a)); break;
                case "--out": out = value(args, ++i, a); break;
                case "--size": {
                    String[] wh = value(args, ++i, a).toLowerCase(Locale.ROOT).split("x");
                    if (wh.length != 2) throw new IllegalArgumentException("--size wants WxH");
                    width = positive(wh[0], a);
                    height = positive(wh[1], a);
                    break;
                }
                default: throw new IllegalArgumentException("unknown option " + a);
            }
        }
    }

    private static String value(String[] args, int i, String option) {
        if (i >= args.length) throw new IllegalArgumentException(option + " needs a value");
        return args[i];
    }

    private static int positive(String s, String option) {
        try {
            int v = Integer.parseInt(s.trim());
            if (v > 0) return v;
        } catch (NumberFormatException e) {
            // reported below
        }
        throw new IllegalArgumentException(option + " wants a positive number, not " + s);
    }

    // ---- timing -----------------------------------------------------------------------------

    /** Frame counts and the time spent drawing and presenting. */
    private static final class Timing {
        final long start = System.nanoTime();
        long draw, present;
        int count;
        long windowStart = start;
        int windowCount;

        String summary(long now) {
            double secs = (now - start) / 1e9;
            return String.format(Locale.ROOT, "%d frames in %.2f s: %.1f fps, %.3f ms per frame (draw %.3f ms, present %.3f ms)",
                                 count, secs, count / secs, (draw + present) / 1e6 / Math.max(1, count),
                                 draw / 1e6 / Math.max(1, count), present / 1e6 / Math.max(1, count));
        }
    }

    // ---- window ---------------------------------------------------------------------------

    /** The window's canvas: AWT never erases it; the render loop presents every frame. */
    static final class DemoCanvas extends Canvas {
        DemoCanvas(int w, int h) {
            setPreferredSize(new Dimension(w, h));
            setIgnoreRepaint(true);
        }

        @Override public void update(Graphics g) {}

        @Override public void paint(Graphics g) {}
    }

    private void runWindow() throws Exception {
        Frame frame = new Frame("pavoqen-sse demo");
        DemoCanvas canvas = new DemoCanvas(width, height);
        EventQueue.invokeAndWait(() -> {
            frame.add(canvas);
            frame.pack();
            frame.addWindowListener(new WindowAdapter() {
                @Override public void windowClosing(WindowEvent e) {
                    running = false;
                }
            });
            frame.setVisible(true);
        });
        long deadline = System.nanoTime() + 10_000_000_000L;
        while (!canvas.isShowing() && System.nanoTime() < deadline) Thread.sleep(10);
        if (!canvas.isShowing()) throw new IllegalStateException("the demo window never appeared");

        ja tk = Pavoqen.createToolkit(DemoTextures.SOURCE, DemoTextures.IDS);
        DemoTextures.preload(tk, 4);
        DemoScene scene = new DemoScene(tk);
        System.out.println("demo: window, layers " + scene.layerNames());
        int w = canvas.getWidth(), h = canvas.getHeight();
        za cv = new za();
        cv.n(null, canvas, w, h);
        Timing timing = new Timing();
        long frameNanos = fpsCap > 0 ? 1_000_000_000L / fpsCap : 0;
        long next = System.nanoTime();
        for (int i = 0; running && (frames < 0 || i < frames); i++) {
            int nw = canvas.getWidth(), nh = canvas.getHeight();
            if ((nw != w || nh != h) && nw > 0 && nh > 0) {
                cv.wa(canvas, nw, nh);  // new buffers; activated again below
                w = nw;
                h = nh;
            }
            long t0 = System.nanoTime();
            tk.PA(cv);
            scene.draw(new DemoFrame(tk, w, h, i));
            long t1 = System.nanoTime();
            cv.H(0, 0, w, h);
            long t2 = System.nanoTime();
            timing.draw += t1 - t0;
            timing.present += t2 - t1;
            timing.count++;
            timing.windowCount++;
            if (t2 - timing.windowStart >= 1_000_000_000L) {
                double fps = timing.windowCount * 1e9 / (t2 - timing.windowStart);
                DemoText.status = String.format(Locale.ROOT, "%.0f FPS", fps);
                System.out.printf(Locale.ROOT, "demo: %.1f fps, %.3f ms per frame%n", fps,
                                  (timing.draw + timing.present) / 1e6 / timing.count);
                timing.windowStart = t2;
                timing.windowCount = 0;
            }
            if (frameNanos > 0) {
                next += frameNanos;
                long wait = next - System.nanoTime();
                if (wait > 0) Thread.sleep(wait / 1_000_000, (int) (wait % 1_000_000));
                else next = System.nanoTime();
            }
        }
        System.out.println("demo: window " + w + "x" + h + ", " + timing.summary(System.nanoTime()));
        cv.ma();
        scene.close();
        tk.ma();
        EventQueue.invokeAndWait(frame::dispose);
    }

    // ---- headless -------------------------------------------------------------------------

    private void runHeadless() throws IOException {
        int n = frames > 0 ? frames : 60;
        ja tk = Pavoqen.createToolkit(DemoTextures.SOURCE, DemoTextures.IDS);
        DemoTextures.preload(tk, 4);
        DemoScene scene = new DemoScene(tk);
        System.out.println("demo: headless, layers " + scene.layerNames());
        fa target = new fa();
        target.UA(0, width, height);
        oa depth = new oa();
        depth.g(width, height);
        Timing timing = new Timing();
        for (int i = 0; i < n; i++) {
            long t0 = System.nanoTime();
            tk.d(target.nativeid, depth.nativeid);
            tk.ba(3, 0xFF000000);
            scene.draw(new DemoFrame(tk, width, height, i));
            timing.draw += System.nanoTime() - t0;
            timing.count++;
        }
        String summary = timing.summary(System.nanoTime());
        int[] pixels = tk.E(0, 0, width, height);
        if (pixels == null) throw new IllegalStateException("could not read the frame back");
        BufferedImage img = new BufferedImage(width, height, BufferedImage.TYPE_INT_RGB);
        img.setRGB(0, 0, width, height, pixels, 0, width);
        File file = new File(out);
        if (file.getParentFile() != null) file.getParentFile().mkdirs();
        if (!ImageIO.write(img, "png", file)) throw new IOException("no PNG writer");
        System.out.println("demo: headless " + width + "x" + height + ", " + summary);
        System.out.println("demo: wrote " + file.getPath());
        target.M(target.nativeid);
        depth.za(depth.nativeid);
        scene.close();
        tk.ma();
    }
}
