/**
 * Sprites made from Java pixels: a ring of alpha-blended orbs, a checker tile
 * drawn scaled, tiled and turning as a parallelogram with a tint.
 */
final class DemoSprites implements DemoLayer {
    private fa orb, checker;

    @Override public String name() {
        return "sprites";
    }

    @Override public void open(DemoScene scene) {
        int n = 40;
        int[] px = new int[n * n];
        for (int y = 0; y < n; y++)
            for (int x = 0; x < n; x++) {
                double dx = (x + 0.5 - n / 2.0) / (n / 2.0), dy = (y + 0.5 - n / 2.0) / (n / 2.0);
                double d = Math.sqrt(dx * dx + dy * dy);
                if (d >= 1) continue;
                double light = Math.max(0, 1 - Math.hypot(dx + 0.35, dy + 0.35));
                int a = (int) (255 * Math.min(1, (1 - d) * 4));
                px[y * n + x] = a << 24 | DemoFrame.rgb((int) (80 + 175 * light), (int) (120 + 135 * light), 255) & 0xFFFFFF;
            }
        orb = new fa();
        orb.RA(null, px, 0, n, n, n, false);

        int c = 32;
        int[] tile = new int[c * c];
        for (int y = 0; y < c; y++)
            for (int x = 0; x < c; x++)
                tile[y * c + x] = ((x / 8 + y / 8) & 1) == 0 ? 0xFFE0E0E0 : 0xFF8040C0;
        checker = new fa();
        checker.RA(null, tile, 0, c, c, c, false);
    }

    @Override public void close() {
        if (orb != null && orb.nativeid != 0) orb.M(orb.nativeid);
        if (checker != null && checker.nativeid != 0) checker.M(checker.nativeid);
    }

    @Override public void draw(DemoFrame f) {
        DemoLayout l = f.layout;
        blendGrid(f);
        int cx = l.cellX[3], cy = l.cellY[3], r = l.cellRadius;
        for (int i = 0; i < 8; i++) {
            double a = f.t + i * Math.PI / 4;
            orb.Y(orb.nativeid, cx + (int) (Math.cos(a) * r) - 20, cy + (int) (Math.sin(a) * r) - 20, 1, 0, 1);
        }
        // Scaled checker, breathing.
        int s = 24 + (int) Math.round((Math.sin(f.t * 2) + 1) * 16);
        checker.ha(checker.nativeid, l.cellX[1] - s / 2, l.cellY[1] - s / 2, s, s, 1, 0, 0);
        // Tiled strip along the bottom edge of the ramp.
        checker.aa(checker.nativeid, 0, l.rampBottom, l.cellsRight / 2, 12, 2, 0x80FF8000, 0);
        // Turning square, tinted.
        double a = f.t * 0.9;
        float hx = (float) (Math.cos(a) * 28), hy = (float) (Math.sin(a) * 28);
        float ox = l.cellX[2], oy = l.cellY[2];
        checker.e(checker.nativeid, ox - hx + hy, oy - hy - hx, ox + hx + hy, oy + hy - hx, ox - hx - hy, oy - hy + hx,
                  2, 0xA040FF40, 1);
    }

    /**
     * Small orbs right of the title: one row per blend mode (replace, alpha,
     * add), one column per colour operation (modulate, none, tint, add,
     * subtract), with a colour that cycles.
     */
    private void blendGrid(DemoFrame f) {
        DemoLayout l = f.layout;
        int step = 15, size = 14;
        int x0 = l.cellsRight - 5 * step - 8, y0 = l.rampBottom + 1;
        if (x0 < 230) return;  // no room beside the title
        int c = 0x80000000 | DemoFrame.rgb((int) (128 + 127 * Math.sin(f.t)), 160, (int) (128 + 127 * Math.cos(f.t))) & 0xFFFFFF;
        for (int blend = 0; blend < 3; blend++)
            for (int op = 0; op < 5; op++)
                orb.ha(orb.nativeid, x0 + op * step, y0 + blend * step, size, size, op, c, blend);
    }
}
