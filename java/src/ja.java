import java.util.function.Supplier;

/**
 * Peer of the native {@code SseToolkit}: the single render context. It holds the
 * current render target, clipping rectangle, camera, projection, fog, lights,
 * shadow resolution and the texture cache. Create it first ({@link #q}) and
 * destroy it last ({@link #ma}); every other peer lives in between.
 *
 * <p>The library calls back into three Java methods of this class: {@link #SA}
 * (a texture is missing), {@link #h} (a memory pool is short of space) and
 * {@link #WA} (a new shadow peer is needed). Their behaviour is replaceable
 * through {@link #setTextureSource}, {@link #setGarbageCollector} and
 * {@link #setShadowFactory}.
 */
public class ja {
    /** Address of the native toolkit; 0 when none. Written by the library only. */
    public long nativeid;

    /** Supplies textures that the texture cache does not hold. */
    public interface TextureSource {
        /**
         * Called from a drawing call when texture {@code id} is not resident.
         * Upload it with {@link ja#F} during this call and return true, or
         * return false when it cannot be supplied.
         *
         * @param toolkit the toolkit asking
         * @param id texture id, 0 to 65534
         * @return true only if the texture was uploaded during the call
         */
        boolean requestTexture(ja toolkit, int id);
    }

    private volatile TextureSource textureSource;
    private volatile Runnable garbageCollector = System::gc;
    private volatile Supplier<? extends aa> shadowFactory = aa::new;

    /** A toolkit peer with no texture source; nothing native exists until {@link #q}. */
    public ja() {}

    /** @param source texture source answering {@link #SA}; may be null */
    public ja(TextureSource source) {
        this.textureSource = source;
    }

    /** Replaces the texture source that answers {@link #SA} (null: every request fails). */
    public void setTextureSource(TextureSource source) {
        this.textureSource = source;
    }

    /** @return the texture source that answers {@link #SA}, or null */
    public TextureSource getTextureSource() {
        return textureSource;
    }

    /** Replaces the garbage-collection hook run by {@link #h} (default {@code System::gc}; null: nothing). */
    public void setGarbageCollector(Runnable collector) {
        this.garbageCollector = collector;
    }

    /** Replaces the factory of new shadow peers used by {@link #WA} (default {@code aa::new}). */
    public void setShadowFactory(Supplier<? extends aa> factory) {
        this.shadowFactory = factory;
    }

    // ---- callbacks made by the library -------------------------------------------------

    /**
     * Callback "SA" {@code (S)Z}: the texture cache asks for texture {@code id}.
     *
     * @param id texture id (the unsigned 16-bit id as a Java short)
     * @return true only when the texture was uploaded through {@link #F} during the call
     */
    public boolean SA(short id) {
        TextureSource s = textureSource;
        return s != null && s.requestTexture(this, id & 0xffff);
    }

    /** Callback "h" {@code ()V}: a memory pool found no space; collect garbage so peers release blocks. */
    public void h() {
        Runnable r = garbageCollector;
        if (r != null) r.run();
    }

    /**
     * Callback "WA" {@code ()Ljava/lang/Object;}: a model or ground returns a new
     * shadow, which the library binds to the peer returned here.
     *
     * @return a new, unbound shadow peer ({@link aa}), or null
     */
    public Object WA() {
        Supplier<? extends aa> f = shadowFactory;
        return f == null ? null : f.get();
    }

    // ---- creation and state ---------------------------------------------------------------

    /**
     * Creates the native toolkit and binds it to this peer. Initialises the
     * trigonometric tables and the colour palette; creates the texture cache when
     * a texture source is given.
     *
     * @param texturesource any non-null object enables the texture cache (usually the
     *        {@link TextureSource}); null: no texture cache
     * @param texturearg number of texture ids the cache keeps metrics for
     */
    public native void q(Object texturesource, int texturearg);

    /** Destroys the native toolkit and clears {@link #nativeid}. */
    public native void ma();

    /** Selects the memory pool the toolkit uses. @param pool bound memory pool peer */
    public native void n(ba pool);

    /** Makes the canvas the render target and clears its colour and depth buffers. @param canvas bound canvas peer */
    public native void PA(za canvas);

    /**
     * Renders into an offscreen pair instead of a canvas; either may be 0.
     *
     * @param sprite native id of the colour target ({@link fa#nativeid})
     * @param depthbuffer native id of the depth target ({@link oa#nativeid})
     */
    public native void d(long sprite, long depthbuffer);

    /** Resets the viewport to the whole target, keeping its depth range. */
    public native void k();

    /** Sets the viewport rectangle, keeping its depth range. */
    public native void A(int x, int y, int width, int height);

    /** Sets the viewport depth range, keeping its rectangle. */
    public native void GA(float minz, float maxz);

    /** Reads the viewport rectangle. @param out receives x, y, width, height (at least 4 elements) */
    public native void xa(int[] out);

    /** Sets the camera (view) matrix. @param m 16 floats, row by row, row-vector convention */
    public native void AA(float[] m);

    /** Sets the projection matrix. @param m 16 floats, row by row, row-vector convention */
    public native void wa(float[] m);

