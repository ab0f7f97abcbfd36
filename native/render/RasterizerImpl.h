// Template bodies of the triangle rasteriser: per-triangle set-up
// (RenderTriangle) and the span routine (RenderHalfTriangle_c). Included only
// by the instantiation files RasterizerInst*.cpp.
//
// Arithmetic contract (the reference rasteriser of the tests follows it step
// by step, so every float operation here is deliberate):
//  - vertex attributes are float vectors; per-row gradients are
//    (b - a) * rcp(max(rows, 1e-6)) with the approximate SSE reciprocal;
//  - edge x and depth, texture coordinates are stepped per row by float adds;
//    colours, fog terms and blend weights are stepped as wrapping 16-bit lanes;
//  - per span the gradient is (right - left) * rcp(width), the start value is
//    left + gradient * clipped pixels, and per group of four pixels the float
//    attributes start at start + gradient * (lane offsets) and then advance by
//    gradient * 4 per group.
#pragma once

#include <emmintrin.h>
#include <xmmintrin.h>

#include <cstdint>
#include <cstring>

#include "render/Rasterizer.h"

#define RAST_INLINE inline __attribute__((always_inline))

namespace Rasterizer_n {

// Coordinates are clamped to +-kCoordLimit before any float-to-integer
// conversion, so row and column arithmetic never overflows whatever the
// caller passes (1e9 is exact in single precision).
constexpr float kCoordLimit = 1.0e9f;
constexpr int kClipLimit = 1 << 30;
// Triangles of at most this many rows get their rows prefetched during set-up.
constexpr int kPrefetchRows = 12;

// Mask and lane tables shared by every span routine instantiation.
struct RasterTables_c {
    // [0]: entry k-1 drops the first k pixels of the span's first group.
    // [1]: entry k-1 keeps the first k pixels of the span's last, partial group.
    alignas(16) static constexpr unsigned int UnalignedMasks[2][3][4] = {
        {{0, ~0u, ~0u, ~0u}, {0, 0, ~0u, ~0u}, {0, 0, 0, ~0u}},
        {{~0u, 0, 0, 0}, {~0u, ~0u, 0, 0}, {~0u, ~0u, ~0u, 0}}};
    // Entry k-1 drops the last k lanes (a span starting and ending in one group).
    alignas(16) static constexpr unsigned int RightClippingMasks[2][4] = {{~0u, ~0u, ~0u, 0},
                                                                          {~0u, ~0u, 0, 0}};
    alignas(16) static constexpr float ZeroOneTwoThree[4] = {0.0f, 1.0f, 2.0f, 3.0f};
    // ZeroOneTwoThree + float(-lead) for a first group starting `lead` pixels
    // before the span (the same values, without a conversion per row).
    alignas(16) static constexpr float LeadLanes[4][4] = {
        {0.0f, 1.0f, 2.0f, 3.0f}, {-1.0f, 0.0f, 1.0f, 2.0f}, {-2.0f, -1.0f, 0.0f, 1.0f}, {-3.0f, -2.0f, -1.0f, 0.0f}};
    // Blend weights (I, J, I, J) of the triangle's vertices 0, 1, 2.
    alignas(16) static constexpr float IJ[3][4] = {
        {65535.0f, 0.0f, 65535.0f, 0.0f}, {0.0f, 65535.0f, 0.0f, 65535.0f}, {0.0f, 0.0f, 0.0f, 0.0f}};
};

namespace detail {

struct ClipRect_s {
    int x0, x1, y0, y1;
};

inline long long clamp_clip(long long v) { return v < 0 ? 0 : (v > kClipLimit ? kClipLimit : v); }

// Pixels that may be written: the viewport cut to the target. Shadow masks
// (an 8-bit target swapped in for one triangle) are bounded by the viewport's
// rows and by columns 0 .. Width-1.
template <bool Mask>
RAST_INLINE bool CurrentClip(ClipRect_s& c) {
    const Viewport_s& vp = m_Viewport;
    long long x0 = vp.X, x1 = (long long)vp.X + vp.Width;
    long long y0 = vp.Y, y1 = (long long)vp.Y + vp.Height;
    if (Mask) {
        x0 = 0;
        x1 = vp.Width;
    } else {
        if (x1 > m_TargetWidth) x1 = m_TargetWidth;
        if (y1 > m_TargetHeight) y1 = m_TargetHeight;
    }
    x0 = clamp_clip(x0);
    x1 = clamp_clip(x1);
    y0 = clamp_clip(y0);
    y1 = clamp_clip(y1);
    if (x1 <= x0 || y1 <= y0) return false;
    c.x0 = int(x0);
    c.x1 = int(x1);
    c.y0 = int(y0);
    c.y1 = int(y1);
    return true;
}

// max first so that NaN becomes the lower limit
RAST_INLINE __m128 ClampCoord(__m128 v) {
    return _mm_min_ps(_mm_max_ps(v, _mm_set1_ps(-kCoordLimit)), _mm_set1_ps(kCoordLimit));
}

// Float channels (left, right) to eight unsigned 16-bit lanes clamped to
// [0, 65535]: truncate, subtract 32768, pack with signed saturation, add 0x8000.
RAST_INLINE __m128i ToU16(__m128 lo, __m128 hi) {
    const __m128i bias = _mm_set1_epi32(32768);
    __m128i a = _mm_sub_epi32(_mm_cvttps_epi32(lo), bias);
    __m128i b = _mm_sub_epi32(_mm_cvttps_epi32(hi), bias);
    return _mm_add_epi16(_mm_packs_epi32(a, b), _mm_set1_epi16(short(0x8000)));
}

// Float gradients to signed 16-bit lanes: truncation, signed saturation.
RAST_INLINE __m128i ToI16(__m128 lo, __m128 hi) {
    return _mm_packs_epi32(_mm_cvttps_epi32(lo), _mm_cvttps_epi32(hi));
}

template <int Lane>
RAST_INLINE __m128 Bcast(__m128 v) {
    return _mm_shuffle_ps(v, v, _MM_SHUFFLE(Lane, Lane, Lane, Lane));
}

// Per-span interpolation of a 4 x 16-bit attribute (colour, fog, weights):
// left lanes 0-3, right lanes 4-7 of `edges`. Produces the values of the
// first group's pixels 0,1 and 2,3 (lane offset `off` from the left edge) and
// the per-group step.
RAST_INLINE void InterpU16(__m128i edges, __m128 inv, int off, __m128i& v01, __m128i& v23, __m128i& step4) {
    const __m128i zero = _mm_setzero_si128();
    __m128i l = _mm_unpacklo_epi16(edges, zero);
    __m128i r = _mm_unpackhi_epi16(edges, zero);
    __m128i g32 = _mm_cvttps_epi32(_mm_mul_ps(_mm_cvtepi32_ps(_mm_sub_epi32(r, l)), inv));
    __m128i g = _mm_packs_epi32(g32, g32);
    __m128i base = _mm_unpacklo_epi64(edges, edges);
    __m128i lanes = _mm_add_epi16(_mm_set1_epi16(short(off)), _mm_setr_epi16(0, 0, 0, 0, 1, 1, 1, 1));
    v01 = _mm_add_epi16(base, _mm_mullo_epi16(g, lanes));
    v23 = _mm_add_epi16(v01, _mm_slli_epi16(g, 1));
    step4 = _mm_slli_epi16(g, 2);
}

// Four texels at 32-bit indices (each below 32768).
RAST_INLINE __m128i Gather(const unsigned int* tex, __m128i idx) {
    __m128i t0 = _mm_cvtsi32_si128(int(tex[_mm_extract_epi16(idx, 0)]));
    __m128i t1 = _mm_cvtsi32_si128(int(tex[_mm_extract_epi16(idx, 2)]));
    __m128i t2 = _mm_cvtsi32_si128(int(tex[_mm_extract_epi16(idx, 4)]));
    __m128i t3 = _mm_cvtsi32_si128(int(tex[_mm_extract_epi16(idx, 6)]));
    return _mm_unpacklo_epi64(_mm_unpacklo_epi32(t0, t1), _mm_unpacklo_epi32(t2, t3));
}

}  // namespace detail

// Values of one span at its first visible pixel, the gradients, and the
// group geometry. Built per row by RenderHalfTriangle and consumed by the
// always-inlined RenderHLine.
struct HorizontalLine_s {
    unsigned int* m_pColour;  // aligned group holding the first pixel
    float* m_pDepth;          // depth element of the same pixel as m_pColour
    int m_Count;              // pixels in the span
    int m_Lead;               // pixels of the first group before the span (0..3)
    __m128 m_Z, m_DZ4;        // depth of the first group's lanes, per-group step
    __m128 m_U, m_V, m_DU4, m_DV4;
    __m128i m_C01, m_C23, m_DC4;
    __m128i m_F01, m_F23, m_DF4;
    __m128i m_W01, m_W23, m_DW4;
};

template <ShadeMode_e Shade, TexAddressMode_e AddrU, TexAddressMode_e AddrV, bool TexTransform, bool Fog,
          BlendMode_e Blend, bool Transparent, bool MapMod, bool DepthWrite, bool ColourWrite, bool DepthTest>
struct RenderHalfTriangle_c : RasterTables_c {
    static constexpr bool kColour = Shade >= ShadeMode_Gouraud;
    static constexpr bool kTex = Shade >= ShadeMode_Textured;
    static constexpr bool kWeights = Shade == ShadeMode_TextureBlend;
    static constexpr bool kStoreDepth = DepthWrite && DepthTest;
    // per-pixel conditions beyond the depth test
    static constexpr bool kPixelMask = Transparent || Blend == BlendMode_TexelAlpha;

