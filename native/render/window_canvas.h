// A canvas that presents into the window of a Java AWT component. The
// platform file provides it: JAWT + Xlib/MIT-SHM on desktop builds
// (canvas_x11.cpp), plain heap buffers that present nowhere on builds without
// a window system (canvas_headless.cpp).
#pragma once

#include "render/canvas.h"

// The JNI handle types, declared as jni.h declares them so that this header
// needs no JNI include.
struct JavaVM_;
typedef JavaVM_ JavaVM;
class _jobject;
typedef _jobject* jobject;

class window_canvas : public canvas {
public:
    // Copies the buffer rectangle (x, y, w, h) into the component's window at
    // its top-left corner. A missing AWT interface, drawing surface or surface
    // info makes it a no-op.
    virtual void flip(int x, int y, int w, int h) = 0;
    // Obtains and releases the drawing surface as flip does, presents nothing.
    virtual void flip_dirtyrect(int a, int b, int c, int d, int e, int f) = 0;
    // Rebuilds both buffers at the new size for `awtCanvas`. The toolkit must
    // activate the canvas again before drawing into it.
    virtual void resized(jobject awtCanvas, int width, int height) = 0;
    // True when the colour buffer alternates between two shared-memory images.
    virtual bool shared_memory() const = 0;
};

// Builds the canvas for `awtCanvas` (a displayable java.awt.Canvas). Throws
// IllegalArgumentException for a bad size and RuntimeException when no
// presentable buffer can be made; nothing is left allocated then.
window_canvas* create_window_canvas(JavaVM* vm, jobject awtCanvas, int width, int height);
