// Pixel rules of the three font kinds and the row routine that applies them
// to one row of glyph bytes.
//
// A rule maps (destination pixel, glyph byte) to the new pixel; a zero byte
// always leaves the destination alone. Rules that write one constant colour
// for every non-zero byte (constant = true) run four pixels per step with SSE2
// (the glyph bytes become a lane mask); the palette rule skips four empty bytes
// at once and otherwise goes pixel by pixel; the blending rules go pixel by
// pixel. glyph_row_ref is the plain per-pixel reference.
#pragma once

#include <emmintrin.h>

#include <cstddef>
#include <cstdint>
#include <cstring>

namespace glyphrows {

// blend(D, C, p, q): each colour channel D*p/256 + C*q/256, each term rounded
// down; the alpha byte of the result is 0. Unsigned 32-bit arithmetic.
inline uint32_t blend(uint32_t D, uint32_t C, uint32_t p, uint32_t q) {
    return (((((D & 0xFF00u) * p) & 0xFF0000u) + (((D & 0xFF00FFu) * p) & 0xFF00FF00u)) >> 8) +
           (((((C & 0xFF00u) * q) & 0xFF0000u) + (((C & 0xFF00FFu) * q) & 0xFF00FF00u)) >> 8);
}

// Every set byte becomes the colour (all 32 bits).
struct set_colour {
    static constexpr bool constant = true;
    uint32_t c;
    uint32_t operator()(uint32_t d, uint8_t g) const { return g ? c : d; }
};

// Every set byte blends the colour in with fixed weights p (destination) and
// q (colour).
struct blend_colour {
    static constexpr bool constant = false;
    uint32_t c, p, q;
    uint32_t operator()(uint32_t d, uint8_t g) const { return g ? blend(d, c, p, q) : d; }
};

// The byte is the colour's coverage.
struct coverage {
    static constexpr bool constant = false;
    uint32_t c;
    uint32_t operator()(uint32_t d, uint8_t g) const { return g ? blend(d, c, 256u - g, g) : d; }
};

// The byte indexes the palette; indices beyond the palette draw nothing.
struct palette_lookup {
    static constexpr bool constant = false;
    const uint32_t* pal;
    uint32_t n;
    uint32_t operator()(uint32_t d, uint8_t g) const { return (g && g < n) ? pal[g] : d; }
};

// Four glyph bytes, `stride` apart, as one little-endian word.
inline uint32_t four_bytes(const uint8_t* s, ptrdiff_t stride) {
    if (stride == 1) {
        uint32_t v;
        std::memcpy(&v, s, 4);
        return v;
    }
    return uint32_t(s[0]) | uint32_t(s[stride]) << 8 | uint32_t(s[2 * stride]) << 16 | uint32_t(s[3 * stride]) << 24;
}

// n destination pixels from n glyph bytes taken `stride` bytes apart.
template <class P>
inline void glyph_row(uint32_t* d, const uint8_t* s, ptrdiff_t stride, ptrdiff_t n, const P& rule) {
    if constexpr (P::constant) {
        const __m128i c = _mm_set1_epi32(int(rule.c)), zero = _mm_setzero_si128();
        for (; n >= 4; n -= 4, d += 4, s += 4 * stride) {
            const uint32_t b = four_bytes(s, stride);
            if (!b) continue;
            __m128i lanes = _mm_unpacklo_epi16(_mm_unpacklo_epi8(_mm_cvtsi32_si128(int(b)), zero), zero);
            __m128i keep = _mm_cmpeq_epi32(lanes, zero);
            __m128i* q = reinterpret_cast<__m128i*>(d);
            _mm_storeu_si128(q, _mm_or_si128(_mm_and_si128(keep, _mm_loadu_si128(q)), _mm_andnot_si128(keep, c)));
        }
    } else {
        for (; n >= 4; n -= 4, d += 4, s += 4 * stride) {
            if (!four_bytes(s, stride)) continue;
            for (int i = 0; i < 4; ++i) d[i] = rule(d[i], s[i * stride]);
        }
    }
    for (; n > 0; --n, ++d, s += stride) *d = rule(*d, *s);
}

template <class P>
inline void glyph_row_ref(uint32_t* d, const uint8_t* s, ptrdiff_t stride, ptrdiff_t n, const P& rule) {
    for (ptrdiff_t i = 0; i < n; ++i) d[i] = rule(d[i], s[i * stride]);
}

}  // namespace glyphrows
