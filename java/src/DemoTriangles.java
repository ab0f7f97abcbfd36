/**
 * Triangles through a thread resource: a turning fan of Gouraud-shaded
 * triangles and a thick line sweeping across it.
 */
final class DemoTriangles implements DemoLayer {
    private a tr;

    @Override public String name() {
        return "triangles";
    }

    @Override public void open(DemoScene scene) {
        tr = new a();
        tr.ha(0, 0, 0, 0, 0);
    }

    @Override public void close() {
        if (tr != null && tr.nativeid != 0) tr.R(tr.nativeid);
    }

    @Override public void draw(DemoFrame f) {
        int cx = f.layout.cellX[1], cy = f.layout.cellY[1], r = f.layout.cellRadius;
        int n = 7;
        for (int i = 0; i < n; i++) {
            double a0 = f.t * 0.6 + i * 2 * Math.PI / n, a1 = a0 + Math.PI / n;
            int c = java.awt.Color.HSBtoRGB((float) i / n, 0.8f, 1f);
            tr.ra(tr.nativeid, cx, cy, cx + (int) (Math.cos(a0) * r), cy + (int) (Math.sin(a0) * r),
                  cx + (int) (Math.cos(a1) * r), cy + (int) (Math.sin(a1) * r), 0xFFFFFFFF, c, c & 0xFF3F3F3F);
        }
        double a = -f.t * 0.4;
        tr.K(tr.nativeid, 0, cx - (int) (Math.cos(a) * r * 1.1), cy - (int) (Math.sin(a) * r * 1.1),
             cx + (int) (Math.cos(a) * r * 1.1), cy + (int) (Math.sin(a) * r * 1.1), 0xFF40E0FF, 5, 0);
    }
}
