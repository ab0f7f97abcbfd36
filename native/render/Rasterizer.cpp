// The table of RenderTriangle instantiations, gathered from the
// instantiation files.
#include "render/Rasterizer.h"

#include "jni/Exception.h"

namespace Rasterizer_n {

#define RASTER_GROUPS(X)                                                                                   \
    X(RasterVariantsFlat) X(RasterVariantsModelRepeatA) X(RasterVariantsModelRepeatB)                      \
        X(RasterVariantsModelClampA) X(RasterVariantsModelClampB) X(RasterVariantsTerrainPlain)            \
            X(RasterVariantsTerrainMap) X(RasterVariantsBlendPlain) X(RasterVariantsBlendMap)

#define RASTER_DECLARE(Name)                  \
    extern const RasterVariant_s Name[];      \
    extern const int Name##Count;
RASTER_GROUPS(RASTER_DECLARE)
#undef RASTER_DECLARE

namespace {
struct Group_s {
    const RasterVariant_s* entries;
    const int* count;
};
#define RASTER_GROUP_ENTRY(Name) {Name, &Name##Count},
const Group_s kGroups[] = {RASTER_GROUPS(RASTER_GROUP_ENTRY)};
#undef RASTER_GROUP_ENTRY
}  // namespace

int VariantCount() {
    int n = 0;
    for (const Group_s& g : kGroups) n += *g.count;
    return n;
}

const RasterVariant_s& Variant(int i) {
    for (const Group_s& g : kGroups) {
        if (i < *g.count) return g.entries[i];
        i -= *g.count;
    }
    throw new IllegalArgumentException("no such rasteriser variant");
}

RenderTriangleFn FindVariant(int shade, int addrU, int addrV, bool texTransform, int fog, int blend,
                             bool transparent, bool mapMod, bool depthWrite, bool colourWrite, bool depthTest) {
    for (const Group_s& g : kGroups)
        for (int i = 0; i < *g.count; ++i) {
            const RasterVariant_s& v = g.entries[i];
            if (v.m_Shade == shade && v.m_AddrU == addrU && v.m_AddrV == addrV && v.m_TexTransform == texTransform &&
                v.m_Fog == fog && v.m_Blend == blend && v.m_Transparent == transparent && v.m_MapMod == mapMod &&
                v.m_DepthWrite == depthWrite && v.m_ColourWrite == colourWrite && v.m_DepthTest == depthTest)
                return v.m_Render;
        }
    return nullptr;
}

static __m128i SpreadColour(unsigned int c) {
    // bytes B, G, R, A from the least significant up, each shifted left by 8
    __m128i b = _mm_unpacklo_epi8(_mm_setzero_si128(), _mm_cvtsi32_si128(int(c)));
    return b;
}

void RenderColouredTriangle(int x1, int y1, int x2, int y2, int x3, int y3, unsigned int colour1,
                            unsigned int colour2, unsigned int colour3) {
    Triangle_s t;
    t.m_Positions[0] = _mm_setr_ps(float(x1), float(y1), 0.0f, 1.0f);
    t.m_Positions[1] = _mm_setr_ps(float(x2), float(y2), 0.0f, 1.0f);
    t.m_Positions[2] = _mm_setr_ps(float(x3), float(y3), 0.0f, 1.0f);
    t.m_Colours[0] = SpreadColour(colour1);
    t.m_Colours[1] = SpreadColour(colour2);
    t.m_Colours[2] = SpreadColour(colour3);
    const bool colour = m_pColourBuffer != nullptr, depth = m_pDepthBuffer != nullptr;
    if (colour && !depth)
        RenderTriangle<ShadeMode_Gouraud, TexAddress_Wrap, TexAddress_Wrap, false, FogMode_None, BlendMode_Opaque,
                       false, false, false, true, false>(t);
    else if (colour && depth)
        RenderTriangle<ShadeMode_Gouraud, TexAddress_Wrap, TexAddress_Wrap, false, FogMode_None, BlendMode_Opaque,
                       false, false, false, true, true>(t);
    else if (depth)
        RenderTriangle<ShadeMode_Gouraud, TexAddress_Wrap, TexAddress_Wrap, false, FogMode_None, BlendMode_Opaque,
                       false, false, false, false, true>(t);
}

}  // namespace Rasterizer_n
