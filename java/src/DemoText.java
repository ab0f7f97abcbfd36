/**
 * Text in the three font kinds: a title (mono), a status line (alpha,
 * smoothed), a label running upwards (paletted) and a wave of letters.
 */
final class DemoText implements DemoLayer {
    /** Extra status text shown under the title (the window shows its frame rate here). */
    static volatile String status = "";

    private m mono;
    private ea smooth;
    private ia shaded;
    private DemoFont.Tables monoT, smoothT, shadedT;

    @Override public String name() {
        return "text";
    }

    @Override public void open(DemoScene scene) {
        monoT = DemoFont.mono(2);
        mono = new m();
        mono.n(null, scene.pool, monoT.glyphs, monoT.widths, monoT.heights, monoT.xoffsets, monoT.yoffsets);
        smoothT = DemoFont.alpha(2);
        smooth = new ea();
        smooth.n(null, scene.pool, smoothT.glyphs, smoothT.widths, smoothT.heights, smoothT.xoffsets,
                 smoothT.yoffsets);
        shadedT = DemoFont.paletted(2);
        shaded = new ia();
        shaded.EA(null, scene.pool, shadedT.glyphs, DemoFont.gradient(0xFFFFF080, 0xFFFF4000), shadedT.widths,
                  shadedT.heights, shadedT.xoffsets, shadedT.yoffsets);
    }

    @Override public void close() {
        if (mono != null) mono.ma();
        if (smooth != null) smooth.ma();
        if (shaded != null) shaded.ma();
    }

    @Override public void draw(DemoFrame f) {
        DemoLayout l = f.layout;
        int top = l.rampBottom + 8;
        int x = 10;
        for (char c : "PAVOQEN SSE".toCharArray()) {
            mono.UA(c, x + 2, top + 2, 0x80000000, false);  // shadow, half transparent
            mono.UA(c, x, top, 0xFFFFFFFF, false);
            x += monoT.advance;
        }
        String line = "FRAME " + f.frame + "  " + f.width + "X" + f.height + "  " + status;
        x = 10;
        for (char c : line.toCharArray()) {
            smooth.UA(c, x, top + 22, 0xFF80FF80, false);
            x += smoothT.advance;
        }
        // Label up the right edge, reading bottom to top.
        String label = "SOFTWARE";
        int y = f.height - 30;
        for (char c : label.toCharArray()) {
            shaded.f(c, l.cellsRight - 8 - DemoFont.ROWS * 2, y, 0, false);
            y -= shadedT.advance;
        }
        // A wave of letters along the bottom, two colours (flag true) and the palette.
        String wave = l.cellsRight >= 19 * shadedT.advance + 40 ? "ONE FRAME AT A TIME" : "FRAME BY FRAME";
        x = 10;
        for (int i = 0; i < wave.length(); i++) {
            int dy = (int) Math.round(Math.sin(f.t * 3 + i * 0.5) * 6);
            shaded.UA(wave.charAt(i), x, f.height - DemoLayout.WAVE_H + 2 + dy, i % 2 == 0 ? 0xFF60C0FF : 0xFFFFFFFF, i % 4 < 2);
            x += shadedT.advance;
        }
    }
}
