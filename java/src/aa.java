/**
 * Peer of the native {@code SseShadow}: a model's or tile's shadow mask, added
 * to or removed from a ground's shadow map ({@link i#UA}, {@link i#NA}). New
 * peers are made by the toolkit's {@link ja#WA} callback and bound by the library.
 */
public class aa {
    /** Address of the native shadow; 0 when none. Written by the library only. */
    public long nativeid;

    /** Destroys the bound shadow (if any) and clears {@link #nativeid}. */
    public native void ma();
}