    static_assert(Shade != ShadeMode_Mask || (!Fog && Blend == BlendMode_Opaque && !DepthTest && !DepthWrite),
                  "mask mode writes bytes only");
    static_assert(!Transparent || Shade == ShadeMode_Textured, "transparent texels need a texture");
    static_assert(Blend != BlendMode_TexelAlpha || Shade == ShadeMode_Textured, "texel alpha needs a texture");
    static_assert(!(MapMod || TexTransform) || kTex, "map and texture transform need a texture");
    static_assert(!Fog || kColour, "fog needs interpolated colours");

    struct Consts {
        __m128i flat;
        __m128i alpha16;
        __m128 offU, offV;
        __m128i mapShift;
        const unsigned int *tex, *tex2, *tex3;
        const unsigned char* map;
    };

    // One group of four pixels under `mask` (edge lanes).
    template <bool Full>
    static RAST_INLINE void Group(const Consts& k, const HorizontalLine_s& l, __m128i mask, unsigned int* cp,
                                  float* dp) {
        const __m128i zero = _mm_setzero_si128();
        __m128 zold;
        if constexpr (DepthTest) {
            zold = _mm_loadu_ps(dp);
            mask = _mm_and_si128(mask, _mm_castps_si128(_mm_cmple_ps(l.m_Z, zold)));
            if (_mm_movemask_ps(_mm_castsi128_ps(mask)) == 0) return;
        }
        __m128i src = zero;
        if constexpr (Shade == ShadeMode_Flat) {
            src = k.flat;
        } else if constexpr (Shade == ShadeMode_Gouraud) {
            __m128i s01 = _mm_srli_epi16(l.m_C01, 8);
            __m128i s23 = _mm_srli_epi16(l.m_C23, 8);
            if constexpr (Fog) {
                s01 = _mm_adds_epu16(s01, _mm_srli_epi16(l.m_F01, 8));
                s23 = _mm_adds_epu16(s23, _mm_srli_epi16(l.m_F23, 8));
            }
            src = _mm_packus_epi16(s01, s23);
        } else if constexpr (kTex) {
            __m128 u = _mm_mul_ps(l.m_U, l.m_Z);
            __m128 v = _mm_mul_ps(l.m_V, l.m_Z);
            if constexpr (TexTransform) {
                u = _mm_add_ps(u, k.offU);
                v = _mm_add_ps(v, k.offV);
            }
            __m128i ui, vi, uraw, vraw;
            if constexpr (AddrU == TexAddress_Clamp) {
                uraw = ui = _mm_cvttps_epi32(_mm_min_ps(_mm_max_ps(u, _mm_setzero_ps()), _mm_set1_ps(127.0f)));
            } else {
                uraw = _mm_cvttps_epi32(u);
                ui = _mm_and_si128(uraw, _mm_set1_epi32(127));
            }
            if constexpr (AddrV == TexAddress_Clamp) {
                vraw = vi = _mm_cvttps_epi32(_mm_min_ps(_mm_max_ps(v, _mm_setzero_ps()), _mm_set1_ps(127.0f)));
            } else {
                vraw = _mm_cvttps_epi32(v);
                vi = _mm_and_si128(vraw, _mm_set1_epi32(127));
            }
            __m128i idx = _mm_add_epi32(ui, _mm_slli_epi32(vi, 8));
            __m128i c01 = l.m_C01, c23 = l.m_C23;
            if constexpr (MapMod) {
                __m128i us = _mm_sra_epi32(uraw, k.mapShift);
                __m128i vs = _mm_sra_epi32(vraw, k.mapShift);
                __m128i b = _mm_packus_epi16(_mm_packs_epi32(us, vs), zero);  // u0..u3 v0..v3 as bytes
                __m128i midx = _mm_unpacklo_epi8(b, _mm_srli_si128(b, 4));    // u | v << 8 per 16-bit lane
                unsigned int m = unsigned(k.map[_mm_extract_epi16(midx, 0)]) |
                                 (unsigned(k.map[_mm_extract_epi16(midx, 1)]) << 8) |
                                 (unsigned(k.map[_mm_extract_epi16(midx, 2)]) << 16) |
                                 (unsigned(k.map[_mm_extract_epi16(midx, 3)]) << 24);
                __m128i mw = _mm_unpacklo_epi8(zero, _mm_cvtsi32_si128(int(m)));  // m x 256 per pixel
                mw = _mm_unpacklo_epi16(mw, mw);
                c01 = _mm_mulhi_epu16(c01, _mm_unpacklo_epi32(mw, mw));
                c23 = _mm_mulhi_epu16(c23, _mm_unpackhi_epi32(mw, mw));
            }
            __m128i texel = detail::Gather(k.tex, idx);
            __m128i t01 = _mm_unpacklo_epi8(texel, zero);
            __m128i t23 = _mm_unpackhi_epi8(texel, zero);
            if constexpr (kWeights) {
                const __m128i ones = _mm_set1_epi16(-1);
                __m128i i01 = _mm_shufflehi_epi16(_mm_shufflelo_epi16(l.m_W01, 0x00), 0x00);
                __m128i j01 = _mm_shufflehi_epi16(_mm_shufflelo_epi16(l.m_W01, 0x55), 0x55);
                __m128i i23 = _mm_shufflehi_epi16(_mm_shufflelo_epi16(l.m_W23, 0x00), 0x00);
                __m128i j23 = _mm_shufflehi_epi16(_mm_shufflelo_epi16(l.m_W23, 0x55), 0x55);
                __m128i k01 = _mm_sub_epi16(_mm_sub_epi16(ones, i01), j01);
                __m128i k23 = _mm_sub_epi16(_mm_sub_epi16(ones, i23), j23);
                __m128i texel2 = detail::Gather(k.tex2, idx);
                __m128i texel3 = detail::Gather(k.tex3, idx);
                t01 = _mm_add_epi16(_mm_add_epi16(_mm_mulhi_epu16(t01, i01),
                                                  _mm_mulhi_epu16(_mm_unpacklo_epi8(texel2, zero), j01)),
                                    _mm_mulhi_epu16(_mm_unpacklo_epi8(texel3, zero), k01));
                t23 = _mm_add_epi16(_mm_add_epi16(_mm_mulhi_epu16(t23, i23),
                                                  _mm_mulhi_epu16(_mm_unpackhi_epi8(texel2, zero), j23)),
                                    _mm_mulhi_epu16(_mm_unpackhi_epi8(texel3, zero), k23));
            }
            __m128i s01 = _mm_mulhi_epu16(t01, c01);
            __m128i s23 = _mm_mulhi_epu16(t23, c23);
            if constexpr (Fog) {
                s01 = _mm_adds_epu16(s01, _mm_srli_epi16(l.m_F01, 8));
                s23 = _mm_adds_epu16(s23, _mm_srli_epi16(l.m_F23, 8));
            }
            src = _mm_packus_epi16(s01, s23);
            if constexpr (Transparent) mask = _mm_andnot_si128(_mm_cmpeq_epi32(texel, zero), mask);
        }
        if constexpr (Blend == BlendMode_TexelAlpha)
            mask = _mm_andnot_si128(_mm_cmpeq_epi32(_mm_srli_epi32(src, 24), zero), mask);

        int bits = 15;
        if constexpr (!Full || DepthTest || kPixelMask) {
            bits = _mm_movemask_ps(_mm_castsi128_ps(mask));
            if constexpr (kPixelMask || !DepthTest)
                if (bits == 0) return;
        }
        if constexpr (ColourWrite) {
            __m128i out = src, dst = zero;
            if constexpr (Blend != BlendMode_Opaque) {
                dst = _mm_load_si128(reinterpret_cast<const __m128i*>(cp));
                const __m128i c256 = _mm_set1_epi16(256);
                __m128i s01 = _mm_unpacklo_epi8(src, zero), s23 = _mm_unpackhi_epi8(src, zero);
                __m128i d01 = _mm_unpacklo_epi8(dst, zero), d23 = _mm_unpackhi_epi8(dst, zero);
                if constexpr (Blend == BlendMode_TexelAlpha) {
                    __m128i a01 = _mm_shufflehi_epi16(_mm_shufflelo_epi16(s01, 0xFF), 0xFF);
                    __m128i a23 = _mm_shufflehi_epi16(_mm_shufflelo_epi16(s23, 0xFF), 0xFF);
                    __m128i o01 = _mm_srli_epi16(_mm_add_epi16(_mm_mullo_epi16(d01, _mm_sub_epi16(c256, a01)),
                                                               _mm_mullo_epi16(s01, a01)),
                                                 8);
                    __m128i o23 = _mm_srli_epi16(_mm_add_epi16(_mm_mullo_epi16(d23, _mm_sub_epi16(c256, a23)),
                                                               _mm_mullo_epi16(s23, a23)),
                                                 8);
                    out = _mm_packus_epi16(o01, o23);
                } else {
                    __m128i a256 = _mm_slli_epi16(k.alpha16, 8);
                    __m128i ia = _mm_sub_epi16(c256, k.alpha16);
                    __m128i o01 = _mm_adds_epu16(_mm_mulhi_epu16(s01, a256),
                                                 _mm_mulhi_epu16(_mm_slli_epi16(d01, 8), ia));
                    __m128i o23 = _mm_adds_epu16(_mm_mulhi_epu16(s23, a256),
                                                 _mm_mulhi_epu16(_mm_slli_epi16(d23, 8), ia));
                    out = _mm_packus_epi16(o01, o23);
                }
            }
            if (bits == 15) {
                _mm_store_si128(reinterpret_cast<__m128i*>(cp), out);
            } else {
                if constexpr (Blend == BlendMode_Opaque) dst = _mm_load_si128(reinterpret_cast<const __m128i*>(cp));
                _mm_store_si128(reinterpret_cast<__m128i*>(cp),
                                _mm_or_si128(_mm_and_si128(mask, out), _mm_andnot_si128(mask, dst)));
            }
        }
        if constexpr (kStoreDepth) {
            if (bits == 15) {
                _mm_storeu_ps(dp, l.m_Z);
            } else {
                __m128 m = _mm_castsi128_ps(mask);
                _mm_storeu_ps(dp, _mm_or_ps(_mm_and_ps(m, l.m_Z), _mm_andnot_ps(m, zold)));
            }
        }
    }

