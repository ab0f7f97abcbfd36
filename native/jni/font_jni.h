// Shared parts of the three font peers' entries: building a font from the
// Java arrays, and resolving the optional mask of a masked plot.
#pragma once

#include <jni.h>

#include <memory>

#include "jni/jniarray.h"
#include "jni/objconvert.h"
#include "jni/sharedarray_jni.h"
#include "text/font_base.h"

namespace font_jni {

// Copies the metric arrays into the pool, then one bitmap per element of
// `glyphs` (a null element is an empty glyph, a null array no glyphs), and
// checks every bitmap against its width x height. Nothing is bound yet.
template <class F>
std::unique_ptr<F> build(JNIEnv* env, jobject poolpeer, jobjectArray glyphs, jintArray widths, jintArray heights,
                         jintArray xoffsets, jintArray yoffsets) {
    memorymanager* pool = objconvert::get_memorypool(env, poolpeer);
    if (!pool) throw new NullPointerException();
    const jsize n = glyphs ? env->GetArrayLength(glyphs) : 0;
    std::unique_ptr<F> font(new F(pool, unsigned(n)));
    {
        copied_jintArrayRO w(env, widths);
        font->m_Widths = toSharedarray<int>(w, pool);
    }
    {
        copied_jintArrayRO h(env, heights);
        font->m_Heights = toSharedarray<int>(h, pool);
    }
    {
        copied_jintArrayRO x(env, xoffsets);
        font->m_XOffsets = toSharedarray<int>(x, pool);
    }
    {
        copied_jintArrayRO y(env, yoffsets);
        font->m_YOffsets = toSharedarray<int>(y, pool);
    }
    for (jsize i = 0; i < n; ++i) {
        jbyteArray element = static_cast<jbyteArray>(env->GetObjectArrayElement(glyphs, i));
        if (!element) continue;
        try {
            copiedjniarray<signed char, jbyteArray, true> bytes(env, element);
            font->set_glyph(int(i), reinterpret_cast<const unsigned char*>(bytes.data()), bytes.length);
        } catch (...) {
            env->DeleteLocalRef(element);
            throw;
        }
        env->DeleteLocalRef(element);
    }
    font->validate();
    return font;
}

// The mask of a masked plot: none for a null or unbound peer.
inline clippingmask* optional_mask(JNIEnv* env, jobject peer) {
    return peer ? objconvert::get_clippingmask(env, peer) : nullptr;
}

// Glyph index: the low 16 bits of the argument as a signed value.
inline short glyph_index(jint g) { return short(g & 0xFFFF); }

}  // namespace font_jni
