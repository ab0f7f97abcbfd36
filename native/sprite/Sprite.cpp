#include "sprite/Sprite.h"

#include <emmintrin.h>

#include <cstring>

#include "jni/Exception.h"
#include "render/blitclip.h"
#include "util/memorymanager/aligned.h"

Sprite_c::Sprite_c()
    : OffsetLeft(0), OffsetTop(0), OffsetRight(0), OffsetBottom(0), Width(0), Height(0), Pitch(0), Pixels(nullptr),
      OwnsPixels(false) {}

Sprite_c::~Sprite_c() { Release(); }

void Sprite_c::Release() {
    if (OwnsPixels) _aligned_free(Pixels);
    Pixels = nullptr;
    OwnsPixels = false;
    Width = Height = Pitch = 0;
}

void Sprite_c::Allocate(uint32_t width, uint32_t height) {
    Release();
    if (width > 0x7FFFFFFFu || height > 0x7FFFFFFFu) throw new IllegalArgumentException("size too large");
    CheckImageSize(width, height);
    Pixels = static_cast<uint32_t*>(_aligned_malloc(width * height * 4u, 16));
    OwnsPixels = true;
    Width = width;
    Height = height;
    Pitch = width;
}

void Sprite_c::WrapForeign(uint32_t* pixels, uint32_t width, uint32_t height, uint32_t pitch) {
    Release();
    Pixels = pixels;
    OwnsPixels = false;
    Width = width;
    Height = height;
    Pitch = pitch;
}

// --- row routines -----------------------------------------------------------

namespace spriterows {

static inline uint32_t key_pixel(uint32_t s) { return s ? (s | 0xFF000000u) : 0u; }

static inline __m128i key_4(__m128i s) {
    __m128i zero = _mm_cmpeq_epi32(s, _mm_setzero_si128());
    return _mm_andnot_si128(zero, _mm_or_si128(s, _mm_set1_epi32(int(0xFF000000u))));
}

// Alpha taken from a channel of the source word: 0 red, 1 green, 2 blue,
// 3 "non-zero".
template <int Channel>
static inline uint32_t alpha_pixel(uint32_t d, uint32_t s) {
    uint32_t a;
    if (Channel == 3)
        a = s ? 0xFF000000u : 0u;
    else
        a = (s << (8 + 8 * Channel)) & 0xFF000000u;
    return (d & 0x00FFFFFFu) | a;
}

template <int Channel>
static inline __m128i alpha_4(__m128i d, __m128i s) {
    const __m128i alphaMask = _mm_set1_epi32(int(0xFF000000u));
    __m128i a;
    if (Channel == 3)
        a = _mm_andnot_si128(_mm_cmpeq_epi32(s, _mm_setzero_si128()), alphaMask);
    else
        a = _mm_and_si128(_mm_slli_epi32(s, 8 + 8 * Channel), alphaMask);
    return _mm_or_si128(_mm_andnot_si128(alphaMask, d), a);
}

void copy_key_scalar(uint32_t* dst, const uint32_t* src, int n) {
    for (int i = 0; i < n; ++i) dst[i] = key_pixel(src[i]);
}

void copy_key(uint32_t* dst, const uint32_t* src, int n) {
    int i = 0;
    while (i < n && (reinterpret_cast<uintptr_t>(dst + i) & 15)) {
        dst[i] = key_pixel(src[i]);
        ++i;
    }
    for (; i + 4 <= n; i += 4) {
        __m128i s = _mm_loadu_si128(reinterpret_cast<const __m128i*>(src + i));
        _mm_storeu_si128(reinterpret_cast<__m128i*>(dst + i), key_4(s));
    }
    for (; i < n; ++i) dst[i] = key_pixel(src[i]);
}

template <int Channel>
static void copy_alpha_t(uint32_t* dst, const uint32_t* src, int n) {
    int i = 0;
    while (i < n && (reinterpret_cast<uintptr_t>(dst + i) & 15)) {
        dst[i] = alpha_pixel<Channel>(dst[i], src[i]);
        ++i;
    }
    for (; i + 4 <= n; i += 4) {
        __m128i s = _mm_loadu_si128(reinterpret_cast<const __m128i*>(src + i));
        __m128i d = _mm_loadu_si128(reinterpret_cast<const __m128i*>(dst + i));
        _mm_storeu_si128(reinterpret_cast<__m128i*>(dst + i), alpha_4<Channel>(d, s));
    }
    for (; i < n; ++i) dst[i] = alpha_pixel<Channel>(dst[i], src[i]);
}

void copy_alpha(uint32_t* dst, const uint32_t* src, int n, uint32_t channel) {
    switch (channel) {
        case 0: copy_alpha_t<0>(dst, src, n); break;
        case 1: copy_alpha_t<1>(dst, src, n); break;
        case 2: copy_alpha_t<2>(dst, src, n); break;
        case 3: copy_alpha_t<3>(dst, src, n); break;
        default: throw new IllegalArgumentException("alpha channel");
    }
}

void copy_alpha_scalar(uint32_t* dst, const uint32_t* src, int n, uint32_t channel) {
    for (int i = 0; i < n; ++i) {
        uint32_t s = src[i], a;
        switch (channel) {
            case 0: a = (s >> 16) & 0xFF; break;
            case 1: a = (s >> 8) & 0xFF; break;
            case 2: a = s & 0xFF; break;
            default: a = s ? 0xFF : 0; break;
        }
        dst[i] = (dst[i] & 0x00FFFFFFu) | (a << 24);
    }
}

}  // namespace spriterows

