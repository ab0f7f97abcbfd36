/**
 * Peer of the native {@code SseModel}: a 3D model (vertices, faces, colours,
 * texture coordinates, billboards and animation label groups) kept in a memory
 * pool. Drawing, picking and light sharing go through the thread resource
 * ({@link a}), which takes the model's {@link #nativeid}.
 */
public class h {
    /** Address of the native model; 0 when none. Written by the library only. */
    public long nativeid;

    /**
     * Builds a model from Java arrays and binds it to this peer. Arrays marked
     * "may be null" are optional.
     *
     * @param unused not read
     * @param pool memory pool the model's arrays live in
     * @param vcount number of vertices
     * @param ncount number of vertices that get normals
     * @param vx vertex x
     * @param vy vertex y
     * @param vz vertex z
     * @param vlabels vertex animation labels (negative: none); may be null
     * @param vpartmask per-vertex part mask; may be null
     * @param facecount number of faces in the face arrays
     * @param fa face vertex index a
     * @param fb face vertex index b
     * @param fc face vertex index c
     * @param ftype face kinds; may be null
     * @param fparam per-face parameter byte; may be null
     * @param falpha face transparency; may be null
     * @param fmapping texture mapping of each face (-1: default coordinates); may be null
     * @param fhsl face colours, 16-bit HSL
     * @param ftexture face texture ids (-1: none); may be null
     * @param flabels face animation labels, then one per billboard; may be null
     * @param mergeflag merge flag
     * @param fpartmask per-face part mask; may be null
     * @param mappingcount number of texture mappings
     * @param mkind mapping kind (0 planar, 1 cylindrical, 2 cube, 3 spherical)
     * @param mp mapping anchor vertex P
     * @param mm mapping anchor vertex M
     * @param mn mapping anchor vertex N
     * @param mscalex mapping scale x
     * @param mscaley mapping scale y
     * @param mscalez mapping scale z
     * @param mrotation mapping rotation in quarter turns
     * @param mbyte2 second per-mapping byte
     * @param moffset0 first mapping offset (1/256 units)
     * @param moffset1 second mapping offset (1/256 units)
     * @param moffset2 third mapping offset
     * @param pslocations particle-system vertex locations
     * @param emittercount number of emitters
     * @param effectorcount number of effectors
     * @param functionmask function mask ({@code FM_...} bits)
     * @param modelflags model flags
     * @param ambient ambient term
     * @param contrast contrast term
     * @param billboards eight ints per billboard; may be null
     */
    public native void U(int unused, ba pool, int vcount, int ncount, int[] vx, int[] vy, int[] vz, int[] vlabels,
            short[] vpartmask, int facecount, short[] fa, short[] fb, short[] fc, byte[] ftype, byte[] fparam,
            byte[] falpha, byte[] fmapping, short[] fhsl, short[] ftexture, int[] flabels, boolean mergeflag,
            short[] fpartmask, int mappingcount, byte[] mkind, short[] mp, short[] mm, short[] mn, int[] mscalex,
            int[] mscaley, int[] mscalez, byte[] mrotation, byte[] mbyte2, int[] moffset0, int[] moffset1,
            int[] moffset2, int[] pslocations, int emittercount, int effectorcount, int functionmask,
            int modelflags, int ambient, int contrast, int[] billboards);

    /** Binds a new empty model with no pool. @param unused ignored */
    public native void ba(int unused);

    /** Destroys the model and clears {@link #nativeid}. */
    public native void ma();

    /**
     * Copies this model into {@code dst}, owning the arrays the mask lets it change.
     *
     * @param dst the copy's peer
     * @param cache model whose blocks are reused when large enough
     * @param mask function mask of the copy (no bit this model lacks)
     * @param reserveshare reserve room for light sharing
     * @param prepare light and compute normals of the source first
     */
    public native void BA(h dst, h cache, int mask, boolean reserveshare, boolean prepare);

    /** Narrows the function mask (bits cannot be re-enabled). */
    public native void KA(int mask);

    /** @return the function mask */
    public native int m();

    /** @return whether the model has transparent faces */
    public native boolean i();

    /** @return whether the model has scrolling textures */
    public native boolean u();

    /** Sets the ambient term. */
    public native void p(int ambient);

    /** Sets the contrast term. */
    public native void Q(int contrast);

    /** @return the ambient term */
    public native int c();

    /** @return the contrast term */
    public native int Z();

    /** Tints the model (needs {@code FM_TINT}). */
    public native void PA(int a, int b, int c, int d);

    /** Replaces face colour {@code from} with {@code to}. */
    public native void X(short from, short to);

    /** Replaces texture {@code from} with {@code to}. */
    public native void W(short from, short to);

    /** Moves the model. */
    public native void ia(int x, int y, int z);

    /** Scales the model. */
    public native void oa(int x, int y, int z);

    /** Mirrors the model in z. */
    public native void wa();

    /** Rotates about the z axis. @param angle 16384 units per turn */
    public native void EA(int angle);

    /** Rotates about the z axis together with the normals. */
    public native void K(int angle);

    /** Rotates about the x axis. */
    public native void t(int angle);

    /** Rotates about the x axis together with the normals. */
    public native void VA(int angle);

    /** Rotates about the y axis. */
    public native void f(int angle);

    /** Rotates about the y axis together with the normals. */
    public native void S(int angle);

    /**
     * Adapts the model's heights to the terrain.
     *
     * @param ground terrain
     * @param ground2 second terrain; may be null
     */
    public native void pa(int a, int b, i ground, i ground2, int c, int d, int e);

    /** Starts an animation step. @return whether animation may proceed */
    public native boolean ea();

    /**
     * Applies an animation transform to the model given by its native id (no peer look-up).
     *
     * @param model native id of the model
     * @param type transform type
     * @param labels label groups the transform applies to
     */
    public native void J(long model, int type, int[] labels, int a, int b, int c, int d, boolean flag);

    /** Applies a partial animation transform. */
    public native void e(int type, int[] labels, int a, int b, int c, boolean flag, int d, int[] parts);

    /**
     * Matrix partial transform. Exported only under a decorated native symbol, so
     * the JVM never binds this method: calling it raises {@link UnsatisfiedLinkError}.
     */
    public native void aa(long matrix, int mask, boolean flag);

    /** Ends an animation step. */
    public native void ka();

    /** Applies a whole-model animation step before taking a shadow. */
    public native void w(int type, int a, int b, int c);

    /**
     * Gets the model's ground shadow.
     *
     * @param shadow shadow peer to reuse; may be null
     * @return null when none; {@code shadow} when reused; otherwise a new peer from {@link ja#WA}
     */
    public native aa ga(aa shadow);

    /** @return largest vertex x */
    public native int ya();

    /** @return smallest vertex x */
    public native int RA();

    /** @return largest vertex y */
    public native int o();

    /** @return smallest vertex y */
    public native int YA();

    /** @return largest vertex z */
    public native int ha();

    /** @return smallest vertex z */
    public native int AA();

    /** @return bounding sphere radius */
    public native int n();

    /** @return bounding cylinder radius (about the vertical axis) */
    public native int N();

    /** Screen rectangle of the model: always null. @param matrix 16 floats */
    public native float[] LA(float[] matrix);
}
