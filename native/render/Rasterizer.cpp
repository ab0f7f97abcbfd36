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

}  // namespace Rasterizer_n
