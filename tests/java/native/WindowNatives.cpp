// Natives used only by the window tests and the presentation benchmark (class
// WindowNatives): read back what reached an AWT component's window with
// XGetImage on AWT's own display connection, and look at or write the
// toolkit's current colour buffer behind a product toolkit's native id.
#include <jni.h>

#include <cstdint>

#include "jni/entry.h"
#include "render/toolkit.h"

#if PAVOQEN_AWT
#include <jawt.h>
#include <jawt_md.h>
#include <X11/Xlib.h>
#include <X11/Xutil.h>
#endif

namespace {

toolkit& toolkit_of(jlong id) { return *from_id_checked<toolkit>(id); }

#if PAVOQEN_AWT
// Runs `body(display, drawable)` with the component's drawing surface locked
// (AWT's lock held). Returns false when the surface cannot be had.
template <class F>
bool with_surface(JNIEnv* env, jobject component, F&& body) {
    JAWT awt;
    awt.version = JAWT_VERSION_1_4;
    if (!component || JAWT_GetAWT(env, &awt) == JNI_FALSE) return false;
    JAWT_DrawingSurface* ds = awt.GetDrawingSurface(env, component);
    if (!ds) return false;
    bool done = false;
    if (!(ds->Lock(ds) & JAWT_LOCK_ERROR)) {
        JAWT_DrawingSurfaceInfo* dsi = ds->GetDrawingSurfaceInfo(ds);
        if (dsi) {
            auto* x = static_cast<JAWT_X11DrawingSurfaceInfo*>(dsi->platformInfo);
            body(x->display, x->drawable);
            done = true;
            ds->FreeDrawingSurfaceInfo(dsi);
        }
        ds->Unlock(ds);
    }
    awt.FreeDrawingSurface(ds);
    return done;
}
#endif

}  // namespace

extern "C" {

// Window pixels (x, y, w, h) as 0x00RRGGBB, row by row; null when unreadable.
JNIEXPORT jintArray JNICALL Java_WindowNatives_grab(JNIEnv* env, jclass, jobject component, jint x, jint y,
                                                    jint w, jint h) {
    if (w <= 0 || h <= 0) return nullptr;
    jintArray out = env->NewIntArray(w * h);
    if (!out) return nullptr;
#if PAVOQEN_AWT
    jint* px = new jint[size_t(w) * size_t(h)];
    bool ok = false;
    with_surface(env, component, [&](Display* d, Drawable dr) {
        XSync(d, False);  // everything presented so far has been drawn
        XImage* img = XGetImage(d, dr, x, y, unsigned(w), unsigned(h), AllPlanes, ZPixmap);
        if (!img) return;
        for (int j = 0; j < h; ++j)
            for (int i = 0; i < w; ++i) px[j * w + i] = jint(XGetPixel(img, i, j) & 0xFFFFFF);
        XDestroyImage(img);
        ok = true;
    });
    if (ok) env->SetIntArrayRegion(out, 0, w * h, px);
    delete[] px;
    if (!ok) return nullptr;
#endif
    return out;
}

// True when AWT's X server offers MIT-SHM.
JNIEXPORT jboolean JNICALL Java_WindowNatives_serverHasShm(JNIEnv* env, jclass, jobject component) {
    bool has = false;
#if PAVOQEN_AWT
    with_surface(env, component, [&](Display* d, Drawable) {
        int op, ev, err;
        has = XQueryExtension(d, "MIT-SHM", &op, &ev, &err);
    });
#endif
    return has ? JNI_TRUE : JNI_FALSE;
}

// Waits until the X server has processed every request AWT's connection sent.
JNIEXPORT void JNICALL Java_WindowNatives_sync(JNIEnv* env, jclass, jobject component) {
#if PAVOQEN_AWT
    with_surface(env, component, [&](Display* d, Drawable) { XSync(d, False); });
#endif
}

// Address of the toolkit's current colour buffer.
JNIEXPORT jlong JNICALL Java_WindowNatives_colourBuffer(JNIEnv* env, jclass, jlong tk) {
    return guarded(env, [&] { return jlong(reinterpret_cast<intptr_t>(toolkit_of(tk).m_ColourBuffer)); });
}

// Fills (x, y, w, h) of the toolkit's current colour buffer, cut to its size.
JNIEXPORT void JNICALL Java_WindowNatives_fill(JNIEnv* env, jclass, jlong tk, jint x, jint y, jint w, jint h,
                                               jint colour) {
    guarded(env, [&] {
        toolkit& t = toolkit_of(tk);
        if (!t.m_ColourBuffer) throw new IllegalStateException("no target");
        int x1 = x + w < t.m_Width ? x + w : t.m_Width, y1 = y + h < t.m_Height ? y + h : t.m_Height;
        for (int j = y < 0 ? 0 : y; j < y1; ++j)
            for (int i = x < 0 ? 0 : x; i < x1; ++i) t.m_ColourBuffer[j * t.m_Width + i] = unsigned(colour);
    });
}

// Writes pixel (x, y) = (x << 12) | y over the whole colour buffer, so that
// every pixel names its own position.
JNIEXPORT void JNICALL Java_WindowNatives_coordinates(JNIEnv* env, jclass, jlong tk) {
    guarded(env, [&] {
        toolkit& t = toolkit_of(tk);
        if (!t.m_ColourBuffer) throw new IllegalStateException("no target");
        for (int j = 0; j < t.m_Height; ++j)
            for (int i = 0; i < t.m_Width; ++i)
                t.m_ColourBuffer[j * t.m_Width + i] = (unsigned(i & 0xFFF) << 12) | unsigned(j & 0xFFF);
    });
}

}  // extern "C"
