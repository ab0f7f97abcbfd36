import java.awt.image.BufferedImage;
import java.io.File;
import java.util.HashSet;
import java.util.Set;

import javax.imageio.ImageIO;

/**
 * Checks the PNG that the headless demo wrote: its size, the test card's
 * colour bars, grey ramp and border at their places, and that the rest holds
 * a drawn scene rather than a blank or one-colour frame.
 *
 *   DemoPngCheck FILE WIDTH HEIGHT
 */
final class DemoPngCheck {
    private static int failures;

    public static void main(String[] args) throws Exception {
        File file = new File(args[0]);
        int w = Integer.parseInt(args[1]), h = Integer.parseInt(args[2]);
        BufferedImage img = ImageIO.read(file);
        if (img == null) fail("not a readable image: " + file);
        if (img.getWidth() != w || img.getHeight() != h)
            fail("size " + img.getWidth() + "x" + img.getHeight() + ", expected " + w + "x" + h);

        int[] bars = {0xFFFFFF, 0xFFFF00, 0x00FFFF, 0x00FF00, 0xFF00FF, 0xFF0000, 0x0000FF, 0x000000};
        DemoLayout layout = new DemoLayout(w, h);
        int barsBottom = layout.barsBottom;
        for (int i = 0; i < 8; i++) {
            int x0 = i * w / 8, x1 = (i + 1) * w / 8;
            for (int x : new int[] {x0 + (i == 0 ? 1 : 0), (x0 + x1) / 2, x1 - 1 - (i == 7 ? 1 : 0)})
                for (int y : new int[] {1, barsBottom / 2, barsBottom - 1}) expect(img, x, y, bars[i], "bar " + i);
        }
        int rampBottom = layout.rampBottom;
        int steps = DemoTestCard.RAMP_STEPS;
        for (int i = 0; i < steps; i++) {
            int g = i * 255 / (steps - 1);
            expect(img, (i * w / steps + (i + 1) * w / steps) / 2, (barsBottom + rampBottom) / 2,
                   g << 16 | g << 8 | g, "ramp step " + i);
        }
        for (int y = 0; y < h; y += 7) {
            expect(img, 0, y, 0xFFFFFF, "left border");
            expect(img, w - 1, y, 0xFFFFFF, "right border");
        }
        for (int x = 0; x < w; x += 7) expect(img, x, h - 1, 0xFFFFFF, "bottom border");

        // The 2D primitives card, copied in where there is room: its solid red
        // rectangle and its blue disc.
        if (layout.panelX >= 0) {
            expect(img, layout.panelX + 50, layout.panelY + 22, 0xD02020, "panel rectangle");
            expect(img, layout.panelX + 235, layout.panelY + 40, 0x3060F0, "panel disc");
        }

        // The lower part holds a scene: many colours, and much that is neither
        // the background nor a grid line.
        Set<Integer> colours = new HashSet<>();
        int background = DemoTestCard.BACKGROUND & 0xFFFFFF, drawn = 0, total = 0;
        for (int y = rampBottom; y < h - 1; y++)
            for (int x = 1; x < w - 1; x++) {
                int p = img.getRGB(x, y) & 0xFFFFFF;
                colours.add(p);
                total++;
                if (Math.abs((p & 0xFF) - (background & 0xFF)) > 40) drawn++;
            }
        if (colours.size() < 32) fail("only " + colours.size() + " colours under the test card");
        if (drawn < total / 20) fail("only " + drawn + " of " + total + " pixels under the test card are drawn");

        if (failures > 0) {
            System.out.println("demo png check: " + failures + " failures");
            System.exit(1);
        }
        System.out.println("demo png check: " + file + " " + w + "x" + h + " ok (" + colours.size()
                           + " colours in the scene)");
    }

    private static void expect(BufferedImage img, int x, int y, int rgb, String what) {
        int p = img.getRGB(x, y) & 0xFFFFFF;
        if (p != rgb) {
            failures++;
            if (failures <= 20)
                System.out.printf("%s: pixel (%d, %d) is %06x, expected %06x%n", what, x, y, p, rgb);
        }
    }

    private static void fail(String message) {
        System.out.println("demo png check: " + message);
        System.exit(1);
    }
}
