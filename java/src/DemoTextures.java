/**
 * Procedural textures for the demo: answers the texture cache's requests for
 * missing textures by uploading a checkerboard tinted by the id, and preloads a
 * few at start-up.
 */
final class DemoTextures {
    /** Number of texture ids the demo's cache keeps metrics for. */
    static final int IDS = 64;

    /** Id of the soft round spark texture used by the particle fountain. */
    static final int SPARK = 63;

    /** Uploads the requested texture during the request and reports success. */
    static final ja.TextureSource SOURCE = (tk, id) -> {
        if (id == SPARK) tk.F(id, SpriteCard.sparkTexture(), 0, 2, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0);
        else upload(tk, id);
        return true;
    };


    private DemoTextures() {}

    /** Uploads texture {@code id}: 16-texel squares, wrapping in both directions. */
    static void upload(ja tk, int id) {
        int tint = 0xFF000000 | ((id * 0x9E3779B9) >>> 8 & 0x7F7F7F);
        int[] px = new int[128 * 128];
        for (int v = 0; v < 128; ++v)
            for (int u = 0; u < 128; ++u) px[v * 128 + u] = (((u >> 4) ^ (v >> 4)) & 1) == 0 ? tint | 0x808080 : tint;
        tk.F(id, px, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 1, 1, 0, 0, 0, 0);
    }

    /** Uploads textures 0 to {@code count - 1}. */
    static void preload(ja tk, int count) {
        for (int id = 0; id < count; ++id) upload(tk, id);
    }
}
