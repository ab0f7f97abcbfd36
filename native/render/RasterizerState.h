// Rasteriser globals: current targets, viewport transform, trivial-reject
// culler and fog parameters. Written by the toolkit's state calls, read by
// every triangle, span and projection routine.
#pragma once

#include <emmintrin.h>

#include "render/Matrix.h"

namespace Rasterizer_n {

struct Viewport_s {
    int X;
    int Y;
    int Width;
    int Height;
    float MinZ;
    float MaxZ;
};

extern unsigned int* m_pColourBuffer;  // 32-bit ARGB (an 8-bit mask while a shadow is rasterised)
extern float* m_pDepthBuffer;
extern int m_ScreenPitch;  // row stride of both buffers, in elements
// Size of the current target in pixels. Triangles are drawn only inside the
// viewport and inside this rectangle, so a viewport larger than the target
// never writes outside the buffers.
extern int m_TargetWidth;
extern int m_TargetHeight;
extern float m_ZNear;
extern float m_ZFar;
extern int m_ZWriteEnabled;
extern float m_DistanceFogStart;
extern float m_InvDistanceFogRange;
extern __m128 m_DistanceFogColour;  // B, G, R, A, each channel x 256
extern __m128 m_HeightFogColour;    // same layout
extern __m128i m_TriangleCuller;    // 8 x int16, see RecomputeCuller
extern Viewport_s m_Viewport;
extern __m128 m_ViewportMul;
extern __m128 m_ViewportAdd;

// Stores the buffer pointers, pitch and target size (the viewport is not touched).
void SetTarget(unsigned int* colour, float* depth, int pitch, int width, int height);
void SetZWrite(bool enabled);
Viewport_s* GetViewport();
void SetViewport(const Viewport_s& vp);
void RecomputeCuller();
void RecomputeDistanceFogParams(float start, unsigned int colour);

// Colour word spread into four float lanes (B, G, R, A), each byte x 256.
__m128 ColourToFogVector(unsigned int colour);

// Viewport transform of a clip-space vector: x, y, z divided by w with the
// sign of z kept, then scaled and offset into screen space.
inline __m128 ToScreen(__m128 clip) {
    __m128 w = _mm_shuffle_ps(clip, clip, _MM_SHUFFLE(3, 3, 3, 3));
    __m128 ndc = _mm_div_ps(clip, w);
    ndc = _mm_or_ps(ndc, _mm_and_ps(clip, Matrix_c::ZSignMask));
    return _mm_add_ps(_mm_mul_ps(ndc, m_ViewportMul), m_ViewportAdd);
}

// Culler lanes of one screen-space vertex (sx, sy, depth): (sx, sy, zq, zq) with
// zq = depth * 32767, converted by truncation (models, terrain) or rounding to
// nearest (particles), packed with signed saturation. Returns the per-vertex
// outside mask; AND the masks of a triangle's vertices and pass the result to
// CullerAccepts.
template <bool Round>
inline __m128i CullerVertexMask(__m128 screen) {
    const __m128 scale = _mm_setr_ps(1.0f, 1.0f, 32767.0f, 32767.0f);
    __m128 s = _mm_mul_ps(_mm_shuffle_ps(screen, screen, _MM_SHUFFLE(2, 2, 1, 0)), scale);
    __m128i vi = Round ? _mm_cvtps_epi32(s) : _mm_cvttps_epi32(s);
    __m128i packed = _mm_packs_epi32(vi, vi);  // (sx, sy, zq, zq) twice
    __m128i above = _mm_cmpgt_epi16(packed, m_TriangleCuller);          // lanes 0..3: beyond the far bounds
    __m128i below = _mm_cmpgt_epi16(_mm_setzero_si128(), packed);       // lanes 4..7: below 0
    const __m128i low = _mm_setr_epi32(-1, -1, 0, 0);
    return _mm_or_si128(_mm_and_si128(above, low), _mm_andnot_si128(low, below));
}

// True when the AND of the vertices' masks lets the primitive through: every
// vertex lies in front of the near depth bound and no bound has all vertices
// outside it.
inline bool CullerAccepts(__m128i andedMask) { return _mm_movemask_epi8(andedMask) == 0xC0; }

template <bool Round>
inline bool CullTriangle(__m128 s0, __m128 s1, __m128 s2) {
    __m128i m = _mm_and_si128(_mm_and_si128(CullerVertexMask<Round>(s0), CullerVertexMask<Round>(s1)),
                              CullerVertexMask<Round>(s2));
    return CullerAccepts(m);
}

}  // namespace Rasterizer_n
