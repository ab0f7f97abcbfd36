// Entries of the sprite peer (class "fa"). Sprites are passed as their native
// ids; creation entries bind the new sprite to the calling peer.
#include <jni.h>

#include <memory>

#include "jni/entry.h"
#include "jni/jniarray.h"
#include "jni/objconvert.h"
#include "jni/toolkit_access.h"
#include "render/OffscreenSurface.h"
#include "render/blitclip.h"
#include "render/toolkit.h"
#include "sprite/Sprite.h"

namespace {

Sprite_c& sprite_of(jlong id) { return *from_id_checked<Sprite_c>(id); }

unsigned int* colour_buffer_of(toolkit& t) {
    if (!t.m_ColourBuffer) throw new Exception("No colour buffer");
    return t.m_ColourBuffer;
}

// Copies the w x h rectangle at (screenX, screenY) of the current colour
// buffer into the sprite at (x, y), clipped to both.
void grab_rect(toolkit& t, Sprite_c& s, int x, int y, int w, int h, int screenX, int screenY, bool key) {
    unsigned int* cb = colour_buffer_of(t);
    BlitRect_s r = {screenX, screenY, x, y, w, h};
    if (!ClipBlit(r, t.m_Width, t.m_Height, s.Width, s.Height)) return;
    s.CopyRect(r.dx, r.dy, uint32_t(r.w), uint32_t(r.h), cb + (intptr_t)r.sy * t.m_Width + r.sx, t.m_Width, key);
}

Sprite_c::RenderParams_s render_params(int x, int y, float depth, jint colour, int width, int height) {
    Sprite_c::RenderParams_s p;
    p.x = x;
    p.y = y;
    p.depth = depth;
    p.colour = uint32_t(colour);
    p.width = width;
    p.height = height;
    p.mask = nullptr;
    p.maskx = p.masky = 0;
    return p;
}

Sprite_c::ParallelogramRenderParams_s parallelogram_params(float x0, float y0, float x1, float y1, float x2, float y2,
                                                          jint colour) {
    Sprite_c::ParallelogramRenderParams_s p;
    p.x0 = x0, p.x1 = x1, p.x2 = x2;
    p.y0 = y0, p.y1 = y1, p.y2 = y2;
    p.unused = 0;
    p.colour = uint32_t(colour);
    p.mask = nullptr;
    p.maskx = p.masky = 0;
    return p;
}

}  // namespace

// Grab of a screen rectangle into a new sprite. Exported under its decorated
// name only (C++ linkage), so the JVM's lookup by JNI name does not bind it.
JNIEXPORT void JNICALL Java_fa_K(JNIEnv* env, jobject self, jobject, jobject, jint x, jint y, jint width, jint height,
                                 jboolean key) {
    guarded(env, [&] {
        toolkit& t = tk();
        colour_buffer_of(t);
        CheckImageSize(width, height);
        std::unique_ptr<Sprite_c> s(new Sprite_c);
        s->Allocate(uint32_t(width), uint32_t(height));
        BlitRect_s r = {x, y, 0, 0, width, height};
        bool whole = ClipBlit(r, t.m_Width, t.m_Height, width, height) && r.w == width && r.h == height;
        if (!whole) {
            // parts outside the colour buffer become transparent
            for (uint32_t j = 0; j < s->Height; ++j)
                for (uint32_t i = 0; i < s->Width; ++i) s->Pixels[(size_t)j * s->Pitch + i] = 0;
        }
        grab_rect(t, *s, 0, 0, width, height, x, y, key != 0);
        objconvert::set_sprite(env, self, s.get());
        s.release();
    });
}

