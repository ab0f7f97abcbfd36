/**
 * Peer of the native {@code SseThreadedResource}: the scratch state of one
 * drawing thread. Every thread that draws uses its own. All drawing entries take
 * the resource's own {@link #nativeid} as {@code tr}, and models and grounds as
 * their native ids.
 */
public class a {
    /** Address of the native thread resource; 0 when none. Written by the library only. */
    public long nativeid;

    /** Creates the thread resource and binds it. @param unused0 not read @param unused1 not read @param unused2 not read */
    public native void ha(int unused0, int unused1, int unused2, int first, int second);

    /** Destroys the thread resource and clears {@link #nativeid}. */
    public native void R(long tr);

    /** Links the thread (does nothing). */
    public native void JA(long tr);

    /** Unlinks the thread (does nothing). */
    public native void UA(long tr);

    /** Draws a thick line as two triangles. @param unused not read */
    public native void K(long tr, int unused, int x1, int y1, int x2, int y2, int colour, int thickness, int mode);

    /** Draws a Gouraud-shaded triangle in screen coordinates. @param tr not read */
    public native void ra(long tr, int x1, int y1, int x2, int y2, int x3, int y3, int colour1, int colour2,
            int colour3);

    /**
     * Shares vertex normals between two models placed at an offset.
     *
     * @param model native id of the model (not 0)
     * @param other native id of the other model (not 0)
     * @return no information
     */
    public native int P(long tr, long model, long other, int x, int y, int z, boolean flag);

    /**
     * Draws a model.
     *
     * @param model native id of the model
     * @param matrix 16 floats, model to view
     * @param out read and written by the drawing
     */
    public native void wa(long tr, long model, float[] matrix, int[] out);

    /** @return whether the model covers pixel (x, y) */
    public native boolean ya(long tr, long model, float[] matrix, int x, int y, boolean flag);

    /** Writes the screen locations of the model's particle points into out from offset. */
    public native void J(long tr, long model, float[] matrix, int[] out, int offset);

    /** Draws the terrain tile at cell (x, z). @param ground native id of the ground */
    public native void v(long tr, long ground, int x, int z);

    /**
     * Draws the plan (map) view of cells (x0..x1-1, z0..z1-1).
     *
     * @param ground native id of the ground
     * @param visible visible[x - x0][z - z0] selects the cells drawn
     */
    public native void i(long tr, long ground, int sx, int sy, int scale, int x0, int z0, int x1, int z1,
            boolean[][] visible);

    /**
     * Draws particles into the current targets.
     *
     * @param unused not read
     * @param count number of particles
     */
    public native void b(long tr, int unused, int[] positions, int[] colours, int[] sizes, short[] textures,
            int count);
}
