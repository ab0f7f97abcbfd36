// RenderTriangle instantiations: shadow masks, thick lines, depth-only faces, thread resource triangles and Gouraud faces (opaque and alpha).
// Columns: shade, U, V, texture transform, fog, blend, transparent, map,
// depth write, colour write, depth test.
#include "render/RasterizerInst.h"

#define VARIANTS(X) \
    X(-1, 0, 0, 0, 0, 0, 0, 0, 0, 1, 0) \
    X( 0, 0, 0, 0, 0, 0, 0, 0, 0, 1, 0) \
    X( 0, 0, 0, 0, 0, 0, 0, 0, 1, 0, 1) \
    X( 1, 0, 0, 0, 0, 0, 0, 0, 0, 1, 0) \
    X( 1, 0, 0, 0, 0, 0, 0, 0, 0, 1, 1) \
    X( 1, 0, 0, 0, 0, 0, 0, 0, 0, 0, 1) \
    X( 1, 0, 0, 0, 0, 0, 0, 0, 1, 1, 0) \
    X( 1, 0, 0, 0, 0, 0, 0, 0, 1, 1, 1) \
    X( 1, 0, 0, 0, 1, 0, 0, 0, 1, 1, 0) \
    X( 1, 0, 0, 0, 1, 0, 0, 0, 1, 1, 1) \
    X( 1, 0, 0, 0, 2, 0, 0, 0, 1, 1, 0) \
    X( 1, 0, 0, 0, 2, 0, 0, 0, 1, 1, 1) \
    X( 1, 0, 0, 0, 3, 0, 0, 0, 1, 1, 0) \
    X( 1, 0, 0, 0, 3, 0, 0, 0, 1, 1, 1) \
    X( 1, 0, 0, 0, 0, 3, 0, 0, 0, 1, 0) \
    X( 1, 0, 0, 0, 0, 3, 0, 0, 0, 1, 1) \
    X( 1, 0, 0, 0, 1, 3, 0, 0, 0, 1, 0) \
    X( 1, 0, 0, 0, 1, 3, 0, 0, 0, 1, 1) \
    X( 1, 0, 0, 0, 2, 3, 0, 0, 0, 1, 0) \
    X( 1, 0, 0, 0, 2, 3, 0, 0, 0, 1, 1) \
    X( 1, 0, 0, 0, 3, 3, 0, 0, 0, 1, 0) \
    X( 1, 0, 0, 0, 3, 3, 0, 0, 0, 1, 1) \

RASTER_VARIANT_GROUP(RasterVariantsFlat, VARIANTS)
