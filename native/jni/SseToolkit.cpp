// Entries of the toolkit peer (class "ja"): creation, state and queries.
// The 2D drawing, read-back and texture entries live beside their subsystems
// (SseToolkit2D.cpp, SseToolkitTextures.cpp, ...).
#include <jni.h>

#include "jni/entry.h"
#include "jni/jni_toolkit_callbacks.h"
#include "jni/jniarray.h"
#include "jni/objconvert.h"
#include "jni/toolkit_access.h"
#include "render/toolkit.h"

extern "C" {

JNIEXPORT void JNICALL Java_ja_q(JNIEnv* env, jobject self, jobject texturesource, jint texturearg) {
    guarded(env, [&] {
        auto* callbacks = new jni_toolkit_callbacks(env, self);
        toolkit* tk;
        try {
            tk = toolkit::create(callbacks, texturesource != nullptr, texturearg);
        } catch (...) {
            delete callbacks;
            throw;
        }
        objconvert::set_toolkit(env, self, tk);
        toolkit::m_pInstance = tk;
    });
}

JNIEXPORT void JNICALL Java_ja_ma(JNIEnv* env, jobject self) {
    guarded(env, [&] {
        toolkit* tk = objconvert::get_toolkit(env, self);
        if (tk) {
            if (toolkit::m_pInstance == tk) toolkit::m_pInstance = nullptr;
            toolkit::destroy(tk);
        }
        objconvert::set_toolkit(env, self, nullptr);
    });
}

JNIEXPORT void JNICALL Java_ja_k(JNIEnv* env, jobject) {
    guarded(env, [&] { tk().resetviewport(); });
}

JNIEXPORT void JNICALL Java_ja_A(JNIEnv* env, jobject, jint x, jint y, jint w, jint h) {
    guarded(env, [&] {
        tk();
        Rasterizer_n::Viewport_s vp = *Rasterizer_n::GetViewport();
        vp.X = x;
        vp.Y = y;
        vp.Width = w;
        vp.Height = h;
        Rasterizer_n::SetViewport(vp);
    });
}

JNIEXPORT void JNICALL Java_ja_GA(JNIEnv* env, jobject, jfloat minz, jfloat maxz) {
    guarded(env, [&] {
        tk();
        Rasterizer_n::Viewport_s vp = *Rasterizer_n::GetViewport();
        vp.MinZ = minz;
        vp.MaxZ = maxz;
        Rasterizer_n::SetViewport(vp);
    });
}

JNIEXPORT void JNICALL Java_ja_xa(JNIEnv* env, jobject, jintArray out) {
    guarded(env, [&] {
        pinnedjniarray<int, jintArray, false> o(env, out);
        o.need(4);
        const Rasterizer_n::Viewport_s& vp = *Rasterizer_n::GetViewport();
        o[0] = vp.X;
        o[1] = vp.Y;
        o[2] = vp.Width;
        o[3] = vp.Height;
    });
}

JNIEXPORT void JNICALL Java_ja_AA(JNIEnv* env, jobject, jfloatArray m) {
    guarded(env, [&] {
        toolkit& t = tk();
        pinnedjniarray<float, jfloatArray, true> a(env, m);
        a.need(16);
        t.set_camera(Matrix_c(a.data()));
    });
}

JNIEXPORT void JNICALL Java_ja_wa(JNIEnv* env, jobject, jfloatArray m) {
    guarded(env, [&] {
        toolkit& t = tk();
        pinnedjniarray<float, jfloatArray, true> a(env, m);
        a.need(16);
        t.set_projection(Matrix_c(a.data()));
    });
}

JNIEXPORT void JNICALL Java_ja_c(JNIEnv* env, jobject, jint colour, jint distance) {
    guarded(env, [&] { tk().set_fog(unsigned(colour), distance); });
}

JNIEXPORT void JNICALL Java_ja_M(JNIEnv* env, jobject, jint start, jint colour, jint depth, jint fourth) {
    guarded(env, [&] { tk().underwatermode_enable(start, unsigned(colour), depth, fourth); });
}

JNIEXPORT void JNICALL Java_ja_JA(JNIEnv* env, jobject, jint start, jint colour, jint depth, jint fourth) {
    guarded(env, [&] { tk().underwatermode_adjust(start, unsigned(colour), depth, fourth); });
}

JNIEXPORT void JNICALL Java_ja_O(JNIEnv* env, jobject) {
    guarded(env, [&] { tk().underwatermode_disable(); });
}

JNIEXPORT void JNICALL Java_ja_RA(JNIEnv* env, jobject, jboolean on) {
    guarded(env, [&] { tk().set_zwrite(on != 0); });
}

JNIEXPORT void JNICALL Java_ja_m(JNIEnv* env, jobject, jint colour, jfloat front, jfloat back, jfloat x, jfloat y,
                                 jfloat z) {
    guarded(env, [&] { tk().set_globalsun(colour, front, back, x, y, z); });
}

JNIEXPORT void JNICALL Java_ja_IA(JNIEnv* env, jobject, jfloat ambient) {
    guarded(env, [&] { tk().set_globalambient(ambient); });
}

JNIEXPORT void JNICALL Java_ja_Q(JNIEnv* env, jobject, jint count, jintArray lights, jfloatArray intensities) {
    guarded(env, [&] {
        toolkit& t = tk();
        pinnedjniarray<int, jintArray, true> l(env, lights, defer_pin);
        pinnedjniarray<float, jfloatArray, true> f(env, intensities, defer_pin);
        int n = count > 4 ? 4 : count;
        if (n > 0) {
            l.need(5LL * n);
            f.need(n);
        }
        pin_all(l, f);
        t.set_pointlights(count, l.data(), f.data());
    });
}

JNIEXPORT void JNICALL Java_ja_J(JNIEnv* env, jobject, jint n) {
    guarded(env, [&] { tk().set_shadow_resolution(n); });
}

JNIEXPORT void JNICALL Java_ja_r(JNIEnv* env, jobject, jint l, jint t, jint r, jint b) {
    guarded(env, [&] { tk().setclipping(l, t, r, b); });
}

JNIEXPORT void JNICALL Java_ja_o(JNIEnv* env, jobject, jint l, jint t, jint r, jint b) {
    guarded(env, [&] { tk().setsubclipping(l, t, r, b); });
}

JNIEXPORT void JNICALL Java_ja_L(JNIEnv* env, jobject) {
    guarded(env, [&] { tk().resetclipping(); });
}

JNIEXPORT void JNICALL Java_ja_qa(JNIEnv* env, jobject, jintArray out) {
    guarded(env, [&] {
        toolkit& t = tk();
        pinnedjniarray<int, jintArray, false> o(env, out);
        o.need(4);
        t.getclipping(o.data());
    });
}

JNIEXPORT void JNICALL Java_ja_Y(JNIEnv* env, jobject, jint ms) {
    guarded(env, [&] { tk().service(ms); });
}

JNIEXPORT void JNICALL Java_ja_da(JNIEnv* env, jobject) {
    guarded(env, [&] { tk().quit(); });
}

JNIEXPORT void JNICALL Java_ja_VA(JNIEnv* env, jobject, jint dx, jint dy) {
    guarded(env, [&] { tk().scroll(dx, dy); });
}

JNIEXPORT jint JNICALL Java_ja_j(JNIEnv*, jobject) { return 0; }

JNIEXPORT void JNICALL Java_ja_N(JNIEnv*, jobject) {}

}  // extern "C"
