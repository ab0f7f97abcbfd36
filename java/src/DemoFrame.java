/** What a layer needs to draw one frame: the toolkit, the target size and the time. */
final class DemoFrame {
    final ja tk;
    final int width, height;
    /** Frame number, from 0. */
    final int frame;
    /** Scene time in seconds: frame / 60, so that every run draws the same frames. */
    final double t;
    /** Where the pieces sit at this size. */
    final DemoLayout layout;

    DemoFrame(ja tk, int width, int height, int frame) {
        this.tk = tk;
        this.width = width;
        this.height = height;
        this.frame = frame;
        this.t = frame / 60.0;
        this.layout = new DemoLayout(width, height);
    }

    /** Opaque colour from red, green, blue. */
    static int rgb(int r, int g, int b) {
        return 0xFF000000 | (clamp(r) << 16) | (clamp(g) << 8) | clamp(b);
    }

    static int clamp(int v) {
        return v < 0 ? 0 : v > 255 ? 255 : v;
    }
}
