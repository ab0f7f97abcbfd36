/**
 * Peer of the native {@code SseMemoryPool}: a relocatable, compacting memory
 * pool holding the bulk arrays of models, grounds, fonts and masks. When it runs
 * out of space it first asks Java to collect garbage ({@link ja#h}).
 */
public class ba {
    /** Address of the native pool; 0 when none. Written by the library only. */
    public long nativeid;

    /** Creates the pool and binds it. @param unused not read @param capacity capacity in bytes */
    public native void sa(int unused, int capacity);

    /** Destroys the pool if bound and clears {@link #nativeid}. */
    public native void ma();

    /** Releases the pool's buffer; its blocks become invalid. */
    public native void ha();

    /** Does nothing. */
    public native void u();
}