    static RAST_INLINE void Advance(HorizontalLine_s& l) {
        if constexpr (DepthTest || kTex) l.m_Z = _mm_add_ps(l.m_Z, l.m_DZ4);
        if constexpr (kColour) {
            l.m_C01 = _mm_add_epi16(l.m_C01, l.m_DC4);
            l.m_C23 = _mm_add_epi16(l.m_C23, l.m_DC4);
        }
        if constexpr (Fog) {
            l.m_F01 = _mm_add_epi16(l.m_F01, l.m_DF4);
            l.m_F23 = _mm_add_epi16(l.m_F23, l.m_DF4);
        }
        if constexpr (kTex) {
            l.m_U = _mm_add_ps(l.m_U, l.m_DU4);
            l.m_V = _mm_add_ps(l.m_V, l.m_DV4);
        }
        if constexpr (kWeights) {
            l.m_W01 = _mm_add_epi16(l.m_W01, l.m_DW4);
            l.m_W23 = _mm_add_epi16(l.m_W23, l.m_DW4);
        }
    }

    // Fills one span: a masked head group when the first pixel is not on a
    // 16-byte boundary, whole groups, and a masked tail group.
    static RAST_INLINE void RenderHLine(const Consts& k, HorizontalLine_s& l) {
        unsigned int* cp = l.m_pColour;
        float* dp = l.m_pDepth;
        int n = l.m_Count;
        if (l.m_Lead) {
            int a = 4 - l.m_Lead;
            __m128i m = _mm_load_si128(reinterpret_cast<const __m128i*>(UnalignedMasks[0][l.m_Lead - 1]));
            if (n < a)
                m = _mm_and_si128(m, _mm_load_si128(reinterpret_cast<const __m128i*>(RightClippingMasks[a - n - 1])));
            Group<false>(k, l, m, cp, dp);
            n -= a;
            if (n <= 0) return;
            Advance(l);
            cp += 4;
            dp += 4;
        }
        const __m128i all = _mm_set1_epi32(-1);
        for (; n >= 4; n -= 4) {
            Group<true>(k, l, all, cp, dp);
            Advance(l);
            cp += 4;
            dp += 4;
        }
        if (n > 0)
            Group<false>(k, l, _mm_load_si128(reinterpret_cast<const __m128i*>(UnalignedMasks[1][n - 1])), cp, dp);
    }

