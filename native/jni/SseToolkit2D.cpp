// Entries of the toolkit peer (class "ja") for the 2D primitives: rectangles,
// lines, circles, masked clears and lines, and the frame clear.
#include <jni.h>

#include "jni/entry.h"
#include "jni/objconvert.h"
#include "jni/toolkit_access.h"
#include "render/toolkit.h"
#include "text/clippingmask.h"

namespace {

// The mask of a 2D call; an unbound or null peer has no mask to draw through.
clippingmask& mask_of(JNIEnv* env, jobject peer) {
    clippingmask* m = objconvert::get_clippingmask(env, peer);
    if (!m) throw new NullPointerException();
    return *m;
}

}  // namespace

extern "C" {

JNIEXPORT void JNICALL Java_ja_B(JNIEnv* env, jobject, jint x, jint y, jint w, jint h, jint colour, jint mode) {
    guarded(env, [&] { tk().rect_fill(x, y, w, h, unsigned(colour), unsigned(mode)); });
}

JNIEXPORT void JNICALL Java_ja_XA(JNIEnv* env, jobject, jint x, jint y, jint length, jint colour, jint mode) {
    guarded(env, [&] { tk().line_h(x, y, length, unsigned(colour), unsigned(mode)); });
}

JNIEXPORT void JNICALL Java_ja_G(JNIEnv* env, jobject, jint x, jint y, jint length, jint colour, jint mode) {
    guarded(env, [&] { tk().line_v(x, y, length, unsigned(colour), unsigned(mode)); });
}

JNIEXPORT void JNICALL Java_ja_YA(JNIEnv* env, jobject, jint x1, jint y1, jint x2, jint y2, jint colour, jint mode) {
    guarded(env, [&] { tk().line(x1, y1, x2, y2, unsigned(colour), unsigned(mode)); });
}

JNIEXPORT void JNICALL Java_ja_CA(JNIEnv* env, jobject, jint cx, jint cy, jint radius, jint colour, jint mode) {
    guarded(env, [&] { tk().circle_fill(cx, cy, 0.0f, radius, unsigned(colour), unsigned(mode)); });
}

JNIEXPORT void JNICALL Java_ja_b(JNIEnv* env, jobject, jint cx, jint cy, jint radius, jint colour, jint mode) {
    guarded(env, [&] { tk().circle_outline(cx, cy, 0, radius, unsigned(colour), unsigned(mode)); });
}

JNIEXPORT void JNICALL Java_ja_DA(JNIEnv* env, jobject, jint colour, jobject mask, jint maskx, jint masky) {
    guarded(env, [&] {
        toolkit& t = tk();
        t.cls_masked(unsigned(colour), mask_of(env, mask), maskx, masky);
    });
}

JNIEXPORT void JNICALL Java_ja_R(JNIEnv* env, jobject, jint x1, jint y1, jint x2, jint y2, jint colour, jint mode,
                                 jobject mask, jint maskx, jint masky) {
    guarded(env, [&] {
        toolkit& t = tk();
        t.line(x1, y1, x2, y2, unsigned(colour), unsigned(mode), mask_of(env, mask), maskx, masky);
    });
}

// bit 0: clear the colour buffer's clip rectangle to colour; bit 1: clear
// the depth buffer's clip rectangle to the far value.
JNIEXPORT void JNICALL Java_ja_ba(JNIEnv* env, jobject, jint flags, jint colour) {
    guarded(env, [&] {
        toolkit& t = tk();
        if (flags & 1) t.cls(unsigned(colour));
        if (flags & 2) t.zbuffer_clear(0, 0, t.m_Width, t.m_Height, 3.4e38f);
    });
}

}  // extern "C"
