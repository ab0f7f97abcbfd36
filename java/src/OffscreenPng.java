import java.awt.image.BufferedImage;
import java.io.File;
import java.io.IOException;
import javax.imageio.ImageIO;

/**
 * Renders into a fresh offscreen sprite and depth buffer (with a memory pool
 * for pooled objects) and writes the pixels as a PNG: the way the cards and
 * tools save pictures without a window.
 */
final class OffscreenPng {
    /** Draws into the current target of {@code tk} (cleared to 0, depth far). */
    interface Drawing {
        void draw(ja tk, ba pool, int width, int height);
    }

    private OffscreenPng() {}

    static void render(ja tk, int width, int height, int poolBytes, File png, Drawing drawing) throws IOException {
        ba pool = new ba();
        pool.sa(0, poolBytes);
        fa sprite = new fa();
        oa depth = new oa();
        try {
            sprite.UA(0, width, height);
            depth.g(width, height);
            tk.d(sprite.nativeid, depth.nativeid);
            tk.ba(3, 0);
            drawing.draw(tk, pool, width, height);
            int[] pixels = tk.E(0, 0, width, height);
            tk.d(0, 0);
            BufferedImage img = new BufferedImage(width, height, BufferedImage.TYPE_INT_RGB);
            img.setRGB(0, 0, width, height, pixels, 0, width);
            File dir = png.getAbsoluteFile().getParentFile();
            if (dir != null) dir.mkdirs();
            ImageIO.write(img, "png", png);
        } finally {
            tk.d(0, 0);
            if (sprite.nativeid != 0) sprite.M(sprite.nativeid);
            if (depth.nativeid != 0) depth.za(depth.nativeid);
            pool.ma();
        }
    }
}