extern "C" {

JNIEXPORT jint JNICALL Java_fa_da(JNIEnv* env, jobject, jlong sprite) {
    return guarded(env, [&] { return jint(sprite_of(sprite).Width); });
}

JNIEXPORT jint JNICALL Java_fa_GA(JNIEnv* env, jobject, jlong sprite) {
    return guarded(env, [&] { return jint(sprite_of(sprite).Height); });
}

JNIEXPORT jint JNICALL Java_fa_WA(JNIEnv* env, jobject, jlong sprite) {
    return guarded(env, [&] { return jint(uint32_t(sprite_of(sprite).FullWidth())); });
}

JNIEXPORT jint JNICALL Java_fa_ba(JNIEnv* env, jobject, jlong sprite) {
    return guarded(env, [&] { return jint(uint32_t(sprite_of(sprite).FullHeight())); });
}

JNIEXPORT void JNICALL Java_fa_U(JNIEnv* env, jobject, jlong sprite, jint left, jint top, jint right, jint bottom) {
    guarded(env, [&] {
        Sprite_c& s = sprite_of(sprite);
        s.OffsetLeft = left;
        s.OffsetTop = top;
        s.OffsetRight = right;
        s.OffsetBottom = bottom;
    });
}

JNIEXPORT void JNICALL Java_fa_F(JNIEnv* env, jobject, jlong sprite, jintArray out) {
    guarded(env, [&] {
        Sprite_c& s = sprite_of(sprite);
        pinnedjniarray<int, jintArray, false> o(env, out);
        o.need(4);
        o[0] = s.OffsetLeft;
        o[1] = s.OffsetTop;
        o[2] = s.OffsetRight;
        o[3] = s.OffsetBottom;
    });
}

JNIEXPORT void JNICALL Java_fa_UA(JNIEnv* env, jobject self, jint, jint width, jint height) {
    guarded(env, [&] {
        CheckImageSize(width, height);
        std::unique_ptr<Sprite_c> s(new Sprite_c);
        s->Allocate(uint32_t(width), uint32_t(height));
        objconvert::set_sprite(env, self, s.get());
        s.release();
    });
}

JNIEXPORT void JNICALL Java_fa_RA(JNIEnv* env, jobject self, jobject, jintArray pixels, jint, jint stride, jint width,
                                  jint height, jboolean key) {
    guarded(env, [&] {
        CheckImageSize(width, height);
        copied_jintArrayRO px(env, pixels);
        if (width > 0 && height > 0) px.need(1);
        CheckRectElements(width, height, 0, stride, px.length);
        std::unique_ptr<Sprite_c> s(new Sprite_c);
        s->Allocate(uint32_t(width), uint32_t(height));
        s->Copy(reinterpret_cast<const uint32_t*>(px.data()), stride, key != 0);
        objconvert::set_sprite(env, self, s.get());
        s.release();
    });
}

JNIEXPORT void JNICALL Java_fa_EA(JNIEnv* env, jobject self, jobject, jintArray palette, jbyteArray indices,
                                  jbyteArray alpha, jint, jint stride, jint width, jint height) {
    guarded(env, [&] {
        CheckImageSize(width, height);
        copied_jintArrayRO pal(env, palette);
        copiedjniarray<signed char, jbyteArray, true> idx(env, indices);
        copiedjniarray<signed char, jbyteArray, true> alp(env, alpha);
        const uint8_t* ix = reinterpret_cast<const uint8_t*>(idx.data());
        const uint8_t* al = alp.isnull() ? nullptr : reinterpret_cast<const uint8_t*>(alp.data());
        if (width > 0 && height > 0) {
            idx.need(1);
            CheckRectElements(width, height, 0, stride, idx.length);
            if (al) CheckRectElements(width, height, 0, stride, alp.length);
            // The palette must hold every index that is looked up (index 0 is
            // not looked up without an alpha array).
            int highest = -1;
            for (long long j = 0; j < height; ++j)
                for (long long i = 0; i < width; ++i) {
                    int k = ix[j * stride + i];
                    if (k > highest && (k != 0 || al)) highest = k;
                }
            pal.need(highest + 1);
        }
        std::unique_ptr<Sprite_c> s(new Sprite_c);
        s->Allocate(uint32_t(width), uint32_t(height));
        s->CopyFrom8Bit(ix, reinterpret_cast<const uint32_t*>(pal.data()), al, stride);
        objconvert::set_sprite(env, self, s.get());
        s.release();
    });
}

JNIEXPORT void JNICALL Java_fa_ea(JNIEnv* env, jobject, jlong sprite, jint x, jint y, jint w, jint h, jint screenX,
                                  jint screenY) {
    guarded(env, [&] {
        Sprite_c& s = sprite_of(sprite);
        grab_rect(tk(), s, x, y, w, h, screenX, screenY, true);
    });
}

JNIEXPORT void JNICALL Java_fa_j(JNIEnv* env, jobject, jlong sprite, jint screenX, jint screenY, jint channel) {
    guarded(env, [&] {
        Sprite_c& s = sprite_of(sprite);
        toolkit& t = tk();
        unsigned int* cb = colour_buffer_of(t);
        if (uint32_t(channel) > 3) throw new IllegalArgumentException("alpha channel");
        BlitRect_s r = {screenX, screenY, 0, 0, int(s.Width), int(s.Height)};
        if (!ClipBlit(r, t.m_Width, t.m_Height, s.Width, s.Height)) return;
        s.CopyRectAlpha(r.dx, r.dy, uint32_t(r.w), uint32_t(r.h), cb + (intptr_t)r.sy * t.m_Width + r.sx, t.m_Width,
                        uint32_t(channel));
    });
}

JNIEXPORT void JNICALL Java_fa_na(JNIEnv* env, jobject, jlong sprite, jint x, jint y, jint w, jint h,
                                  jintArray pixels, jint offset, jint stride) {
    guarded(env, [&] {
        Sprite_c& s = sprite_of(sprite);
        pinnedjniarray<int, jintArray, true> px(env, pixels);
        if (w <= 0 || h <= 0) return;
        px.need(1);
        CheckRectElements(w, h, offset, stride, px.length);
        s.CopyRect(x, y, uint32_t(w), uint32_t(h), reinterpret_cast<const uint32_t*>(px.data()) + offset, stride,
                   false);
    });
}

// ---- drawing ---------------------------------------------------------------

JNIEXPORT void JNICALL Java_fa_Y(JNIEnv* env, jobject, jlong sprite, jint x, jint y, jint op, jint colour,
                                 jint blend) {
    guarded(env, [&] {
        const Sprite_c& s = sprite_of(sprite);
        toolkit& t = tk();
        if (!t.m_ColourBuffer) return;
        Sprite_c::RenderParams_s p = render_params(x, y, 0.0f, colour, 0, 0);
        s.Draw(t, op, blend, p);
    });
}

JNIEXPORT void JNICALL Java_fa_ha(JNIEnv* env, jobject, jlong sprite, jint x, jint y, jint width, jint height, jint op,
                                  jint colour, jint blend) {
    guarded(env, [&] {
        const Sprite_c& s = sprite_of(sprite);
        toolkit& t = tk();
        if (!t.m_ColourBuffer) return;
        s.DrawScaled(t, op, blend, render_params(x, y, 0.0f, colour, width, height));
    });
}

JNIEXPORT void JNICALL Java_fa_G(JNIEnv* env, jobject, jlong sprite, jint x, jint y, jint depth, jint width,
                                 jint height, jint op, jint colour, jint blend) {
    guarded(env, [&] {
        const Sprite_c& s = sprite_of(sprite);
        toolkit& t = tk();
        s.DrawScaledDepth(t, op, blend, render_params(x, y, float(depth), colour, width, height));
    });
}

JNIEXPORT void JNICALL Java_fa_o(JNIEnv* env, jobject, jlong sprite, jint x, jint y, jlong mask, jint maskx,
                                 jint masky) {
    guarded(env, [&] {
        const Sprite_c& s = sprite_of(sprite);
        toolkit& t = tk();
        if (!t.m_ColourBuffer) return;
        Sprite_c::RenderParams_s p = render_params(x, y, 0.0f, 0, 0, 0);
        p.mask = from_id<clippingmask>(mask);
        p.maskx = maskx;
        p.masky = masky;
        s.DrawMasked(t, p);
    });
}

JNIEXPORT void JNICALL Java_fa_aa(JNIEnv* env, jobject, jlong sprite, jint x, jint y, jint width, jint height, jint op,
                                  jint colour, jint blend) {
    guarded(env, [&] {
        const Sprite_c& s = sprite_of(sprite);
        toolkit& t = tk();
        if (!t.m_ColourBuffer) return;
        s.DrawTiled(t, op, blend, render_params(x, y, 0.0f, colour, width, height));
    });
}

JNIEXPORT void JNICALL Java_fa_e(JNIEnv* env, jobject, jlong sprite, jfloat x0, jfloat y0, jfloat x1, jfloat y1,
                                 jfloat x2, jfloat y2, jint op, jint colour, jint blend) {
    guarded(env, [&] {
        const Sprite_c& s = sprite_of(sprite);
        toolkit& t = tk();
        if (!t.m_ColourBuffer) return;
        s.DrawParallelogram(t, op, blend, parallelogram_params(x0, y0, x1, y1, x2, y2, colour));
    });
}

JNIEXPORT void JNICALL Java_fa_FA(JNIEnv* env, jobject, jlong sprite, jfloat x0, jfloat y0, jfloat x1, jfloat y1,
                                  jfloat x2, jfloat y2, jint, jlong mask, jint maskx, jint masky, jboolean replace) {
    guarded(env, [&] {
        const Sprite_c& s = sprite_of(sprite);
        toolkit& t = tk();
        if (!t.m_ColourBuffer) return;
        Sprite_c::ParallelogramRenderParams_s p = parallelogram_params(x0, y0, x1, y1, x2, y2, 0);
        p.mask = from_id<clippingmask>(mask);
        p.maskx = maskx;
        p.masky = masky;
        s.DrawParallelogramMasked(t, jtrue(replace), p);
    });
}

JNIEXPORT void JNICALL Java_fa_M(JNIEnv* env, jobject self, jlong sprite) {
    guarded(env, [&] {
        Sprite_c* s = from_id<Sprite_c>(sprite);
        if (s) {
            if (toolkit::m_pInstance) OffscreenSurface_c::Forget(*toolkit::m_pInstance, s, nullptr);
            delete s;
        }
        objconvert::set_sprite(env, self, nullptr);
    });
}

}  // extern "C"
