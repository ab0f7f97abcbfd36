import java.awt.Component;

/**
 * Peer of the native {@code SseCanvas}: a colour and depth buffer pair presented
 * into an AWT component's window through X11. Activate it with {@link ja#PA}.
 */
public class za {
    /** Address of the native canvas; 0 when none. Written by the library only. */
    public long nativeid;

    /**
     * Creates the canvas buffers for a displayable component and binds them.
     *
     * @param unused not read
     * @param awtCanvas the component drawn into
     */
    public native void n(Object unused, Component awtCanvas, int width, int height);

    /** Presents the rectangle (x, y, width, height) of the colour buffer. */
    public native void H(int x, int y, int width, int height);

    /** Obtains and releases the drawing surface; copies nothing. */
    public native void CA(int a, int b, int c, int d, int e, int f);

    /** Rebuilds the buffers for a new size; activate the canvas again afterwards. */
    public native void wa(Component awtCanvas, int width, int height);

    /** Destroys the canvas and clears {@link #nativeid}. */
    public native void ma();
}
