/**
 * Peer of the native {@code SseGround}: the terrain grid, its tiles, point
 * lights and shadow map. Tiles are drawn through the thread resource
 * ({@link a#v}, {@link a#i}), which takes the ground's {@link #nativeid}.
 * The height queries of the ground are exported only under decorated native
 * symbols and have no Java method here.
 */
public class i {
    /** Address of the native ground; 0 when none. Written by the library only. */
    public long nativeid;

    /**
     * Creates the ground and binds it to this peer.
     *
     * @param unused not read
     * @param pool memory pool holding the ground's arrays
     * @param width cells in x
     * @param length cells in z
     * @param heights vertex heights, int[width+1][length+1]
     * @param normalheights heights used for normals, same shape
     * @param tilesize cell size in world units (a power of two)
     * @param options ground options
     * @param flags ground flags
     */
    public native void G(Object unused, ba pool, int width, int length, int[][] heights, int[][] normalheights,
            int tilesize, int options, int flags);

    /**
     * Builds cell (x, z) from per-corner arrays (three entries per triangle).
     *
     * @param vx x offset within the tile
     * @param vy height offset; may be null
     * @param vz z offset
     * @param vdepth depth value per point
     * @param vcolour 16-bit HSL colour or -1
     * @param vplancolour plan colour or -1; may be null
     * @param vtexture texture id or -1
     * @param vscale texture scale; may be null
     * @param tileoption passed to the tile unchanged
     * @param depthmode non-zero enables depth values
     * @param unused not read
     * @param flag0 tile flag bit 0
     */
    public native void ya(int x, int z, int[] vx, int[] vy, int[] vz, int[] vdepth, int[] vcolour,
            int[] vplancolour, int[] vtexture, int[] vscale, int tileoption, int depthmode, int unused,
            boolean flag0);

    /** Finishes construction after all tiles were added. */
    public native void SA();

    /** Destroys the ground and clears {@link #nativeid}. */
    public native void ma();

    /**
     * Adds a point light to the terrain.
     *
     * @param mask per-tile mask of the light's reach
     */
    public native void A(int id, int x, int y, int z, int radius, int colour, int[] mask);

    /** Removes point light {@code id}. */
    public native void d(int id);

    /** Sets the intensities of the point lights, oldest first. */
    public native void t(float[] intensities);

    /**
     * Shadow of the tile at cell (x, z).
     *
     * @param shadow peer to reuse; may be null
     * @return null when none; {@code shadow} when reused; otherwise a new peer from {@link ja#WA}
     */
    public native aa w(int x, int z, aa shadow);

    /** Adds a shadow to the shadow map at a world position. */
    public native void UA(aa shadow, int x, int y, int z, int unused, boolean flag);

    /** Removes a shadow from the shadow map at a world position. */
    public native void NA(aa shadow, int x, int y, int z, int unused, boolean flag);

    /** Adds a soft shadow value at cell (x, z). */
    public native void LA(int x, int z, int value);
}
