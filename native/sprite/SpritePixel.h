// Per-pixel arithmetic of the sprite blitters: the colour operations and blend
// modes, once as plain integer code for one pixel and once in SSE2 16-bit
// lanes for four pixels. Both give identical results; the blit loops use the
// four-pixel form for whole rows (the last 1-3 pixels of a row in a partly
// filled vector), the one-pixel form is the plain reference.
#pragma once

#include <emmintrin.h>

#include <cstdint>

namespace SpritePixel_n {

// Constants of one call, prepared once from the colour col.
struct Consts_s {
    uint32_t col;
    uint32_t tintAlpha;  // alpha byte of col
    uint32_t tintAdd;    // per channel (col x (255 - a)) >> 8, packed like a pixel
    __m128i col8;        // col in each 32-bit lane
    __m128i col16;       // col's channels in 16-bit lanes (two pixels)
    __m128i tintAlpha16;
    __m128i tintAdd16;
};

inline Consts_s MakeConsts(uint32_t col) {
    Consts_s k;
    k.col = col;
    k.tintAlpha = col >> 24;
    k.tintAdd = 0;
    for (int c = 0; c < 4; ++c) k.tintAdd |= ((((col >> (8 * c)) & 0xFFu) * (255u - k.tintAlpha)) >> 8) << (8 * c);
    k.col8 = _mm_set1_epi32(int(col));
    k.col16 = _mm_unpacklo_epi8(k.col8, _mm_setzero_si128());
    k.tintAlpha16 = _mm_set1_epi16(short(k.tintAlpha));
    k.tintAdd16 = _mm_unpacklo_epi8(_mm_set1_epi32(int(k.tintAdd)), _mm_setzero_si128());
    return k;
}

// ---- one pixel, plain integer arithmetic ----------------------------------

template <int Op>
inline uint32_t Operate1(uint32_t s, const Consts_s& k) {
    if (Op == 1) return s;
    uint32_t out = 0;
    for (int c = 0; c < 32; c += 8) {
        uint32_t sc = (s >> c) & 0xFFu, kc = (k.col >> c) & 0xFFu, r;
        if (Op == 0)
            r = (sc * kc) >> 8;
        else if (Op == 2)
            r = ((sc * k.tintAlpha) >> 8) + ((k.tintAdd >> c) & 0xFFu);
        else if (Op == 3)
            r = sc + kc > 255u ? 255u : sc + kc;
        else
            r = sc > kc ? sc - kc : 0u;
        out |= r << c;
    }
    return out;
}

template <int Blend>
inline uint32_t Blend1(uint32_t s, uint32_t d) {
    if (Blend == 0) return s;
    uint32_t a = s >> 24, out = 0;
    for (int c = 0; c < 32; c += 8) {
        uint32_t sc = (s >> c) & 0xFFu, dc = (d >> c) & 0xFFu, r;
        if (Blend == 1)
            r = (sc * a + dc * (256u - a)) >> 8;
        else
            r = sc + dc > 255u ? 255u : sc + dc;
        out |= r << c;
    }
    return out;
}

template <int Op, int Blend>
inline uint32_t Pixel1(uint32_t s, uint32_t d, const Consts_s& k) {
    return Blend1<Blend>(Operate1<Op>(s, k), d);
}

// ---- four pixels, SSE2 ------------------------------------------------------

// Operation on two pixels held as 16-bit lanes (modulate and tint only).
template <int Op>
inline __m128i Operate16(__m128i s, const Consts_s& k) {
    if (Op == 0) return _mm_srli_epi16(_mm_mullo_epi16(s, k.col16), 8);
    if (Op == 2) return _mm_add_epi16(_mm_srli_epi16(_mm_mullo_epi16(s, k.tintAlpha16), 8), k.tintAdd16);
    return s;
}

// (s x A + d x (256 - A)) >> 8 with A the alpha lane of each pixel, as
// (d x 256 + (s - d) x A) >> 8: the true sum lies in 0..65280, so the low
// 16 bits of the wrapped lane arithmetic are exact.
inline __m128i AlphaBlend16(__m128i s, __m128i d) {
    __m128i a = _mm_shufflehi_epi16(_mm_shufflelo_epi16(s, _MM_SHUFFLE(3, 3, 3, 3)), _MM_SHUFFLE(3, 3, 3, 3));
    return _mm_srli_epi16(_mm_add_epi16(_mm_slli_epi16(d, 8), _mm_mullo_epi16(_mm_sub_epi16(s, d), a)), 8);
}

template <int Op, int Blend>
inline __m128i Pixel4(__m128i s, __m128i d, const Consts_s& k) {
    const __m128i zero = _mm_setzero_si128();
    if (Op == 3) s = _mm_adds_epu8(s, k.col8);
    if (Op == 4) s = _mm_subs_epu8(s, k.col8);
    if (Op == 0 || Op == 2 || Blend == 1) {
        __m128i lo = Operate16<Op>(_mm_unpacklo_epi8(s, zero), k);
        __m128i hi = Operate16<Op>(_mm_unpackhi_epi8(s, zero), k);
        if (Blend == 1) {
            lo = AlphaBlend16(lo, _mm_unpacklo_epi8(d, zero));
            hi = AlphaBlend16(hi, _mm_unpackhi_epi8(d, zero));
        }
        s = _mm_packus_epi16(lo, hi);
    }
    if (Blend == 2) s = _mm_adds_epu8(s, d);
    return s;
}

}  // namespace SpritePixel_n
