// RenderTriangle instantiations: textured terrain without map modulation.
// Columns: shade, U, V, texture transform, fog, blend, transparent, map,
// depth write, colour write, depth test.
#include "render/RasterizerInst.h"

#define VARIANTS(X) \
    X( 2, 0, 0, 0, 0, 0, 0, 0, 1, 1, 0) \
    X( 2, 0, 0, 0, 0, 0, 0, 0, 1, 1, 1) \
    X( 2, 0, 0, 0, 1, 0, 0, 0, 1, 1, 0) \
    X( 2, 0, 0, 0, 1, 0, 0, 0, 1, 1, 1) \
    X( 2, 0, 0, 0, 2, 0, 0, 0, 1, 1, 0) \
    X( 2, 0, 0, 0, 2, 0, 0, 0, 1, 1, 1) \
    X( 2, 0, 0, 0, 3, 0, 0, 0, 1, 1, 0) \
    X( 2, 0, 0, 0, 3, 0, 0, 0, 1, 1, 1) \
    X( 2, 0, 0, 1, 0, 0, 0, 0, 1, 1, 0) \
    X( 2, 0, 0, 1, 0, 0, 0, 0, 1, 1, 1) \
    X( 2, 0, 0, 1, 1, 0, 0, 0, 1, 1, 0) \
    X( 2, 0, 0, 1, 1, 0, 0, 0, 1, 1, 1) \
    X( 2, 0, 0, 1, 2, 0, 0, 0, 1, 1, 0) \
    X( 2, 0, 0, 1, 2, 0, 0, 0, 1, 1, 1) \
    X( 2, 0, 0, 1, 3, 0, 0, 0, 1, 1, 0) \
    X( 2, 0, 0, 1, 3, 0, 0, 0, 1, 1, 1) \
    X( 2, 0, 0, 1, 0, 3, 0, 0, 1, 1, 0) \
    X( 2, 0, 0, 0, 0, 3, 0, 0, 0, 1, 0) \
    X( 2, 0, 0, 1, 0, 3, 0, 0, 1, 1, 1) \
    X( 2, 0, 0, 0, 0, 3, 0, 0, 0, 1, 1) \
    X( 2, 0, 0, 1, 2, 3, 0, 0, 1, 1, 0) \
    X( 2, 0, 0, 0, 2, 3, 0, 0, 0, 1, 0) \
    X( 2, 0, 0, 1, 2, 3, 0, 0, 1, 1, 1) \
    X( 2, 0, 0, 0, 2, 3, 0, 0, 0, 1, 1) \

RASTER_VARIANT_GROUP(RasterVariantsTerrainPlain, VARIANTS)
