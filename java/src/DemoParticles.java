/**
 * A particle fountain rising from the bottom of the left half: textured sparks
 * (texture {@link DemoTextures#SPARK}, fetched through the cache) and plain
 * discs, thrown along parabolas that loop every two seconds. The projection
 * maps world (x, y, z) onto pixel (x, y) at depth z / 2 + 1/2, so the particle
 * sizes are in pixels.
 */
final class DemoParticles implements DemoLayer {
    private static final int N = 160;
    private final int[] pos = new int[3 * N], colours = new int[N], sizes = new int[N];
    private final short[] textures = new short[N];
    private final double[] phase = new double[N], vx = new double[N], vy = new double[N];
    private a tr;

    @Override public String name() {
        return "particles";
    }

    @Override public void open(DemoScene scene) {
        java.util.Random rng = new java.util.Random(11);
        for (int i = 0; i < N; i++) {
            phase[i] = rng.nextDouble();
            vx[i] = (rng.nextDouble() - 0.5) * 0.35;
            vy[i] = -(0.75 + rng.nextDouble() * 0.25);
            textures[i] = (short) (i % 3 == 2 ? -1 : DemoTextures.SPARK);
        }
        tr = new a();
        tr.ha(0, 0, 0, 0, 0);
    }

    @Override public void close() {
        if (tr != null && tr.nativeid != 0) tr.R(tr.nativeid);
    }

    @Override public void draw(DemoFrame f) {
        int w = f.width, h = f.height;
        DemoLayout l = f.layout;
        double x0 = l.cellsRight / 2.0, y0 = h - DemoLayout.WAVE_H, reach = h - l.rampBottom;
        for (int i = 0; i < N; i++) {
            double t = (f.t / 2 + phase[i]) % 1.0;  // 0 at the nozzle, 1 when it fades
            double x = x0 + vx[i] * reach * t, y = y0 + vy[i] * reach * t * 2 + reach * t * t * 1.3;
            pos[3 * i] = (int) (x * 4096);
            pos[3 * i + 1] = (int) (y * 4096);
            pos[3 * i + 2] = 0;  // whole world units only: every particle at depth 1/2
            int alpha = (int) (255 * (1 - t));
            colours[i] = alpha << 24 | (textures[i] >= 0 ? 0xFFD080 : 0x60C0FF);
            sizes[i] = (int) ((textures[i] >= 0 ? 18 - 10 * t : 6 - 3 * t) * 2048);
        }
        f.tk.GA(0f, 1f);
        f.tk.wa(new float[] {2f / w, 0, 0, 0, 0, 2f / h, 0, 0, 0, 0, 1, 0, -1, -1, 0, 1});
        f.tk.AA(new float[] {1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1});
        f.tk.ba(2, 0);  // particles are depth-tested: start from a cleared depth buffer
        tr.b(tr.nativeid, 0, pos, colours, sizes, textures, N);
    }
}
