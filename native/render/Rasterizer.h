// Triangle rasteriser: the per-triangle record, the mode enumerations and the
// RenderTriangle family. One instantiation exists per mode combination in use
// (see RasterizerVariants.cpp); the template bodies live in
// RasterizerImpl.h and are compiled only by the instantiation files, so a
// combination that is not instantiated fails to link.
#pragma once

#include <emmintrin.h>

#include "render/RasterizerState.h"

namespace Rasterizer_n {

enum ShadeMode_e {
    ShadeMode_Mask = -1,        // byte 1 into an 8-bit target (shadow masks)
    ShadeMode_Flat = 0,         // the triangle's flat ARGB colour
    ShadeMode_Gouraud = 1,      // per-vertex colours interpolated
    ShadeMode_Textured = 2,     // texel modulated by the interpolated colour
    ShadeMode_TextureBlend = 3  // three textures weighted per pixel, then modulated
};

enum TexAddressMode_e {
    TexAddress_Wrap = 0,    // coordinate & 127
    TexAddress_Repeat = 1,  // same as wrap
    TexAddress_Clamp = 2    // coordinate clamped to [0, 127] before truncation
};

enum FogMode_e { FogMode_None = 0, FogMode_Height = 1, FogMode_Distance = 2, FogMode_Both = 3 };

enum BlendMode_e {
    BlendMode_Opaque = 0,
    BlendMode_TexelAlpha = 2,    // by the shaded texel's alpha; alpha 0 is not drawn
    BlendMode_TriangleAlpha = 3  // by the triangle's constant alpha
};

// One triangle as the callers hand it over. Fields a mode does not use are
// not read.
struct alignas(16) Triangle_s {
    __m128 m_Positions[3];    // screen x, screen y, depth, w
    __m128i m_Colours[3];     // B, G, R, A as unsigned 16-bit (channel x 256) in the low 64 bits
    __m128 m_TexCoords[3];    // u, v in texels in lanes 0 and 1
    __m128 m_TexScale;        // texture transform: multiplied into u, v before set-up
    __m128 m_TexOffset;       // texture transform: (u, v, u, v) added per pixel
    __m128i m_MapShift;       // shift count of the integer coordinates for the 8-bit map
    __m128 m_HeightFog;       // height-fog amount of vertex 0, 1, 2 in lanes 0..2
    __m128 m_HeightFogColour; // B, G, R, A x 256
    unsigned int m_FlatColour;  // ARGB (flat shading)
    unsigned int m_Alpha;       // a x 0x10001 (triangle alpha blending)
    const unsigned int* m_pTexture;   // 128 x 128 texels, row stride 256 (vertex 0's in blend mode)
    const unsigned int* m_pTexture2;  // vertex 1's texture (texture blend)
    const unsigned int* m_pTexture3;  // vertex 2's texture (texture blend)
    const unsigned char* m_pMap;      // 8-bit map, row stride 256 (map modulation)
};

// One half of a triangle as the span routine consumes it. The span routine
// advances the edges by one row step per row drawn (empty spans included) so
// the long edge continues into the lower half.
struct alignas(16) HalfTriangle_s {
    int m_Row;          // screen row of the next span
    int m_RowCount;     // spans still to draw
    unsigned int m_FlatColour;
    unsigned int m_Alpha;
    const unsigned int* m_pTexture;
    const unsigned int* m_pTexture2;
    const unsigned int* m_pTexture3;
    const unsigned char* m_pMap;
    int m_ClipX0, m_ClipX1;  // columns that may be written: [m_ClipX0, m_ClipX1)
    __m128 m_Edges;          // left x, left depth, right x, right depth
    __m128 m_EdgeSteps;
    __m128i m_EdgeColours;   // B, G, R, A left, then right (unsigned 16-bit)
    __m128i m_EdgeColourSteps;
    __m128 m_TexEdges;       // u/d, v/d left, then right
    __m128 m_TexSteps;
    __m128i m_FogEdges;      // fog term, same layout as the colours
    __m128i m_FogSteps;
    __m128i m_WeightEdges;   // blend weights (I, J, I, J) left, then right
    __m128i m_WeightSteps;
    __m128 m_TexOffset;
    __m128i m_MapShift;
};

template <ShadeMode_e Shade, TexAddressMode_e AddrU, TexAddressMode_e AddrV, bool TexTransform, FogMode_e Fog,
          BlendMode_e Blend, bool Transparent, bool MapMod, bool DepthWrite, bool ColourWrite, bool DepthTest>
void RenderTriangle(const Triangle_s& t);

// The table of every instantiation, for dispatch by mode values and for tests.
typedef void (*RenderTriangleFn)(const Triangle_s&);
struct RasterVariant_s {
    signed char m_Shade, m_AddrU, m_AddrV;
    bool m_TexTransform;
    signed char m_Fog, m_Blend;
    bool m_Transparent, m_MapMod, m_DepthWrite, m_ColourWrite, m_DepthTest;
    RenderTriangleFn m_Render;
};
// All instantiations (182), in no particular order.
int VariantCount();
const RasterVariant_s& Variant(int i);
// The instantiation for a mode tuple, or null when that tuple is not built.
RenderTriangleFn FindVariant(int shade, int addrU, int addrV, bool texTransform, int fog, int blend,
                             bool transparent, bool mapMod, bool depthWrite, bool colourWrite, bool depthTest);

}  // namespace Rasterizer_n

namespace Rasterizer_n {

// A Gouraud-shaded triangle in screen coordinates (depth 0) with ARGB vertex
// colours, drawn into the current targets: colour only, colour with the depth
// test, depth test only, or nothing when there is no buffer.
void RenderColouredTriangle(int x1, int y1, int x2, int y2, int x3, int y3, unsigned int colour1,
                            unsigned int colour2, unsigned int colour3);

}  // namespace Rasterizer_n
