import java.util.ArrayList;
import java.util.List;

/**
 * The demo scene: the memory pool and the layers drawn in order every frame.
 * Layers are drawn back to front; each one draws only with what the library
 * offers (layers whose natives are missing drop out with a note).
 */
final class DemoScene {
    /** Memory pool shared by the fonts, masks and other pooled objects. */
    final ba pool;
    final ja tk;
    private final List<DemoLayer> layers = new ArrayList<>();

    DemoScene(ja tk) {
        this.tk = tk;
        pool = new ba();
        pool.sa(0, 4 << 20);
        tk.n(pool);
        // Back to front. New features: add their layer here.
        add(new DemoTestCard());
        add(new DemoPanel2D());
        add(new DemoTriangles());
        add(new DemoSprites());
        add(new DemoParticles());
        add(new DemoText());
    }

    private void add(DemoLayer layer) {
        try {
            layer.open(this);
            layers.add(layer);
        } catch (UnsatisfiedLinkError e) {
            missing(layer, e);
        }
    }

    private static void missing(DemoLayer layer, UnsatisfiedLinkError e) {
        System.out.println("demo: layer " + layer.name() + " left out, not in the library yet (" + e.getMessage() + ")");
    }

    /** Names of the layers that draw. */
    List<String> layerNames() {
        List<String> names = new ArrayList<>();
        for (DemoLayer l : layers) names.add(l.name());
        return names;
    }

    /** Draws one frame into the toolkit's current target, which the caller has cleared. */
    void draw(DemoFrame f) {
        for (int i = 0; i < layers.size(); i++) {
            DemoLayer layer = layers.get(i);
            try {
                f.tk.L();  // every layer starts with the whole target as clip
                layer.draw(f);
            } catch (UnsatisfiedLinkError e) {
                missing(layer, e);
                layer.close();
                layers.remove(i--);
            }
        }
        f.tk.L();
        DemoTestCard.drawBorder(f);
    }

    void close() {
        for (DemoLayer l : layers) l.close();
        layers.clear();
        pool.ma();
    }
}
