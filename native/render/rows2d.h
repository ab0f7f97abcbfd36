// Pixel modes of the 2D layer and the row routines built on them.
//
// A mode is a small object built once per call from the source colour. It
// offers the per-pixel operation (operator() on one 32-bit pixel) and the same
// operation on four pixels (op4 on an SSE register). The row routines walk a
// scalar head up to a 16-byte boundary, a four-pixel body and a scalar tail,
// all through these two operations; the scalar references below apply only
// the per-pixel operation and must give bit-identical rows.
//
//   replace: d = s
//   blend:   d = premul(s, a) + scale(d, 256 - a)    (a = s >> 24, a < 255)
//   add:     colour channels min(255, s + d), alpha (s + d) mod 256
//
// Blend with alpha 255 is a replace; with_mode() makes that choice, and the
// choice of mode, once per call.
#pragma once

#include <emmintrin.h>

#include <cstddef>
#include <cstdint>

#include "jni/Exception.h"

namespace rows2d {

// Each colour channel multiplied by k (0..256) and divided by 256, rounded
// down; the alpha byte of the result is 0. Unsigned 32-bit arithmetic.
inline uint32_t scale(uint32_t c, uint32_t k) {
    return (((c & 0xFF00FFu) * k >> 8) & 0xFF00FFu) + (((c & 0xFF00u) * k >> 8) & 0xFF00u);
}

// The source term of a blend: the scaled colour channels with alpha a on top.
inline uint32_t premul(uint32_t s, uint32_t a) { return scale(s, a) + (a << 24); }

// Blend of one pixel (any alpha; 255 gives the source).
inline uint32_t blend_pixel(uint32_t d, uint32_t s) {
    uint32_t a = s >> 24;
    if (a == 255) return s;
    return premul(s, a) + scale(d, 256 - a);
}

// Saturating add of the colour channels, wrapping add of the alpha byte.
inline uint32_t add_pixel(uint32_t d, uint32_t s) {
    uint32_t t = (d & 0xFF00FFu) + (s & 0xFF00FFu);
    uint32_t u = s + d;
    uint32_t c = ((u - t) & 0x10000u) + (t & 0x1000100u);
    return (c - (c >> 8)) | (u - c);
}

struct replace_mode {
    static constexpr bool reads_dest = false;
    explicit replace_mode(uint32_t s) : src(s), vsrc(_mm_set1_epi32(int(s))) {}
    uint32_t operator()(uint32_t) const { return src; }
    __m128i op4(__m128i) const { return vsrc; }
    uint32_t src;
    __m128i vsrc;
};

// Only for source alpha below 255 (with_mode sends 255 to replace_mode).
struct blend_mode {
    static constexpr bool reads_dest = true;
    explicit blend_mode(uint32_t s)
        : pre(premul(s, s >> 24)),
          k(256 - (s >> 24)),
          vpre(_mm_set1_epi32(int(pre))),
          // 16-bit lane factors for B, G, R, A: the alpha lane is 0 so the
          // scaled destination has alpha 0 like scale() above.
          vk(_mm_setr_epi16(short(k), short(k), short(k), 0, short(k), short(k), short(k), 0)) {}
    uint32_t operator()(uint32_t d) const { return pre + scale(d, k); }
    __m128i op4(__m128i d) const {
        const __m128i zero = _mm_setzero_si128();
        // channel * k <= 255 * 256 fits an unsigned 16-bit lane
        __m128i lo = _mm_srli_epi16(_mm_mullo_epi16(_mm_unpacklo_epi8(d, zero), vk), 8);
        __m128i hi = _mm_srli_epi16(_mm_mullo_epi16(_mm_unpackhi_epi8(d, zero), vk), 8);
        // channel sums stay within 255, so no carry crosses a byte
        return _mm_add_epi32(_mm_packus_epi16(lo, hi), vpre);
    }
    uint32_t pre, k;
    __m128i vpre, vk;
};

struct add_mode {
    static constexpr bool reads_dest = true;
    explicit add_mode(uint32_t s)
        : src(s), vrgb(_mm_set1_epi32(int(s & 0xFFFFFFu))), valpha(_mm_set1_epi32(int(s & 0xFF000000u))) {}
    uint32_t operator()(uint32_t d) const { return add_pixel(d, src); }
    // Colour bytes: saturating add of the source's colour channels (its alpha
    // byte zeroed, so the destination alpha passes unchanged); then the source
    // alpha is added to the top byte, where a carry leaves the word.
    __m128i op4(__m128i d) const { return _mm_add_epi32(_mm_adds_epu8(d, vrgb), valpha); }
    uint32_t src;
    __m128i vrgb, valpha;
};

inline bool valid_mode(unsigned int mode) { return mode <= 2; }

// Unknown modes throw IllegalArgumentException with an empty message.
inline void check_mode(unsigned int mode) {
    if (!valid_mode(mode)) throw new IllegalArgumentException();
}

// The one place where a (colour, mode) pair becomes a mode object: calls
// f(mode object) with the object for mode 0, 1 or 2 (a blend of an opaque
// colour runs as a replace). The mode must have been checked.
template <class F>
inline void with_mode(unsigned int mode, uint32_t colour, F&& f) {
    if (mode == 2)
        f(add_mode(colour));
    else if (mode == 1 && (colour >> 24) != 255)
        f(blend_mode(colour));
    else
        f(replace_mode(colour));
}

inline bool aligned16(const void* p) { return (reinterpret_cast<uintptr_t>(p) & 15) == 0; }

// One row of n pixels through the mode: scalar head to a 16-byte boundary,
// four pixels at a time, scalar tail.
template <class M>
inline void fill_row(uint32_t* p, ptrdiff_t n, const M& mode) {
    // A local copy: stores through p cannot alias it, so its vectors stay in registers.
    const M m(mode);
    while (n > 0 && !aligned16(p)) {
        *p = m(*p);
        ++p;
        --n;
    }
    // sixteen pixels a step while they last, then four
    for (; n >= 16; n -= 16, p += 16) {
        __m128i* q = reinterpret_cast<__m128i*>(p);
        if constexpr (M::reads_dest) {
            const __m128i a = _mm_load_si128(q), b = _mm_load_si128(q + 1);
            const __m128i c = _mm_load_si128(q + 2), d = _mm_load_si128(q + 3);
            _mm_store_si128(q, m.op4(a));
            _mm_store_si128(q + 1, m.op4(b));
            _mm_store_si128(q + 2, m.op4(c));
            _mm_store_si128(q + 3, m.op4(d));
        } else {
            const __m128i v = m.op4(_mm_setzero_si128());
            _mm_store_si128(q, v);
            _mm_store_si128(q + 1, v);
            _mm_store_si128(q + 2, v);
            _mm_store_si128(q + 3, v);
        }
    }
    for (; n >= 4; n -= 4, p += 4) {
        __m128i* q = reinterpret_cast<__m128i*>(p);
        if constexpr (M::reads_dest)
            _mm_store_si128(q, m.op4(_mm_load_si128(q)));
        else
            _mm_store_si128(q, m.op4(_mm_setzero_si128()));
    }
    for (; n > 0; --n, ++p) *p = m(*p);
}

// Same, but a pixel changes only where the depth element beside it (same
// index in `z`) is greater than `depth`.
template <class M>
inline void fill_row_depth(uint32_t* p, const float* z, ptrdiff_t n, float depth, const M& mode) {
    const M m(mode);
    while (n > 0 && !aligned16(p)) {
        if (*z > depth) *p = m(*p);
        ++p;
        ++z;
        --n;
    }
    const __m128 vd = _mm_set1_ps(depth);
    for (; n >= 4; n -= 4, p += 4, z += 4) {
        __m128i* q = reinterpret_cast<__m128i*>(p);
        __m128i old = _mm_load_si128(q);
        __m128i sel = _mm_castps_si128(_mm_cmpgt_ps(_mm_loadu_ps(z), vd));
        __m128i neu = m.op4(old);
        _mm_store_si128(q, _mm_or_si128(_mm_and_si128(sel, neu), _mm_andnot_si128(sel, old)));
    }
    for (; n > 0; --n, ++p, ++z)
        if (*z > depth) *p = m(*p);
}

// Scalar references of the row routines.
template <class M>
inline void fill_row_ref(uint32_t* p, ptrdiff_t n, const M& m) {
    for (ptrdiff_t i = 0; i < n; ++i) p[i] = m(p[i]);
}

template <class M>
inline void fill_row_depth_ref(uint32_t* p, const float* z, ptrdiff_t n, float depth, const M& m) {
    for (ptrdiff_t i = 0; i < n; ++i)
        if (z[i] > depth) p[i] = m(p[i]);
}

// n copies of `value` with non-temporal stores (64 bytes a step), for clears
// of whole buffers that are not read back soon.
void stream_fill(uint32_t* p, size_t n, uint32_t value);

}  // namespace rows2d
