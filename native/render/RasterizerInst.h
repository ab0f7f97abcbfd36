// Helpers of the instantiation files: each lists its mode tuples once as an
// X-macro and gets both the explicit instantiations and its part of the
// variant table (collected in Rasterizer.cpp).
#pragma once

#include "render/RasterizerImpl.h"

#define RASTER_TEMPLATE_ARGS(S, U, V, TT, FG, BL, TR, MP, DW, CW, DT)                                           \
    Rasterizer_n::ShadeMode_e(S), Rasterizer_n::TexAddressMode_e(U), Rasterizer_n::TexAddressMode_e(V), bool(TT), \
        Rasterizer_n::FogMode_e(FG), Rasterizer_n::BlendMode_e(BL), bool(TR), bool(MP), bool(DW), bool(CW), bool(DT)

#define RASTER_INSTANTIATE(...) \
    template void Rasterizer_n::RenderTriangle<RASTER_TEMPLATE_ARGS(__VA_ARGS__)>(const Rasterizer_n::Triangle_s&);

#define RASTER_ENTRY_FIELDS(S, U, V, TT, FG, BL, TR, MP, DW, CW, DT) \
    S, U, V, bool(TT), FG, BL, bool(TR), bool(MP), bool(DW), bool(CW), bool(DT)
#define RASTER_ENTRY(...) \
    {RASTER_ENTRY_FIELDS(__VA_ARGS__), &Rasterizer_n::RenderTriangle<RASTER_TEMPLATE_ARGS(__VA_ARGS__)>},

#define RASTER_VARIANT_GROUP(Name, LIST)                                                        \
    LIST(RASTER_INSTANTIATE)                                                                    \
    namespace Rasterizer_n {                                                                    \
    extern const RasterVariant_s Name[];                                                        \
    extern const int Name##Count;                                                               \
    const RasterVariant_s Name[] = {LIST(RASTER_ENTRY)};                                        \
    const int Name##Count = int(sizeof(Name) / sizeof(Name[0]));                                \
    }
