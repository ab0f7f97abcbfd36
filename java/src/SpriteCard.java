import java.io.File;
import java.io.IOException;


/**
 * A sprite test card: one sprite drawn with every colour operation (rows:
 * modulate, none, tint, add, subtract) in every blend mode (columns: replace,
 * alpha, add), then scaled, tiled, rotated and sheared as parallelograms, and
 * confined by a clipping mask, and a particle fountain. Drawn into an offscreen
 * sprite and written as a PNG.
 */
public final class SpriteCard {
    private SpriteCard() {}

    /** A size x size ball: a colour wheel fading to transparent at the rim. */
    static int[] ball(int size) {
        int[] px = new int[size * size];
        double r = size / 2.0;
        for (int y = 0; y < size; ++y)
            for (int x = 0; x < size; ++x) {
                double dx = x + 0.5 - r, dy = y + 0.5 - r, d = Math.sqrt(dx * dx + dy * dy) / r;
                if (d >= 1) continue;
                double hue = Math.atan2(dy, dx) / (2 * Math.PI) + 0.5;
                int rgb = java.awt.Color.HSBtoRGB((float) hue, (float) Math.min(1, d * 1.5), 1f) & 0xFFFFFF;
                int a = (int) (255 * Math.min(1, (1 - d) * 3));
                px[y * size + x] = a << 24 | rgb;
            }
        return px;
    }

    /** Draws the card over the current target of {@code tk} (at least 320 x 240). */
    public static void draw(ja tk, ba pool, int w, int h) {
        tk.L();
        tk.ba(3, 0);
        // a checkerboard, so that blending shows
        for (int y = 0; y < h; y += 8)
            for (int x = 0; x < w; x += 8) tk.B(x, y, 8, 8, ((x ^ y) & 8) != 0 ? 0xFF505860 : 0xFF303438, 0);
        fa ball = new fa();
        fa bars = new fa();
        int[] px = ball(24);
        ball.RA(null, px, 0, 24, 24, 24, false);
        int[] stripes = new int[8 * 8];
        for (int i = 0; i < stripes.length; ++i)
            stripes[i] = ((i % 8) < 4) ^ ((i / 8) < 4) ? 0xC0FFC040 : 0x4040A0FF;
        bars.RA(null, stripes, 0, 8, 8, 8, false);
        wa mask = new wa();
        int rows = 40;
        int[] starts = new int[rows], lengths = new int[rows];
        for (int r = 0; r < rows; ++r) {
            starts[r] = Math.abs(r - 20);
            lengths[r] = 40 - 2 * Math.abs(r - 20);
        }
        mask.l(null, pool, 40, 40, starts, lengths);
        try {
            long b = ball.nativeid;
            // 5 colour operations x 3 blend modes
            int colour = 0x90FF8040;
            for (int op = 0; op < 5; ++op)
                for (int blend = 0; blend < 3; ++blend) ball.Y(b, 6 + blend * 28, 6 + op * 28, op, colour, blend);
            // scaled up and down, and depth-tested against a cleared depth buffer
            ball.ha(b, 96, 6, 64, 64, 1, 0, 1);
            ball.ha(b, 164, 6, 12, 12, 1, 0, 1);
            ball.G(b, 164, 24, 10, 40, 40, 2, 0x80FFFFFF, 1);
            // tiled over a strip, added
            bars.aa(bars.nativeid, 96, 76, 100, 20, 1, 0, 1);
            // parallelograms: the stripes upright and rotated by 30 and 60 degrees; the ball sheared
            for (int k = 0; k < 3; ++k) {
                double a = k * Math.PI / 6, s = 36;
                float cx = 230 + k * 30, cy = 40 + k * 50;
                float x0 = (float) (cx - s / 2 * Math.cos(a) + s / 2 * Math.sin(a));
                float y0 = (float) (cy - s / 2 * Math.sin(a) - s / 2 * Math.cos(a));
                bars.e(bars.nativeid, x0, y0, x0 + (float) (s * Math.cos(a)), y0 + (float) (s * Math.sin(a)),
                        x0 - (float) (s * Math.sin(a)), y0 + (float) (s * Math.cos(a)), 1, 0, 1);
            }
            ball.e(b, 96, 110, 156, 110, 126, 150, 0, 0xFFFFFFFF, 1);
            // confined by a diamond mask: blended, and as a masked parallelogram replaced
            ball.o(b, 170, 110, mask.nativeid, 170, 110);
            bars.FA(bars.nativeid, 220, 170, 300, 190, 200, 230, 0, mask.nativeid, 230, 180, true);
        } finally {
            mask.ma();
            ball.M(ball.nativeid);
            bars.M(bars.nativeid);
        }
        fountain(tk, w, h);
    }