    static RAST_INLINE void RenderHalfTriangle(HalfTriangle_s& h) {
        int row = h.m_Row;
        int count = h.m_RowCount;
        __m128 edges = h.m_Edges;
        const __m128 esteps = h.m_EdgeSteps;
        // attributes a mode does not use are never set, so only the used ones are read
        __m128i ec = _mm_setzero_si128(), fe = ec, we = ec;
        __m128 te = _mm_setzero_ps();
        if constexpr (kColour) ec = h.m_EdgeColours;
        if constexpr (Fog) fe = h.m_FogEdges;
        if constexpr (kWeights) we = h.m_WeightEdges;
        if constexpr (kTex) te = h.m_TexEdges;
        const int cx0 = h.m_ClipX0, cx1 = h.m_ClipX1;
        const intptr_t pitch = m_ScreenPitch;

        if constexpr (Shade == ShadeMode_Mask) {
            unsigned char* base = reinterpret_cast<unsigned char*>(m_pColourBuffer);
            for (; count > 0; --count, ++row) {
                __m128i xs = _mm_cvttps_epi32(detail::ClampCoord(_mm_shuffle_ps(edges, edges, _MM_SHUFFLE(2, 0, 2, 0))));
                int xl = _mm_cvtsi128_si32(xs);
                int xr = _mm_cvtsi128_si32(_mm_srli_si128(xs, 4));
                if (xl < cx0) xl = cx0;
                if (xr > cx1) xr = cx1;
                if (xr > xl) std::memset(base + intptr_t(row) * pitch + xl, 1, size_t(xr - xl));
                edges = _mm_add_ps(edges, esteps);
            }
        } else {
            Consts k;
            if constexpr (Shade == ShadeMode_Flat) k.flat = _mm_set1_epi32(int(h.m_FlatColour));
            if constexpr (Blend == BlendMode_TriangleAlpha) k.alpha16 = _mm_set1_epi32(int(h.m_Alpha));
            if constexpr (TexTransform) {
                k.offU = detail::Bcast<0>(h.m_TexOffset);
                k.offV = detail::Bcast<1>(h.m_TexOffset);
            }
            if constexpr (MapMod) {
                k.mapShift = h.m_MapShift;
                k.map = h.m_pMap;
            }
            if constexpr (kTex) k.tex = h.m_pTexture;
            if constexpr (kWeights) {
                k.tex2 = h.m_pTexture2;
                k.tex3 = h.m_pTexture3;
            }
            __m128i ecs = ec, fs = ec, ws = ec;
            __m128 ts = te;
            if constexpr (kColour) ecs = h.m_EdgeColourSteps;
            if constexpr (Fog) fs = h.m_FogSteps;
            if constexpr (kWeights) ws = h.m_WeightSteps;
            if constexpr (kTex) ts = h.m_TexSteps;
            const __m128 four = _mm_set1_ps(4.0f);
            unsigned int* const cbuf = m_pColourBuffer;
            float* const dbuf = m_pDepthBuffer;
            for (; count > 0; --count, ++row) {
                __m128i xs = _mm_cvtps_epi32(detail::ClampCoord(_mm_shuffle_ps(edges, edges, _MM_SHUFFLE(2, 0, 2, 0))));
                const int xL = _mm_cvtsi128_si32(xs);
                const int xR = _mm_cvtsi128_si32(_mm_srli_si128(xs, 4));
                const int xStart = xL > cx0 ? xL : cx0;
                const int xEnd = xR < cx1 ? xR : cx1;
                if (xEnd > xStart) {
                    HorizontalLine_s l;
                    const intptr_t offset = intptr_t(row) * pitch + xStart;
                    unsigned int* p = cbuf + offset;
                    const int lead = int((reinterpret_cast<uintptr_t>(p) >> 2) & 3);
                    l.m_pColour = p - lead;
                    if constexpr (DepthTest) {
                        l.m_pDepth = dbuf + offset - lead;
                        _mm_prefetch(reinterpret_cast<const char*>(dbuf + offset), _MM_HINT_T0);
                    } else {
                        l.m_pDepth = nullptr;
                    }
                    _mm_prefetch(reinterpret_cast<const char*>(p), _MM_HINT_T0);
                    l.m_Count = xEnd - xStart;
                    l.m_Lead = lead;
                    __m128 inv = _mm_rcp_ss(_mm_set_ss(float(xR - xL)));
                    inv = _mm_shuffle_ps(inv, inv, 0);
                    const int s = xStart - xL;
                    const __m128 sf = _mm_set1_ps(float(s));
                    const __m128 lanes = _mm_load_ps(LeadLanes[lead]);
                    if constexpr (DepthTest || kTex) {
                        __m128 zl = detail::Bcast<1>(edges);
                        __m128 dz = _mm_mul_ps(_mm_sub_ps(detail::Bcast<3>(edges), zl), inv);
                        __m128 z0 = _mm_add_ps(zl, _mm_mul_ps(dz, sf));
                        l.m_Z = _mm_add_ps(z0, _mm_mul_ps(dz, lanes));
                        l.m_DZ4 = _mm_mul_ps(dz, four);
                    }
                    if constexpr (kTex) {
                        __m128 duv = _mm_mul_ps(_mm_sub_ps(_mm_shuffle_ps(te, te, _MM_SHUFFLE(3, 2, 3, 2)), te), inv);
                        __m128 uv0 = _mm_add_ps(te, _mm_mul_ps(duv, sf));
                        __m128 du = detail::Bcast<0>(duv), dv = detail::Bcast<1>(duv);
                        l.m_U = _mm_add_ps(detail::Bcast<0>(uv0), _mm_mul_ps(du, lanes));
                        l.m_V = _mm_add_ps(detail::Bcast<1>(uv0), _mm_mul_ps(dv, lanes));
                        l.m_DU4 = _mm_mul_ps(du, four);
                        l.m_DV4 = _mm_mul_ps(dv, four);
                    }
                    if constexpr (kColour) detail::InterpU16(ec, inv, s - lead, l.m_C01, l.m_C23, l.m_DC4);
                    if constexpr (Fog) detail::InterpU16(fe, inv, s - lead, l.m_F01, l.m_F23, l.m_DF4);
                    if constexpr (kWeights) detail::InterpU16(we, inv, s - lead, l.m_W01, l.m_W23, l.m_DW4);
                    RenderHLine(k, l);
                }
                edges = _mm_add_ps(edges, esteps);
                if constexpr (kColour) ec = _mm_add_epi16(ec, ecs);
                if constexpr (Fog) fe = _mm_add_epi16(fe, fs);
                if constexpr (kTex) te = _mm_add_ps(te, ts);
                if constexpr (kWeights) we = _mm_add_epi16(we, ws);
            }
        }
        h.m_Row = row;
        h.m_RowCount = 0;
        h.m_Edges = edges;
        if constexpr (kColour) h.m_EdgeColours = ec;
        if constexpr (Fog) h.m_FogEdges = fe;
        if constexpr (kTex) h.m_TexEdges = te;
        if constexpr (kWeights) h.m_WeightEdges = we;
    }
};

namespace detail {

// The per-vertex attributes of set-up: position, colour, fog term, texture
// coordinates divided by depth, blend weights.
struct Vertex_s {
    __m128 p, c, f, t, w;
};

// Attribute-wise arithmetic over the attributes a mode carries besides the
// position: colour (Gouraud and up), fog term, texture coordinates, blend
// weights.
template <ShadeMode_e Shade, FogMode_e Fog, class Op>
RAST_INLINE Vertex_s VertexOp(const Vertex_s& a, const Vertex_s& b, Op op) {
    Vertex_s r;
    r.p = op(a.p, b.p);
    if constexpr (Shade >= ShadeMode_Gouraud) r.c = op(a.c, b.c);
    if constexpr (Fog != FogMode_None) r.f = op(a.f, b.f);
    if constexpr (Shade >= ShadeMode_Textured) r.t = op(a.t, b.t);
    if constexpr (Shade == ShadeMode_TextureBlend) r.w = op(a.w, b.w);
    return r;
}

// Per-row gradient from vertex a to vertex b: (b - a) * r.
template <ShadeMode_e Shade, FogMode_e Fog>
RAST_INLINE Vertex_s Gradient(const Vertex_s& a, const Vertex_s& b, __m128 r) {
    return VertexOp<Shade, Fog>(b, a, [r](__m128 x, __m128 y) { return _mm_mul_ps(_mm_sub_ps(x, y), r); });
}

// a advanced by n rows of gradient g: a + g * n.
template <ShadeMode_e Shade, FogMode_e Fog>
RAST_INLINE Vertex_s Advance(const Vertex_s& a, const Vertex_s& g, __m128 n) {
    return VertexOp<Shade, Fog>(a, g, [n](__m128 x, __m128 y) { return _mm_add_ps(x, _mm_mul_ps(y, n)); });
}

template <ShadeMode_e Shade, bool TexTransform, FogMode_e Fog>
RAST_INLINE void LoadVertex(const Triangle_s& t, int i, Vertex_s& v) {
    v.p = t.m_Positions[i];
    if constexpr (Shade >= ShadeMode_Gouraud) {
        const __m128 one = _mm_set1_ps(1.0f);
        v.c = _mm_cvtepi32_ps(_mm_unpacklo_epi16(t.m_Colours[i], _mm_setzero_si128()));
        if constexpr (Fog == FogMode_Height || Fog == FogMode_Both) {
            __m128 h = _mm_set1_ps(reinterpret_cast<const float*>(&t.m_HeightFog)[i]);
            v.c = _mm_mul_ps(v.c, _mm_sub_ps(one, h));
            v.f = _mm_mul_ps(t.m_HeightFogColour, h);
        }
        if constexpr (Fog == FogMode_Distance || Fog == FogMode_Both) {
            __m128 d = _mm_mul_ss(_mm_sub_ss(Bcast<2>(v.p), _mm_set_ss(m_DistanceFogStart)),
                                  _mm_set_ss(m_InvDistanceFogRange));
            d = _mm_min_ss(_mm_max_ss(d, _mm_setzero_ps()), one);
            d = Bcast<0>(d);
            __m128 omd = _mm_sub_ps(one, d);
            v.c = _mm_mul_ps(v.c, omd);
            if constexpr (Fog == FogMode_Both)
                v.f = _mm_add_ps(_mm_mul_ps(v.f, omd), _mm_mul_ps(m_DistanceFogColour, d));
            else
                v.f = _mm_mul_ps(m_DistanceFogColour, d);
        }
    }
    if constexpr (Shade >= ShadeMode_Textured) {
        __m128 tc = t.m_TexCoords[i];
        if constexpr (TexTransform) tc = _mm_mul_ps(tc, t.m_TexScale);
        v.t = _mm_mul_ps(tc, _mm_rcp_ps(Bcast<2>(v.p)));
    }
    if constexpr (Shade == ShadeMode_TextureBlend) v.w = _mm_load_ps(RasterTables_c::IJ[i]);
}

}  // namespace detail

// Lower half: the long edge continues, the short side restarts at the middle
// vertex (advanced by `carried` rows).
template <ShadeMode_e Shade, bool TexTransform, FogMode_e Fog>
RAST_INLINE void SetLowerHalf(HalfTriangle_s& h, bool longLeft, const detail::Vertex_s& M, const detail::Vertex_s& gD,
                              int carried) {
    using namespace detail;
    constexpr bool kColour = Shade >= ShadeMode_Gouraud;
    constexpr bool kFog = Fog != FogMode_None;
    constexpr bool kTex = Shade >= ShadeMode_Textured;
    constexpr bool kWeights = Shade == ShadeMode_TextureBlend;
    const __m128 cf = _mm_set1_ps(float(carried));
    const Vertex_s s = Advance<Shade, Fog>(M, gD, cf);
    if (longLeft) {
        // short side is the right one: keep lanes 0,1 (float) / low half (16-bit)
        h.m_Edges = _mm_shuffle_ps(h.m_Edges, s.p, _MM_SHUFFLE(2, 0, 1, 0));
        h.m_EdgeSteps = _mm_shuffle_ps(h.m_EdgeSteps, gD.p, _MM_SHUFFLE(2, 0, 1, 0));
        if constexpr (kColour) {
            h.m_EdgeColours = _mm_unpacklo_epi64(h.m_EdgeColours, ToU16(s.c, s.c));
            h.m_EdgeColourSteps = _mm_unpacklo_epi64(h.m_EdgeColourSteps, ToI16(gD.c, gD.c));
        }
        if constexpr (kFog) {
            h.m_FogEdges = _mm_unpacklo_epi64(h.m_FogEdges, ToU16(s.f, s.f));
            h.m_FogSteps = _mm_unpacklo_epi64(h.m_FogSteps, ToI16(gD.f, gD.f));
        }
        if constexpr (kTex) {
            h.m_TexEdges = _mm_shuffle_ps(h.m_TexEdges, s.t, _MM_SHUFFLE(1, 0, 1, 0));
            h.m_TexSteps = _mm_shuffle_ps(h.m_TexSteps, gD.t, _MM_SHUFFLE(1, 0, 1, 0));
        }
        if constexpr (kWeights) {
            h.m_WeightEdges = _mm_unpacklo_epi64(h.m_WeightEdges, ToU16(s.w, s.w));
            h.m_WeightSteps = _mm_unpacklo_epi64(h.m_WeightSteps, ToI16(gD.w, gD.w));
        }
    } else {
        // short side is the left one: replace lanes 0,1 / the low half
        auto low = [](__m128i keepHigh, __m128i newLow) {
            return _mm_castpd_si128(_mm_move_sd(_mm_castsi128_pd(keepHigh), _mm_castsi128_pd(newLow)));
        };
        h.m_Edges = _mm_shuffle_ps(s.p, h.m_Edges, _MM_SHUFFLE(3, 2, 2, 0));
        h.m_EdgeSteps = _mm_shuffle_ps(gD.p, h.m_EdgeSteps, _MM_SHUFFLE(3, 2, 2, 0));
        if constexpr (kColour) {
            h.m_EdgeColours = low(h.m_EdgeColours, ToU16(s.c, s.c));
            h.m_EdgeColourSteps = low(h.m_EdgeColourSteps, ToI16(gD.c, gD.c));
        }
        if constexpr (kFog) {
            h.m_FogEdges = low(h.m_FogEdges, ToU16(s.f, s.f));
            h.m_FogSteps = low(h.m_FogSteps, ToI16(gD.f, gD.f));
        }
        if constexpr (kTex) {
            h.m_TexEdges = _mm_shuffle_ps(s.t, h.m_TexEdges, _MM_SHUFFLE(3, 2, 1, 0));
            h.m_TexSteps = _mm_shuffle_ps(gD.t, h.m_TexSteps, _MM_SHUFFLE(3, 2, 1, 0));
        }
        if constexpr (kWeights) {
            h.m_WeightEdges = low(h.m_WeightEdges, ToU16(s.w, s.w));
            h.m_WeightSteps = low(h.m_WeightSteps, ToI16(gD.w, gD.w));
        }
    }
}


template <ShadeMode_e Shade, TexAddressMode_e AddrU, TexAddressMode_e AddrV, bool TexTransform, FogMode_e Fog,
          BlendMode_e Blend, bool Transparent, bool MapMod, bool DepthWrite, bool ColourWrite, bool DepthTest>
void RenderTriangle(const Triangle_s& t) {
    using namespace detail;
    typedef RenderHalfTriangle_c<Shade, AddrU, AddrV, TexTransform, Fog != FogMode_None, Blend, Transparent, MapMod,
                                 DepthWrite, ColourWrite, DepthTest>
        Half;
    constexpr bool kColour = Shade >= ShadeMode_Gouraud;
    constexpr bool kFog = Fog != FogMode_None;
    constexpr bool kTex = Shade >= ShadeMode_Textured;
    constexpr bool kWeights = Shade == ShadeMode_TextureBlend;

    if (ColourWrite && !m_pColourBuffer) return;
    if (DepthTest && !m_pDepthBuffer) return;

    const __m128 p0 = t.m_Positions[0], p1 = t.m_Positions[1], p2 = t.m_Positions[2];
    {
        // x, y or depth infinite or NaN: not drawn
        const __m128 ex = _mm_castsi128_ps(_mm_set1_epi32(0x7F800000));
        __m128 bad = _mm_or_ps(_mm_or_ps(_mm_cmpeq_ps(_mm_and_ps(p0, ex), ex), _mm_cmpeq_ps(_mm_and_ps(p1, ex), ex)),
                               _mm_cmpeq_ps(_mm_and_ps(p2, ex), ex));
        if (_mm_movemask_ps(bad) & 7) return;
    }
    ClipRect_s clip;
    if (!CurrentClip<Shade == ShadeMode_Mask>(clip)) return;

    // sort by y: strict comparisons, ties keep the order found
    const float y0 = _mm_cvtss_f32(Bcast<1>(p0)), y1 = _mm_cvtss_f32(Bcast<1>(p1)), y2 = _mm_cvtss_f32(Bcast<1>(p2));
    const float ys[3] = {y0, y1, y2};
    int iT = 0, iM = 1, iB = 2;
    if (y1 < y0) {
        iT = 1;
        iM = 0;
    }
    if (y2 < ys[iT]) {
        iB = iM;
        iM = iT;
        iT = 2;
    } else if (y2 < ys[iM]) {
        iB = iM;
        iM = 2;
    }
    __m128i yi = _mm_cvttps_epi32(ClampCoord(_mm_setr_ps(ys[iT], ys[iM], ys[iB], 0.0f)));
    const int yT = _mm_cvtsi128_si32(yi);
    const int yM = _mm_cvtsi128_si32(_mm_srli_si128(yi, 4));
    const int yB = _mm_cvtsi128_si32(_mm_srli_si128(yi, 8));
    if (yB <= clip.y0 || yT >= clip.y1 || yT == yB) return;

    if constexpr (Shade != ShadeMode_Mask) {
        // Small triangles: fetch their rows' cache lines now, so that the
        // memory latency overlaps the set-up arithmetic below.
        const int r0 = yT > clip.y0 ? yT : clip.y0, r1 = yB < clip.y1 ? yB : clip.y1;
        if (r1 - r0 <= kPrefetchRows) {
            __m128 xr = _mm_unpacklo_ps(_mm_min_ps(_mm_min_ps(p0, p1), p2), _mm_max_ps(_mm_max_ps(p0, p1), p2));
            __m128i xi = _mm_cvttps_epi32(ClampCoord(xr));
            int xa = _mm_cvtsi128_si32(xi), xb = _mm_cvtsi128_si32(_mm_srli_si128(xi, 4)) + 1;
            xa = xa > clip.x0 ? xa : clip.x0;
            xb = xb < clip.x1 - 1 ? xb : clip.x1 - 1;
            if (xb >= xa) {
                const intptr_t pitch = m_ScreenPitch;
                // the row's last pixel only when it lies in another cache line
                const bool two = ((reinterpret_cast<uintptr_t>(m_pColourBuffer + xa) ^
                                   reinterpret_cast<uintptr_t>(m_pColourBuffer + xb)) & ~uintptr_t(63)) != 0 ||
                                 (pitch & 15) != 0;
                for (int row = r0; row < r1; ++row) {
                    const intptr_t o = intptr_t(row) * pitch;
                    if constexpr (ColourWrite) {
                        _mm_prefetch(reinterpret_cast<const char*>(m_pColourBuffer + o + xa), _MM_HINT_T0);
                        if (two) _mm_prefetch(reinterpret_cast<const char*>(m_pColourBuffer + o + xb), _MM_HINT_T0);
                    }
                    if constexpr (DepthTest) {
                        _mm_prefetch(reinterpret_cast<const char*>(m_pDepthBuffer + o + xa), _MM_HINT_T0);
                        _mm_prefetch(reinterpret_cast<const char*>(m_pDepthBuffer + o + xb), _MM_HINT_T0);
                    }
                }
            }
        }
    }

    __m128 r = _mm_rcp_ps(_mm_max_ps(_mm_cvtepi32_ps(_mm_setr_epi32(yB - yT, yM - yT, yB - yM, 1)),
                                     _mm_set1_ps(1e-6f)));
    const __m128 rL = Bcast<0>(r), rU = Bcast<1>(r), rD = Bcast<2>(r);

    Vertex_s T, M, B;
    LoadVertex<Shade, TexTransform, Fog>(t, iT, T);
    LoadVertex<Shade, TexTransform, Fog>(t, iM, M);
    LoadVertex<Shade, TexTransform, Fog>(t, iB, B);

    // gradients: long edge (top-bottom), upper short (top-middle), lower short (middle-bottom)
    const Vertex_s gL = Gradient<Shade, Fog>(T, B, rL);
    const Vertex_s gU = Gradient<Shade, Fog>(T, M, rU);
    const Vertex_s gD = Gradient<Shade, Fog>(M, B, rD);
    const bool longLeft = _mm_comigt_ss(gU.p, gL.p) != 0;

    // upper half, clipped to the viewport rows
    const int start = yT > clip.y0 ? yT : clip.y0;
    const int end = yM < clip.y1 ? yM : clip.y1;
    const int count = end - start;
    const __m128 skip = _mm_set1_ps(float(start - yT));

    HalfTriangle_s h;
    h.m_Row = start;
    h.m_RowCount = count;
    h.m_ClipX0 = clip.x0;
    h.m_ClipX1 = clip.x1;
    h.m_FlatColour = t.m_FlatColour;
    h.m_Alpha = t.m_Alpha;
    h.m_pTexture = kTex ? t.m_pTexture : nullptr;
    h.m_pTexture2 = kWeights ? t.m_pTexture2 : nullptr;
    h.m_pTexture3 = kWeights ? t.m_pTexture3 : nullptr;
    h.m_pMap = MapMod ? t.m_pMap : nullptr;
    if constexpr (TexTransform) h.m_TexOffset = t.m_TexOffset;
    if constexpr (MapMod) h.m_MapShift = t.m_MapShift;
    {
        // long and short edge on the start row
        const Vertex_s sL = Advance<Shade, Fog>(T, gL, skip);
        const Vertex_s sU = Advance<Shade, Fog>(T, gU, skip);
        const Vertex_s& l = longLeft ? sL : sU;
        const Vertex_s& rr = longLeft ? sU : sL;
        const Vertex_s& gl = longLeft ? gL : gU;
        const Vertex_s& gr = longLeft ? gU : gL;
        h.m_Edges = _mm_shuffle_ps(l.p, rr.p, _MM_SHUFFLE(2, 0, 2, 0));
        h.m_EdgeSteps = _mm_shuffle_ps(gl.p, gr.p, _MM_SHUFFLE(2, 0, 2, 0));
        if constexpr (kColour) {
            h.m_EdgeColours = ToU16(l.c, rr.c);
            h.m_EdgeColourSteps = ToI16(gl.c, gr.c);
        }
        if constexpr (kFog) {
            h.m_FogEdges = ToU16(l.f, rr.f);
            h.m_FogSteps = ToI16(gl.f, gr.f);
        }
        if constexpr (kTex) {
            h.m_TexEdges = _mm_shuffle_ps(l.t, rr.t, _MM_SHUFFLE(1, 0, 1, 0));
            h.m_TexSteps = _mm_shuffle_ps(gl.t, gr.t, _MM_SHUFFLE(1, 0, 1, 0));
        }
        if constexpr (kWeights) {
            h.m_WeightEdges = ToU16(l.w, rr.w);
            h.m_WeightSteps = ToI16(gl.w, gr.w);
        }
    }
    // One call site for both halves, so the span routine is inlined once.
    const bool upper = count >= 1;
    const int lowRow = upper ? end : start;
    const int carried = upper ? 0 : -count;  // rows the lower half skips into its short edge
    const int end2 = yB < clip.y1 ? yB : clip.y1;
    const int count2 = end2 - lowRow;
    for (int pass = upper ? 0 : 1; pass < 2; ++pass) {
        if (pass == 1) {
            if (count2 <= 0) return;
            SetLowerHalf<Shade, TexTransform, Fog>(h, longLeft, M, gD, carried);
            h.m_Row = lowRow;
            h.m_RowCount = count2;
        }
        Half::RenderHalfTriangle(h);
    }
}

}  // namespace Rasterizer_n
