// Entries of the paletted font peer (class "ia").
#include <jni.h>

#include "jni/entry.h"
#include "jni/font_jni.h"
#include "jni/objconvert.h"
#include "text/font_paletted.h"

extern "C" {

JNIEXPORT void JNICALL Java_ia_EA(JNIEnv* env, jobject self, jobject, jobject pool, jobjectArray glyphs, jintArray palette,
                                 jintArray widths, jintArray heights, jintArray xoffsets, jintArray yoffsets) {
    guarded(env, [&] {
        std::unique_ptr<font_paletted> font = font_jni::build<font_paletted>(env, pool, glyphs, widths, heights, xoffsets, yoffsets);
        {
            copied_jintArrayRO p(env, palette);
            font->m_Palette = toSharedarray<unsigned int>(p, font->m_Pool);
        }
        font_paletted* old = objconvert::get_font_paletted(env, self);
        objconvert::set_font_paletted(env, self, font.get());
        font.release();
        delete old;
    });
}

JNIEXPORT void JNICALL Java_ia_UA(JNIEnv* env, jobject self, jint glyph, jint x, jint y, jint colour, jboolean flag) {
    guarded(env, [&] {
        font_paletted* font = objconvert::get_font_paletted(env, self);
        if (!font) throw new NullPointerException();
        font->plotletter(font_jni::glyph_index(glyph), x, y, unsigned(colour), jtrue(flag));
    });
}

JNIEXPORT void JNICALL Java_ia_GA(JNIEnv* env, jobject self, jint glyph, jint x, jint y, jint colour, jboolean flag,
                                 jobject mask, jint maskx, jint masky) {
    guarded(env, [&] {
        font_paletted* font = objconvert::get_font_paletted(env, self);
        if (!font) throw new NullPointerException();
        clippingmask* m = font_jni::optional_mask(env, mask);
        font->plotletter(font_jni::glyph_index(glyph), x, y, unsigned(colour), jtrue(flag), m, maskx, masky);
    });
}

JNIEXPORT void JNICALL Java_ia_f(JNIEnv* env, jobject self, jint glyph, jint x, jint y, jint colour, jboolean flag) {
    guarded(env, [&] {
        font_paletted* font = objconvert::get_font_paletted(env, self);
        if (!font) throw new NullPointerException();
        font->plotletter_upwards(font_jni::glyph_index(glyph), x, y, unsigned(colour), jtrue(flag));
    });
}

JNIEXPORT void JNICALL Java_ia_ma(JNIEnv* env, jobject self) {
    guarded(env, [&] {
        font_paletted* font = objconvert::get_font_paletted(env, self);
        objconvert::set_font_paletted(env, self, nullptr);
        delete font;
    });
}

}  // extern "C"
