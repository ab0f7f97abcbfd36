// Reading and writing rectangles of the current target: pixel read-back and
// write (getarea, setarea) and the depth clear.
#include <emmintrin.h>

#include <cstdint>
#include <cstring>

#include "jni/Exception.h"
#include "render/blitclip.h"
#include "render/toolkit.h"

void toolkit::getarea(int x, int y, int w, int h, int* out) {
    if (!m_ColourBuffer) throw new Exception("No colour buffer");
    // Pixels of the rectangle outside the target leave their array elements as they are.
    BlitRect_s r = {x, y, 0, 0, w, h};
    if (!ClipBlit(r, m_Width, m_Height, w, h)) return;
    const unsigned int* s = m_ColourBuffer + (intptr_t)r.sy * m_Width + r.sx;
    int* d = out + (intptr_t)r.dy * w + r.dx;
    for (int j = 0; j < r.h; ++j, s += m_Width, d += w) std::memcpy(d, s, size_t(r.w) * 4);
}

void toolkit::setarea(int x, int y, int w, int h, const int* in, int offset, int stride) {
    if (h < 1 || !m_ColourBuffer) return;
    // Only the part of the rectangle inside the target is written; array
    // elements of the cut-off part are not read.
    BlitRect_s r = {0, 0, x, y, w, h};
    if (!ClipBlit(r, 0x7FFFFFFFLL, 0x7FFFFFFFLL, m_Width, m_Height)) return;
    const int* s = in + offset + (intptr_t)r.sy * stride + r.sx;
    unsigned int* d = m_ColourBuffer + (intptr_t)r.dy * m_Width + r.dx;
    for (int j = 0; j < r.h; ++j, s += stride, d += m_Width) std::memcpy(d, s, size_t(r.w) * 4);
}

static void fill_row(float* p, int n, float value) {
    __m128 v = _mm_set1_ps(value);
    int i = 0;
    while (i < n && (reinterpret_cast<uintptr_t>(p + i) & 15)) p[i++] = value;
    for (; i + 4 <= n; i += 4) _mm_store_ps(p + i, v);
    for (; i < n; ++i) p[i] = value;
}

void toolkit::zbuffer_clear(int x, int y, int w, int h, float value) {
    if (!m_DepthBuffer) return;
    // Clipped like rect_fill, and to the buffer itself in case the clip
    // rectangle was set oddly.
    long long l = m_ClipLeft > 0 ? m_ClipLeft : 0, t = m_ClipTop > 0 ? m_ClipTop : 0;
    long long rr = m_ClipRight < m_Width ? m_ClipRight : m_Width;
    long long b = m_ClipBottom < m_Height ? m_ClipBottom : m_Height;
    long long x0 = x, y0 = y, x1 = (long long)x + w, y1 = (long long)y + h;
    if (x0 < l) x0 = l;
    if (y0 < t) y0 = t;
    if (x1 > rr) x1 = rr;
    if (y1 > b) y1 = b;
    if (x1 <= x0 || y1 <= y0) return;
    if (x0 == 0 && x1 == m_Width) {
        // whole rows: one linear pass
        fill_row(m_DepthBuffer + y0 * m_Width, int((y1 - y0) * m_Width), value);
        return;
    }
    for (long long j = y0; j < y1; ++j) fill_row(m_DepthBuffer + j * m_Width + x0, int(x1 - x0), value);
}
