/**
 * A toolkit drawing into an offscreen sprite and depth buffer of w x h, with a
 * memory pool, for JVM tests that draw and read back. Colour and depth start
 * cleared (0 and far).
 */
final class OffscreenTarget implements AutoCloseable {
    final int w, h;
    final ja tk;
    final ba pool;
    final fa sprite;
    final oa depth;

    OffscreenTarget(int w, int h) {
        this.w = w;
        this.h = h;
        tk = new ja();
        tk.q(null, 0);
        pool = new ba();
        pool.sa(0, 1 << 20);
        sprite = new fa();
        sprite.UA(0, w, h);
        depth = new oa();
        depth.g(w, h);
        tk.d(sprite.nativeid, depth.nativeid);
        tk.ba(3, 0);
    }

    int[] pixels() {
        return tk.E(0, 0, w, h);
    }

    @Override public void close() {
        tk.d(0, 0);
        sprite.M(sprite.nativeid);
        depth.za(depth.nativeid);
        pool.ma();
        tk.ma();
    }
}
