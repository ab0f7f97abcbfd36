// Thick 2D lines: two flat-shaded triangles through the rasteriser.
#include <emmintrin.h>

#include "render/Rasterizer.h"
#include "render/toolkit.h"

using namespace Rasterizer_n;

void toolkit::line_thick(threadresource&, int x1, int y1, int x2, int y2, unsigned int colour, int thickness,
                         unsigned int) {
    if (!m_ColourBuffer) return;
    // 64-bit throughout: any coordinates and thickness Java passes give
    // finite vertices, and the rasteriser clips them to the viewport.
    const long long dx = (long long)x2 - x1, dy = (long long)y2 - y1;
    if (dx == 0 && dy == 0) return;
    const long long n = (dx < 0 ? -dx : dx) > (dy < 0 ? -dy : dy) ? (dx < 0 ? -dx : dx) : (dy < 0 ? -dy : dy);
    long long ux = dx * 65536 / n, uy = dy * 65536 / n;
    if (ux >= uy)
        ux = -ux;
    else
        uy = -uy;
    const long long ox = (uy * thickness) >> 17, ox2 = (uy * thickness + 1) >> 17;
    const long long oy = (ux * thickness) >> 17, oy2 = (ux * thickness + 1) >> 17;
    const long long px1 = (long long)x1 - m_ClipLeft, py1 = (long long)y1 - m_ClipTop;
    const long long px2 = px1 + dx, py2 = py1 + dy;

    Triangle_s t;
    t.m_FlatColour = colour;
    auto vertex = [](long long x, long long y) { return _mm_setr_ps(float(x), float(y), 0.0f, 1.0f); };
    const __m128 a = vertex(px1 + ox, py1 + oy);
    t.m_Positions[0] = a;
    t.m_Positions[1] = vertex(px1 - ox2, py1 - oy2);
    t.m_Positions[2] = vertex(px2 - ox2, py2 - oy2);
    RenderTriangle<ShadeMode_Flat, TexAddress_Wrap, TexAddress_Wrap, false, FogMode_None, BlendMode_Opaque, false,
                   false, false, true, false>(t);
    t.m_Positions[0] = a;
    t.m_Positions[1] = vertex(px2 - ox2, py2 - oy2);
    t.m_Positions[2] = vertex(px2 + ox, py2 + oy);
    RenderTriangle<ShadeMode_Flat, TexAddress_Wrap, TexAddress_Wrap, false, FogMode_None, BlendMode_Opaque, false,
                   false, false, true, false>(t);
}
