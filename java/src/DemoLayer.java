/**
 * One part of the demo scene. A layer creates its native objects in
 * {@link #open}, draws into the toolkit's current target in {@link #draw} once
 * per frame, and frees them in {@link #close}. To add a feature to the demo,
 * write a layer and list it in {@link DemoScene#DemoScene}.
 *
 * A layer whose natives are not in the library yet (a feature still being
 * built) fails with {@link UnsatisfiedLinkError}; the scene then reports it
 * once and leaves the layer out.
 */
interface DemoLayer {
    /** Short name for the report. */
    String name();

    /** Creates the layer's native objects (the toolkit and pool exist). */
    default void open(DemoScene scene) {}

    /** Draws frame {@code f.frame} of the scene into the current target. */
    void draw(DemoFrame f);

    /** Frees what {@link #open} created. */
    default void close() {}
}
