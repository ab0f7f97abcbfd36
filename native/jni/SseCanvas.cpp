// Entries of the canvas peer (class "za"): a native canvas presenting into a
// java.awt.Canvas, flipped by the rendering thread.
#include <jni.h>

#include "jni/entry.h"
#include "jni/jni_toolkit_callbacks.h"
#include "jni/objconvert.h"
#include "jni/toolkit_access.h"
#include "render/window_canvas.h"

namespace {

window_canvas* bound_canvas(JNIEnv* env, jobject self) {
    // Only window canvases are ever bound to a canvas peer.
    return static_cast<window_canvas*>(objconvert::get_canvas(env, self));
}

}  // namespace

extern "C" {

JNIEXPORT void JNICALL Java_za_n(JNIEnv* env, jobject self, jobject, jobject awtCanvas, jint width, jint height) {
    guarded(env, [&] {
        tk();  // the toolkit must exist
        if (!awtCanvas) throw new NullPointerException();
        JavaVM* vm = toolkit_vm();
        if (!vm && env->GetJavaVM(&vm) != JNI_OK) throw new RuntimeException("no Java VM");
        window_canvas* c = create_window_canvas(vm, awtCanvas, width, height);
        // A peer created twice gives up its first canvas instead of leaking it.
        window_canvas* old;
        try {
            old = bound_canvas(env, self);
            objconvert::set_canvas(env, self, c);
        } catch (...) {
            delete c;
            throw;
        }
        delete old;
    });
}

JNIEXPORT void JNICALL Java_za_H(JNIEnv* env, jobject self, jint x, jint y, jint w, jint h) {
    guarded(env, [&] {
        window_canvas* c = bound_canvas(env, self);
        if (!c) throw new IllegalStateException("canvas destroyed");
        c->flip(x, y, w, h);
    });
}

JNIEXPORT void JNICALL Java_za_CA(JNIEnv* env, jobject self, jint a, jint b, jint c, jint d, jint e, jint f) {
    guarded(env, [&] {
        window_canvas* cv = bound_canvas(env, self);
        if (!cv) throw new IllegalStateException("canvas destroyed");
        cv->flip_dirtyrect(a, b, c, d, e, f);
    });
}

JNIEXPORT void JNICALL Java_za_wa(JNIEnv* env, jobject self, jobject awtCanvas, jint width, jint height) {
    guarded(env, [&] {
        window_canvas* c = bound_canvas(env, self);
        if (!c) throw new IllegalStateException("canvas destroyed");
        c->resized(awtCanvas, width, height);
    });
}

JNIEXPORT void JNICALL Java_za_ma(JNIEnv* env, jobject self) {
    guarded(env, [&] {
        window_canvas* c = bound_canvas(env, self);
        delete c;
        objconvert::set_canvas(env, self, nullptr);
    });
}

}  // extern "C"
