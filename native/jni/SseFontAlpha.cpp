// Entries of the anti-aliased font peer (class "ea").
#include <jni.h>

#include "jni/entry.h"
#include "jni/font_jni.h"
#include "jni/objconvert.h"
#include "text/font_alpha.h"

extern "C" {

JNIEXPORT void JNICALL Java_ea_n(JNIEnv* env, jobject self, jobject, jobject pool, jobjectArray glyphs,
                                 jintArray widths, jintArray heights, jintArray xoffsets, jintArray yoffsets) {
    guarded(env, [&] {
        std::unique_ptr<font_alpha> font = font_jni::build<font_alpha>(env, pool, glyphs, widths, heights, xoffsets, yoffsets);
        font_alpha* old = objconvert::get_font_alpha(env, self);
        objconvert::set_font_alpha(env, self, font.get());
        font.release();
        delete old;
    });
}

JNIEXPORT void JNICALL Java_ea_UA(JNIEnv* env, jobject self, jint glyph, jint x, jint y, jint colour, jboolean flag) {
    guarded(env, [&] {
        font_alpha* font = objconvert::get_font_alpha(env, self);
        if (!font) throw new NullPointerException();
        font->plotletter(font_jni::glyph_index(glyph), x, y, unsigned(colour), jtrue(flag));
    });
}

JNIEXPORT void JNICALL Java_ea_P(JNIEnv* env, jobject self, jint glyph, jint x, jint y, jint colour, jboolean flag,
                                 jobject mask, jint maskx, jint masky) {
    guarded(env, [&] {
        font_alpha* font = objconvert::get_font_alpha(env, self);
        if (!font) throw new NullPointerException();
        clippingmask* m = font_jni::optional_mask(env, mask);
        font->plotletter(font_jni::glyph_index(glyph), x, y, unsigned(colour), jtrue(flag), m, maskx, masky);
    });
}

JNIEXPORT void JNICALL Java_ea_f(JNIEnv* env, jobject self, jint glyph, jint x, jint y, jint colour, jboolean flag) {
    guarded(env, [&] {
        font_alpha* font = objconvert::get_font_alpha(env, self);
        if (!font) throw new NullPointerException();
        font->plotletter_upwards(font_jni::glyph_index(glyph), x, y, unsigned(colour), jtrue(flag));
    });
}

JNIEXPORT void JNICALL Java_ea_ma(JNIEnv* env, jobject self) {
    guarded(env, [&] {
        font_alpha* font = objconvert::get_font_alpha(env, self);
        objconvert::set_font_alpha(env, self, nullptr);
        delete font;
    });
}

}  // extern "C"