    /** A soft round particle texture (128 x 128). */
    static int[] sparkTexture() {
        int[] px = new int[128 * 128];
        for (int y = 0; y < 128; ++y)
            for (int x = 0; x < 128; ++x) {
                double d = Math.hypot(x - 63.5, y - 63.5) / 64;
                int a = d >= 1 ? 0 : (int) (255 * Math.min(1, 1.6 * (1 - d)));
                px[y * 128 + x] = a << 24 | 0xFFE0A0;
            }
        return px;
    }

    /**
     * A particle fountain in the lower left: textured sparks (texture 1, when the
     * toolkit has a texture cache that can get it) and plain discs, along arcs,
     * depth-tested against a cleared depth buffer.
     */
    static void fountain(ja tk, int w, int h) {
        // world (x, y, z) lands on pixel (x, y) at depth z / 2 + 1/2; right axis +x
        tk.GA(0f, 1f);
        tk.wa(new float[] {2f / w, 0, 0, 0, 0, 2f / h, 0, 0, 0, 0, 1, 0, -1, -1, 0, 1});
        tk.AA(new float[] {1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1});
        tk.ba(2, 0);
        int n = 120;
        int[] pos = new int[3 * n], colours = new int[n], sizes = new int[n];
        short[] textures = new short[n];
        java.util.Random rng = new java.util.Random(7);
        for (int i = 0; i < n; ++i) {
            double t = rng.nextDouble(), vx = (rng.nextDouble() - 0.5) * 70, vy = -190 - rng.nextDouble() * 50;
            double x = 45 + vx * t, y = 232 + vy * t + 200 * t * t;
            pos[3 * i] = (int) (x * 4096);
            pos[3 * i + 1] = (int) (y * 4096);
            pos[3 * i + 2] = 0;
            colours[i] = (int) (255 * (1 - t * 0.7)) << 24 | (i % 2 == 0 ? 0xFFFFFF : 0x60C0FF);
            sizes[i] = (int) ((i % 2 == 0 ? 16 - 8 * t : 7 - 4 * t) * 2048);
            textures[i] = (short) (i % 2 == 0 ? 1 : -1);
        }
        a tr = new a();
        tr.ha(0, 0, 0, 0, 0);
        try {
            tr.b(tr.nativeid, 0, pos, colours, sizes, textures, n);
        } finally {
            tr.R(tr.nativeid);
        }
    }

    /** Writes the card at 320 x 240 to the file named by the first argument (default out/sprites.png). */
    public static void main(String[] args) throws IOException {
        Pavoqen.loadLibrary();
        ja tk = Pavoqen.createToolkit((t, id) -> {
            if (id != 1) return false;
            t.F(id, sparkTexture(), 0, 2, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0);
            return true;
        }, 16);
        try {
            File png = new File(args.length > 0 ? args[0] : "out/sprites.png");
            renderPng(tk, 320, 240, png);
            System.out.println("pavoqen: sprite card written to " + png);
        } finally {
            tk.ma();
        }
    }

    /** Renders the card offscreen at width x height and writes it to {@code png}. */
    public static void renderPng(ja tk, int width, int height, File png) throws IOException {
        OffscreenPng.render(tk, width, height, 1 << 16, png, SpriteCard::draw);
    }
}