    /** Sets the distance fog. @param colour fog colour 0xAARRGGBB @param distance fog start measured from the far plane (negative: 0) */
    public native void c(int colour, int distance);

    /** Enables underwater height fog. @param start fog start height @param colour fog colour @param depth fog depth @param unused not read */
    public native void M(int start, int colour, int depth, int unused);

    /** Adjusts the underwater height fog without saving the fog colour. @param unused not read */
    public native void JA(int start, int colour, int depth, int unused);

    /** Disables underwater mode and restores the saved fog colour. */
    public native void O();

    /** Enables or disables depth writes. */
    public native void RA(boolean zwrite);

    /**
     * Sets the global sun.
     *
     * @param colour 0x00RRGGBB
     * @param front multiplier where a surface faces the sun
     * @param back multiplier where it faces away
     * @param x direction x (normalised by the library)
     * @param y direction y
     * @param z direction z
     */
    public native void m(int colour, float front, float back, float x, float y, float z);

    /** Sets the global ambient term. */
    public native void IA(float ambient);

    /**
     * Sets up to four point lights.
     *
     * @param count number of lights (more than 4 count as 4)
     * @param lights five ints per light: x, y, z, radius, colour
     * @param intensities one intensity per light (clamped to 1.0)
     */
    public native void Q(int count, int[] lights, float[] intensities);

    /** Sets the shadow resolution (rounded down to a power of two). */
    public native void J(int resolution);

    /** Sets the clipping rectangle (right and bottom exclusive), clamped to the target. */
    public native void r(int left, int top, int right, int bottom);

    /** Intersects the clipping rectangle with the given one. */
    public native void o(int left, int top, int right, int bottom);

    /** Resets the clipping rectangle to the whole target. */
    public native void L();

    /** Reads the clipping rectangle. @param out receives left, top, right, bottom (at least 4 elements) */
    public native void qa(int[] out);

    /** Clears the target. @param flags bit 0: colour buffer to {@code colour}; bit 1: depth buffer to 3.4e38 */
    public native void ba(int flags, int colour);

    /** Advances scrolling textures. @param ms time in milliseconds */
    public native void Y(int ms);

    /** Marks the toolkit as quitting. */
    public native void da();

    /** Scrolls the colour and depth buffers by dy rows and dx pixels (linear, rows wrap). */
    public native void VA(int dx, int dy);

    /** @return bytes currently allocated in memory pool blocks */
    public native int za();

    /** @return models created since the last call (the counter is reset) */
    public native int oa();

    /** @return always 0 */
    public native int j();

    /** Does nothing. */
    public native void N();

    // ---- 2D primitives ---------------------------------------------------------------------

    /**
     * Reads a rectangle of the colour buffer (no clipping).
     *
     * @return a new array of width × height pixels, row by row; null on failure
     */
    public native int[] E(int x, int y, int width, int height);

    /**
     * Writes a rectangle of the colour buffer (no clipping): pixel (x+i, y+j) =
     * pixels[offset + j·stride + i].
     */
    public native void BA(int x, int y, int width, int height, int[] pixels, int offset, int stride);

    /** Draws a line, both end points included. @param mode blend mode */
    public native void YA(int x1, int y1, int x2, int y2, int colour, int mode);

    /** Draws a line confined by a clipping mask placed at (maskx, masky). */
    public native void R(int x1, int y1, int x2, int y2, int colour, int mode, wa mask, int maskx, int masky);

    /** Draws a horizontal line of {@code length} pixels. */
    public native void XA(int x, int y, int length, int colour, int mode);

    /** Draws a vertical line of {@code length} pixels. */
    public native void G(int x, int y, int length, int colour, int mode);

    /** Fills a rectangle. */
    public native void B(int x, int y, int width, int height, int colour, int mode);

    /** Fills a circle. */
    public native void CA(int cx, int cy, int radius, int colour, int mode);

    /** Circle outline: draws nothing. */
    public native void b(int cx, int cy, int radius, int colour, int mode);

    /** Fills every pixel covered by the clipping mask placed at (maskx, masky) and inside the clipping rectangle. */
    public native void DA(int colour, wa mask, int maskx, int masky);

    // ---- textures ----------------------------------------------------------------------------

    /**
     * Uploads a texture into the cache (a blurred copy is stored) together with its metrics.
     * Boolean metrics count as true when non-zero; the others are narrowed to their width.
     *
     * @param id texture id (low 16 bits)
     * @param pixels 128 × 128 ARGB pixels, row by row
     */
    public native void F(int id, int[] pixels, int averagehsl, int transparency, int materialkind, int field4,
            int field5, int field6, int greyblend, int brightness, int scrollu, int scrollv, int omitted,
            int dropfaces, int field13, int wrapu, int wrapv, int field16, int field17, int field18, int field19);

    /**
     * Stores the metrics of a texture id without uploading texels (same 19 values as {@link #F}).
     *
     * @param id texture id (low 16 bits)
     */
    public native void V(int id, int averagehsl, int transparency, int materialkind, int field4, int field5,
            int field6, int greyblend, int brightness, int scrollu, int scrollv, int omitted, int dropfaces,
            int field13, int wrapu, int wrapv, int field16, int field17, int field18, int field19);
}
