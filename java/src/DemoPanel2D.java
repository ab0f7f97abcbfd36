/**
 * The 2D primitives card ({@link TestCard2D}): every drawing mode, masks and
 * the three font kinds at fixed places. Rendered once into an offscreen
 * sprite and depth pair, then copied into each frame where the layout has
 * room for it.
 */
final class DemoPanel2D implements DemoLayer {
    private fa sprite;
    private oa depth;
    private final o copier = new o();

    @Override public String name() {
        return "2D primitives card";
    }

    @Override public void open(DemoScene scene) {
        sprite = new fa();
        sprite.UA(0, DemoLayout.PANEL_W, DemoLayout.PANEL_H);
        depth = new oa();
        depth.g(DemoLayout.PANEL_W, DemoLayout.PANEL_H);
        scene.tk.d(sprite.nativeid, depth.nativeid);
        TestCard2D.draw(scene.tk, scene.pool, DemoLayout.PANEL_W, DemoLayout.PANEL_H);
        scene.tk.d(0, 0);
    }

    @Override public void close() {
        if (sprite != null && sprite.nativeid != 0) sprite.M(sprite.nativeid);
        if (depth != null && depth.nativeid != 0) depth.za(depth.nativeid);
    }

    @Override public void draw(DemoFrame f) {
        DemoLayout l = f.layout;
        if (l.panelX < 0) return;
        copier.BA(f.tk.nativeid, sprite.nativeid, depth.nativeid, 0, 0, DemoLayout.PANEL_W, DemoLayout.PANEL_H,
                  l.panelX, l.panelY, true, false);
        // A frame around it, with a marker sweeping along its top edge.
        int x = l.panelX - 1, y = l.panelY - 1, w = DemoLayout.PANEL_W + 2, h = DemoLayout.PANEL_H + 2;
        f.tk.XA(x, y, w, 0xFF8090A0, 0);
        f.tk.XA(x, y + h - 1, w, 0xFF8090A0, 0);
        f.tk.G(x, y, h, 0xFF8090A0, 0);
        f.tk.G(x + w - 1, y, h, 0xFF8090A0, 0);
        int m = (int) ((f.t * 80) % w);
        f.tk.B(x + m - 8, y - 1, 16, 3, 0xFFFFD040, 0);
    }
}
