/**
 * 2D test card: colour bars, a grey ramp, a grid, additive colour discs, a
 * clock hand, a bouncing ball and a disc-shaped clipping mask filled and
 * hatched through the mask. The bars, the ramp and the border never move, so
 * a check can find them at fixed places (see {@link #BAR_COLOURS} and
 * {@link DemoLayout}); the border is drawn last of all ({@link #drawBorder}).
 */
final class DemoTestCard implements DemoLayer {
    /** The eight bars left to right across the top 30 % of the target. */
    static final int[] BAR_COLOURS = {
        0xFFFFFFFF, 0xFFFFFF00, 0xFF00FFFF, 0xFF00FF00, 0xFFFF00FF, 0xFFFF0000, 0xFF0000FF, 0xFF000000,
    };
    static final int BACKGROUND = 0xFF181820;
    static final int BORDER = 0xFFFFFFFF;
    static final int RAMP_STEPS = 16;

    private static final int MASK_RADIUS = 40;
    private wa mask;

    @Override public String name() {
        return "2D test card";
    }

    @Override public void open(DemoScene scene) {
        int d = 2 * MASK_RADIUS;
        int[] starts = new int[d], lengths = new int[d];
        for (int r = 0; r < d; r++) {
            double dy = r + 0.5 - MASK_RADIUS;
            int half = (int) Math.round(Math.sqrt(Math.max(0, MASK_RADIUS * MASK_RADIUS - dy * dy)));
            starts[r] = MASK_RADIUS - half;
            lengths[r] = 2 * half;
        }
        mask = new wa();
        mask.l(null, scene.pool, d, d, starts, lengths);
    }

    @Override public void close() {
        if (mask != null) mask.ma();
    }

    @Override public void draw(DemoFrame f) {
        ja tk = f.tk;
        int w = f.width, h = f.height;
        tk.B(0, 0, w, h, BACKGROUND, 0);

        DemoLayout l = f.layout;
        int bars = l.barsBottom;
        for (int i = 0; i < 8; i++) tk.B(i * w / 8, 0, (i + 1) * w / 8 - i * w / 8, bars, BAR_COLOURS[i], 0);
        int ramp = l.rampBottom;
        for (int i = 0; i < RAMP_STEPS; i++) {
            int g = i * 255 / (RAMP_STEPS - 1);
            tk.B(i * w / RAMP_STEPS, bars, (i + 1) * w / RAMP_STEPS - i * w / RAMP_STEPS, ramp - bars,
                 DemoFrame.rgb(g, g, g), 0);
        }

        // Grid over the lower part, blended.
        for (int x = 32; x < w; x += 32) tk.G(x, ramp, h - ramp, 0x40FFFFFF, 1);
        for (int y = ramp + 32; y < h; y += 32) tk.XA(0, y, w, 0x40FFFFFF, 1);

        int room = l.cellRadius;

        // Three additive discs turning around a point: white where all meet.
        int cx = l.cellX[0], cy = l.cellY[0], r = Math.max(4, room * 2 / 3);
        int[] discs = {0xFFC00000, 0xFF00C000, 0xFF0000C0};
        for (int i = 0; i < 3; i++) {
            double a = f.t * 0.8 + i * 2 * Math.PI / 3;
            int dx = (int) Math.round(Math.cos(a) * r * 0.45), dy = (int) Math.round(Math.sin(a) * r * 0.45);
            tk.CA(cx + dx, cy + dy, r, discs[i], 2);
        }

        // Clock face with a hand turning once every four seconds.
        int kx = l.cellX[2], ky = l.cellY[2], kr = room;
        tk.CA(kx, ky, kr, 0xFFE0E0E0, 0);
        tk.CA(kx, ky, Math.max(1, kr - 3), 0xFF202838, 0);
        for (int i = 0; i < 12; i++) {
            double a = i * Math.PI / 6;
            tk.YA(kx + (int) (Math.cos(a) * kr * 0.8), ky + (int) (Math.sin(a) * kr * 0.8),
                  kx + (int) (Math.cos(a) * kr * 0.95), ky + (int) (Math.sin(a) * kr * 0.95), 0xFFE0E0E0, 0);
        }
        double hand = f.t * Math.PI / 2 - Math.PI / 2;
        tk.YA(kx, ky, kx + (int) (Math.cos(hand) * kr * 0.9), ky + (int) (Math.sin(hand) * kr * 0.9), 0xFFFF4040, 0);
        tk.CA(kx, ky, 3, 0xFFFF4040, 0);

        // Disc mask swaying in the last cell: filled, then hatched through the mask.
        int sway = Math.max(0, room - MASK_RADIUS / 2);
        int mx = l.cellX[3] - MASK_RADIUS + (int) Math.round(Math.sin(f.t * 1.3) * sway);
        int my = l.cellY[3] - MASK_RADIUS;
        tk.DA(0xFF305080, mask, mx, my);
        for (int i = -2 * MASK_RADIUS; i < 2 * MASK_RADIUS; i += 8)
            tk.R(mx + i, my, mx + i + 2 * MASK_RADIUS, my + 2 * MASK_RADIUS, 0xFFFFD040, 0, mask, mx, my);

        // Ball bouncing along the bottom.
        int br = Math.max(4, h / 40);
        double phase = (f.t * 0.5) % 2.0;
        int bx = br + (int) ((phase < 1 ? phase : 2 - phase) * (l.cellsRight - 2 * br - 1));
        int by = h - br - 2 - (int) Math.abs(Math.sin(f.t * 4) * Math.min(h / 6, room));
        tk.CA(bx, by, br, 0xC0FF8000, 1);
    }

    /** One-pixel border around the whole target. */
    static void drawBorder(DemoFrame f) {
        ja tk = f.tk;
        int w = f.width, h = f.height;
        tk.XA(0, 0, w, BORDER, 0);
        tk.XA(0, h - 1, w, BORDER, 0);
        tk.G(0, 0, h, BORDER, 0);
        tk.G(w - 1, 0, h, BORDER, 0);
    }
}