// --- copies -----------------------------------------------------------------

void Sprite_c::Copy(const uint32_t* source, int stride, bool key) {
    CopyRect(0, 0, Width, Height, source, stride, key);
}

// Clips a w x h rectangle at (x, y) of the sprite; moves the source pointer by
// the cut-off part. Returns false when nothing remains.
static bool clip_to_sprite(const Sprite_c& s, int& x, int& y, uint32_t& w, uint32_t& h, const uint32_t*& source,
                           int stride) {
    BlitRect_s r = {0, 0, x, y, int(w > 0x7FFFFFFFu ? 0x7FFFFFFFu : w), int(h > 0x7FFFFFFFu ? 0x7FFFFFFFu : h)};
    if (!ClipBlit(r, 0x7FFFFFFFLL, 0x7FFFFFFFLL, s.Width, s.Height)) return false;
    source += (intptr_t)r.sy * stride + r.sx;
    x = r.dx, y = r.dy, w = uint32_t(r.w), h = uint32_t(r.h);
    return true;
}

void Sprite_c::CopyRect(int x, int y, uint32_t w, uint32_t h, const uint32_t* source, int stride, bool key) {
    if (!Pixels || !clip_to_sprite(*this, x, y, w, h, source, stride)) return;
    uint32_t* dst = Pixels + (intptr_t)y * Pitch + x;
    for (uint32_t j = 0; j < h; ++j, dst += Pitch, source += stride) {
        if (key)
            spriterows::copy_key(dst, source, int(w));
        else
            std::memmove(dst, source, size_t(w) * 4);
    }
}

void Sprite_c::CopyAlpha(const uint32_t* source, int stride, uint32_t channel) {
    CopyRectAlpha(0, 0, Width, Height, source, stride, channel);
}

void Sprite_c::CopyRectAlpha(int x, int y, uint32_t w, uint32_t h, const uint32_t* source, int stride,
                             uint32_t channel) {
    if (channel > 3) throw new IllegalArgumentException("alpha channel");
    if (!Pixels || !clip_to_sprite(*this, x, y, w, h, source, stride)) return;
    uint32_t* dst = Pixels + (intptr_t)y * Pitch + x;
    for (uint32_t j = 0; j < h; ++j, dst += Pitch, source += stride) spriterows::copy_alpha(dst, source, int(w), channel);
}

void Sprite_c::CopyFrom8Bit(const uint8_t* indices, const uint32_t* palette, const uint8_t* alpha, int stride) {
    if (!Pixels) return;
    uint32_t* dst = Pixels;
    for (uint32_t j = 0; j < Height; ++j, dst += Pitch, indices += stride) {
        if (alpha) {
            for (uint32_t i = 0; i < Width; ++i) dst[i] = (palette[indices[i]] & 0x00FFFFFFu) | (uint32_t(alpha[i]) << 24);
            alpha += stride;
        } else {
            for (uint32_t i = 0; i < Width; ++i) {
                uint8_t k = indices[i];
                dst[i] = k ? (palette[k] | 0xFF000000u) : 0u;
            }
        }
    }
}
