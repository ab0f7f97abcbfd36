// Sprite blitters: axis-aligned (unscaled, scaled, depth-tested), tiled and
// parallelogram drawing into the toolkit's current colour buffer. Each is a
// template over colour operation and blend mode; a row is drawn by one loop
// (four pixels per SSE2 step with unaligned 16-byte loads and stores, then the
// 0-3 remaining pixels through the same four-pixel arithmetic) parameterised
// by how source pixels are fetched. The plain one-pixel form of the arithmetic
// (SpritePixel.h) is the reference the tests hold both against.
#include <emmintrin.h>

#include <cmath>
#include <cstdint>

#include "render/toolkit.h"
#include "sprite/Sprite.h"
#include "sprite/SpritePixel.h"
#include "text/clippingmask.h"

using namespace SpritePixel_n;

namespace {

// Destination sizes beyond this draw nothing: pixel indices stay exact in
// single precision, and fixed-point steps cannot overflow.
const long long kMaxDrawSize = 1 << 24;

// Fixed-point format of the parallelogram's source stepping: coordinates carry
// pp_scaleshift fractional bits; they are computed with pp_scaleshift +
// pp_shift bits and rounded down to the final format by adding pp_round.
const int32_t pp_scaleshift = 12;
const int32_t pp_round = 8;
const int32_t pp_shift = 4;
// Stored sprites larger than this are not drawn as parallelograms (their
// fixed-point source coordinates would not fit in 31 bits).
const uint32_t kMaxParallelogramSource = 1u << 18;

// The current target as the blitters see it: buffers, row pitch (the toolkit
// width, as for all 2D drawing) and the clipping rectangle cut to the buffer.
struct Target_s {
    uint32_t* colour;
    float* depth;
    long long pitch;
    long long l, t, r, b;
};

Target_s target_of(const toolkit& tk) {
    Target_s g;
    g.colour = tk.m_ColourBuffer;
    g.depth = tk.m_DepthBuffer;
    g.pitch = tk.m_Width;
    g.l = tk.m_ClipLeft > 0 ? tk.m_ClipLeft : 0;
    g.t = tk.m_ClipTop > 0 ? tk.m_ClipTop : 0;
    g.r = tk.m_ClipRight < tk.m_Width ? tk.m_ClipRight : tk.m_Width;
    g.b = tk.m_ClipBottom < tk.m_Height ? tk.m_ClipBottom : tk.m_Height;
    return g;
}

inline long long max64(long long a, long long b) { return a > b ? a : b; }
inline long long min64(long long a, long long b) { return a < b ? a : b; }

// Rows of an object clipped to [l, r) x [t, b), optionally confined to a
// clipping mask (specialised with the masks).
template <bool Masked>
struct RowSpans_s;

template <>
struct RowSpans_s<false> {
    long long l, t, r, b;
    RowSpans_s(const clippingmask*, int, int, long long l, long long t, long long r, long long b)
        : l(l), t(t), r(r), b(b) {}
    long long first_row() const { return t; }
    long long end_row() const { return b; }
    bool span(long long, long long& x0, long long& x1) const {
        x0 = l;
        x1 = r;
        return x1 > x0;
    }
};

// Confined to the mask placed at (maskx, masky): the rows it covers, and on
// each the mask's span cut to the object's range. A null mask confines nothing.
template <>
struct RowSpans_s<true> {
    mask_placement m;
    RowSpans_s(const clippingmask* mask, int maskx, int masky, long long l, long long t, long long r, long long b)
        : m(mask, maskx, masky, int(l), int(t), int(r), int(b)) {}
    long long first_row() const { return m.first_row(); }
    long long end_row() const { return m.end_row(); }
    bool span(long long y, long long& x0, long long& x1) const {
        int a, b;
        if (!m.span(int(y), a, b)) return false;
        x0 = a;
        x1 = b;
        return true;
    }
};

// ---- source fetchers (one pixel i of the row, and four from i) --------------

struct FetchLinear_s {
    static const bool MayReject = false;
    const uint32_t* src;
    bool get1(int i, uint32_t& s) const {
        s = src[i];
        return true;
    }
    __m128i get4(int i, __m128i&) const { return _mm_loadu_si128(reinterpret_cast<const __m128i*>(src + i)); }
};

struct FetchColumns_s {
    static const bool MayReject = false;
    const uint32_t* row;
    const int* cols;
    bool get1(int i, uint32_t& s) const {
        s = row[cols[i]];
        return true;
    }
    __m128i get4(int i, __m128i&) const {
        return _mm_setr_epi32(int(row[cols[i]]), int(row[cols[i + 1]]), int(row[cols[i + 2]]), int(row[cols[i + 3]]));
    }
};

// Source coordinates u, v in fixed point stepping along the row. The caller
// has cut the row to the pixels whose coordinates lie inside the stored
// pixels, so every fetch is in range.
struct FetchParallelogram_s {
    static const bool MayReject = false;
    const uint32_t* pixels;
    long long pitch;
    int32_t u0, v0, du, dv;
    bool get1(int i, uint32_t& s) const {
        int32_t u = u0 + i * du, v = v0 + i * dv;
        s = pixels[(v >> pp_scaleshift) * pitch + (u >> pp_scaleshift)];
        return true;
    }
    __m128i get4(int i, __m128i&) const {
        int32_t u = u0 + i * du, v = v0 + i * dv;
        const uint32_t* p0 = pixels + (v >> pp_scaleshift) * pitch + (u >> pp_scaleshift);
        u += du, v += dv;
        const uint32_t* p1 = pixels + (v >> pp_scaleshift) * pitch + (u >> pp_scaleshift);
        u += du, v += dv;
        const uint32_t* p2 = pixels + (v >> pp_scaleshift) * pitch + (u >> pp_scaleshift);
        u += du, v += dv;
        const uint32_t* p3 = pixels + (v >> pp_scaleshift) * pitch + (u >> pp_scaleshift);
        return _mm_setr_epi32(int(*p0), int(*p1), int(*p2), int(*p3));
    }
};

// Narrows [lo, hi) to the i with 0 <= c + i x d < limit (exact integers).
inline void narrow_fixed(long long c, long long d, long long limit, long long& lo, long long& hi) {
    auto floordiv = [](long long a, long long b) {  // b > 0
        long long q = a / b;
        return (a % b != 0 && a < 0) ? q - 1 : q;
    };
    if (d > 0) {
        lo = max64(lo, -floordiv(c, d));            // ceil(-c / d)
        hi = min64(hi, -floordiv(c - limit, d));    // ceil((limit - c) / d)
    } else if (d < 0) {
        hi = min64(hi, floordiv(c, -d) + 1);
        lo = max64(lo, floordiv(c - limit, -d) + 1);
    } else if (!(c >= 0 && c < limit)) {
        hi = lo;
    }
}

// ---- the row loop ------------------------------------------------------------

// No scalar head to align the destination: unaligned 16-byte accesses cost
// less than the per-pixel work of a head on rows of typical sprite widths.
template <int Op, int Blend, bool DepthTest, class Fetch>
inline void DrawRow(uint32_t* dst, const float* z, float depth, int n, const Fetch& f, const Consts_s& k) {
    int i = 0;
    const __m128 depth4 = _mm_set1_ps(depth);
    for (; i + 4 <= n; i += 4) {
        __m128i valid = _mm_set1_epi32(-1);
        __m128i s = f.get4(i, valid);
        __m128i* p = reinterpret_cast<__m128i*>(dst + i);
        __m128i d = _mm_loadu_si128(p);
        __m128i r = Pixel4<Op, Blend>(s, d, k);
        if (Fetch::MayReject || DepthTest) {
            __m128i m = valid;
            if (DepthTest) m = _mm_and_si128(m, _mm_castps_si128(_mm_cmple_ps(depth4, _mm_loadu_ps(z + i))));
            r = _mm_or_si128(_mm_and_si128(m, r), _mm_andnot_si128(m, d));
        }
        _mm_storeu_si128(p, r);
    }
    if (i < n) {
        // the 1-3 remaining pixels through the same four-pixel arithmetic,
        // reading and writing only those pixels
        alignas(16) uint32_t sb[4] = {0, 0, 0, 0}, db[4] = {0, 0, 0, 0}, rb[4];
        bool take[4] = {false, false, false, false};
        const int rem = n - i;
        for (int j = 0; j < rem; ++j) {
            take[j] = f.get1(i + j, sb[j]) && (!DepthTest || depth <= z[i + j]);
            db[j] = dst[i + j];
        }
        _mm_store_si128(reinterpret_cast<__m128i*>(rb),
                        Pixel4<Op, Blend>(_mm_load_si128(reinterpret_cast<const __m128i*>(sb)),
                                          _mm_load_si128(reinterpret_cast<const __m128i*>(db)), k));
        for (int j = 0; j < rem; ++j)
            if (take[j]) dst[i + j] = rb[j];
    }
}

// ---- axis-aligned ------------------------------------------------------------

typedef Sprite_c::RenderParams_s RenderParams_s;
typedef Sprite_c::ParallelogramRenderParams_s ParallelogramRenderParams_s;

// The stored pixels drawn with their top-left corner at (ox, oy).
template <int Op, int Blend, bool Masked, bool ColourWrite, bool DepthTest>
void RenderUnscaledAt(const Target_s& g, const Sprite_c& s, long long ox, long long oy, const RenderParams_s& p,
                      const Consts_s& k) {
    if (!s.Pixels) return;
    long long x0 = max64(ox, g.l), y0 = max64(oy, g.t);
    long long x1 = min64(ox + s.Width, g.r), y1 = min64(oy + s.Height, g.b);
    if (x1 <= x0 || y1 <= y0) return;
    if (!ColourWrite || !g.colour || (DepthTest && !g.depth)) return;
    RowSpans_s<Masked> rows(p.mask, p.maskx, p.masky, x0, y0, x1, y1);
    for (long long y = rows.first_row(); y < rows.end_row(); ++y) {
        long long a, b;
        if (!rows.span(y, a, b)) continue;
        FetchLinear_s f{s.Pixels + (y - oy) * s.Pitch + (a - ox)};
        const float* z = DepthTest ? g.depth + y * g.pitch + a : nullptr;
        DrawRow<Op, Blend, DepthTest>(g.colour + y * g.pitch + a, z, p.depth, int(b - a), f, k);
    }
}

// Scratch list of source columns of one scaled call, per thread (grown, never
// shrunk).
struct ColumnScratch_s {
    int* data = nullptr;
    size_t capacity = 0;
    ~ColumnScratch_s() { delete[] data; }
    int* get(size_t n) {
        if (n > capacity) {
            delete[] data;
            data = nullptr;
            data = new int[n];
            capacity = n;
        }
        return data;
    }
};
thread_local ColumnScratch_s column_scratch;

template <int Op, int Blend, bool Masked, bool ColourWrite, bool DepthTest>
void RenderScaledImpl(const Target_s& g, const Sprite_c& s, const RenderParams_s& p, const Consts_s& k) {
    if (!s.Pixels || s.Width == 0 || s.Height == 0) return;
    long long fw = s.FullWidth(), fh = s.FullHeight();
    if (fw <= 0 || fh <= 0 || p.width <= 0 || p.height <= 0 || p.width > kMaxDrawSize || p.height > kMaxDrawSize)
        return;
    float sx = float(p.width) / float(fw), sy = float(p.height) / float(fh);
    // trims scaled and truncated
    long long tl = (long long)(float(s.OffsetLeft) * sx), tr = (long long)(float(s.OffsetRight) * sx);
    long long tt = (long long)(float(s.OffsetTop) * sy), tb = (long long)(float(s.OffsetBottom) * sy);
    long long dl = (long long)p.x + tl, dt = (long long)p.y + tt;
    long long dw = (long long)p.width - tl - tr, dh = (long long)p.height - tt - tb;
    if (dw <= 0 || dh <= 0 || dw > kMaxDrawSize || dh > kMaxDrawSize) return;
    long long x0 = max64(dl, g.l), y0 = max64(dt, g.t);
    long long x1 = min64(dl + dw, g.r), y1 = min64(dt + dh, g.b);
    if (x1 <= x0 || y1 <= y0) return;
    if (!ColourWrite || !g.colour || (DepthTest && !g.depth)) return;

    // nearest source column of each destination column: trunc(i x step)
    const float stepx = float(s.Width) / float(dw), stepy = float(s.Height) / float(dh);
    const int lastCol = int(s.Width) - 1, lastRow = int(s.Height) - 1;
    int* cols = column_scratch.get(size_t(x1 - x0));
    for (long long x = x0; x < x1; ++x) {
        int c = int(float(x - dl) * stepx);
        cols[size_t(x - x0)] = c < lastCol ? c : lastCol;
    }
    RowSpans_s<Masked> rows(p.mask, p.maskx, p.masky, x0, y0, x1, y1);
    for (long long y = rows.first_row(); y < rows.end_row(); ++y) {
        long long a, b;
        if (!rows.span(y, a, b)) continue;
        int r = int(float(y - dt) * stepy);
        if (r > lastRow) r = lastRow;
        FetchColumns_s f{s.Pixels + (long long)r * s.Pitch, cols + (a - x0)};
        const float* z = DepthTest ? g.depth + y * g.pitch + a : nullptr;
        DrawRow<Op, Blend, DepthTest>(g.colour + y * g.pitch + a, z, p.depth, int(b - a), f, k);
    }
}

inline long long floordiv(long long a, long long b) {  // b > 0
    long long q = a / b;
    return (a % b != 0 && a < 0) ? q - 1 : q;
}

template <int Op, int Blend>
void RenderTiledImpl(Target_s g, const Sprite_c& s, const RenderParams_s& p, const Consts_s& k) {
    long long fw = s.FullWidth(), fh = s.FullHeight();
    if (fw <= 0 || fh <= 0 || p.width <= 0 || p.height <= 0 || !s.Pixels) return;
    // the clip narrowed to end with the tiled rectangle (left and top kept)
    g.r = min64(g.r, (long long)p.x + p.width);
    g.b = min64(g.b, (long long)p.y + p.height);
    if (g.r <= g.l || g.b <= g.t) return;
    long long ni = (p.width + fw - 1) / fw, nj = (p.height + fh - 1) / fh;
    // Only tiles whose stored pixels can meet the clip are visited.
    long long L = s.OffsetLeft, T = s.OffsetTop;
    long long i0 = max64(0, floordiv(g.l - p.x - L - (long long)s.Width, fw) + 1);
    long long i1 = min64(ni, floordiv(g.r - 1 - p.x - L, fw) + 1);
    long long j0 = max64(0, floordiv(g.t - p.y - T - (long long)s.Height, fh) + 1);
    long long j1 = min64(nj, floordiv(g.b - 1 - p.y - T, fh) + 1);
    for (long long j = j0; j < j1; ++j)
        for (long long i = i0; i < i1; ++i)
            RenderUnscaledAt<Op, Blend, false, true, false>(g, s, p.x + i * fw + L, p.y + j * fh + T, p, k);
}

// ---- parallelograms ------------------------------------------------------------

// Fixed-point source coordinate: computed with pp_scaleshift + pp_shift
// fractional bits, rounded to pp_scaleshift.
inline int32_t to_fixed(double a) {
    long long f = std::llround(a * double(1 << (pp_scaleshift + pp_shift)));
    return int32_t((f + pp_round) >> pp_shift);
}

// Narrows [lo, hi] to the t with 0 <= slope x t + offset < limit.
inline void narrow(double slope, double offset, double limit, double& lo, double& hi) {
    if (slope > 0) {
        lo = std::fmax(lo, -offset / slope);
        hi = std::fmin(hi, (limit - offset) / slope);
    } else if (slope < 0) {
        lo = std::fmax(lo, (limit - offset) / slope);
        hi = std::fmin(hi, -offset / slope);
    } else if (!(offset >= 0 && offset < limit)) {
        lo = 1;
        hi = 0;
    }
}

template <int Op, int Blend, bool Masked>
void RenderParallelogramImpl(const Target_s& g, const Sprite_c& s, const ParallelogramRenderParams_s& p,
                             const Consts_s& k) {
    if (!g.colour || !s.Pixels || s.Width == 0 || s.Height == 0) return;
    if (s.Width > kMaxParallelogramSource || s.Height > kMaxParallelogramSource) return;
    const float corners[6] = {p.x0, p.x1, p.x2, p.y0, p.y1, p.y2};
    for (float c : corners)
        if (!(std::fabs(c) <= float(kMaxDrawSize))) return;  // huge or not finite
    long long fwl = s.FullWidth(), fhl = s.FullHeight();
    if (fwl <= 0 || fhl <= 0) return;

    float x0 = p.x0, y0 = p.y0, x1 = p.x1, y1 = p.y1, x2 = p.x2, y2 = p.y2;
    if (fwl != (long long)s.Width || fhl != (long long)s.Height) {
        // move the corners from the full box onto the stored pixels
        float fw = float(fwl), fh = float(fhl);
        float dxx = (x1 - x0) / fw, dxy = (y1 - y0) / fw;
        float dyx = (x2 - x0) / fh, dyy = (y2 - y0) / fh;
        float L = float(s.OffsetLeft), T = float(s.OffsetTop), R = float(s.OffsetRight), B = float(s.OffsetBottom);
        float nx0 = x0 + L * dxx + T * dyx, ny0 = y0 + L * dxy + T * dyy;
        float nx1 = x1 - R * dxx + T * dyx, ny1 = y1 - R * dxy + T * dyy;
        float nx2 = x2 + L * dxx - B * dyx, ny2 = y2 + L * dxy - B * dyy;
        x0 = nx0, y0 = ny0, x1 = nx1, y1 = ny1, x2 = nx2, y2 = ny2;
        const float moved[6] = {x0, x1, x2, y0, y1, y2};
        for (float c : moved)
            if (!(std::fabs(c) <= float(kMaxDrawSize))) return;
    }

    // Destination per source pixel along u (e1) and v (e2), and the inverse.
    const double W = s.Width, H = s.Height;
    const double e1x = (double(x1) - x0) / W, e1y = (double(y1) - y0) / W;
    const double e2x = (double(x2) - x0) / H, e2y = (double(y2) - y0) / H;
    const double det = e1x * e2y - e1y * e2x;
    if (!(det != 0) || !std::isfinite(det)) return;
    const double dudx = e2y / det, dvdx = -e1y / det, dudy = -e2x / det, dvdy = e1x / det;
    // at most 2^15 source pixels per destination step, so that fixed-point
    // coordinates near the drawn area fit in 31 bits
    const double maxStep = double(1 << 15);
    if (!(std::fabs(dudx) <= maxStep && std::fabs(dvdx) <= maxStep && std::isfinite(dudy) && std::isfinite(dvdy)))
        return;
    const int32_t du = to_fixed(dudx), dv = to_fixed(dvdx);

    const double ys[4] = {y0, y1, y2, double(y1) - y0 + y2};
    double minY = ys[0], maxY = ys[0];
    for (double v : ys) minY = std::fmin(minY, v), maxY = std::fmax(maxY, v);
    long long r0 = max64(g.t, (long long)std::floor(minY - 0.5) - 1);
    long long r1 = min64(g.b, (long long)std::ceil(maxY - 0.5) + 2);
    if (r1 <= r0) return;
    RowSpans_s<Masked> rows(p.mask, p.maskx, p.masky, g.l, r0, g.r, r1);
    const double coordLimit = double(kMaxParallelogramSource) * 2;
    const FetchParallelogram_s base{s.Pixels, (long long)s.Pitch, 0, 0, du, dv};
    for (long long y = rows.first_row(); y < rows.end_row(); ++y) {
        long long a, b;
        if (!rows.span(y, a, b)) continue;
        // pixel centres X + 0.5 whose source coordinate lies inside the
        // stored pixels, with one pixel of margin; each pixel is then decided
        // by its fixed-point coordinate
        const double yc = double(y) + 0.5 - y0;
        double lo = -1e300, hi = 1e300;
        narrow(dudx, yc * dudy, W, lo, hi);
        narrow(dvdx, yc * dvdy, H, lo, hi);
        if (!(lo <= hi)) continue;
        double xa = std::floor(lo + x0 - 0.5) - 1, xb = std::ceil(hi + x0 - 0.5) + 2;
        if (xa > double(a)) a = (long long)std::fmin(xa, double(b));
        if (xb < double(b)) b = (long long)std::fmax(xb, double(a));
        if (b <= a) continue;
        const double t = double(a) + 0.5 - x0;
        const double u = t * dudx + yc * dudy, v = t * dvdx + yc * dvdy;
        if (!(std::fabs(u) <= coordLimit && std::fabs(v) <= coordLimit)) continue;
        // the pixels whose fixed-point coordinate falls inside the stored pixels
        const int32_t u0 = to_fixed(u), v0 = to_fixed(v);
        long long i0 = 0, i1 = b - a;
        narrow_fixed(u0, du, (long long)s.Width << pp_scaleshift, i0, i1);
        narrow_fixed(v0, dv, (long long)s.Height << pp_scaleshift, i0, i1);
        if (i1 <= i0) continue;
        FetchParallelogram_s f = base;
        f.u0 = int32_t(u0 + i0 * du);
        f.v0 = int32_t(v0 + i0 * dv);
        DrawRow<Op, Blend, false>(g.colour + y * g.pitch + a + i0, nullptr, 0.0f, int(i1 - i0), f, k);
    }
}

}  // namespace

// ---- the templates ---------------------------------------------------------------

template <int Op, int Blend, bool Scaled, bool Masked, bool ColourWrite, bool DepthTest>
void Sprite_c::Render(toolkit& tk, const RenderParams_s& p) const {
    const Target_s g = target_of(tk);
    const Consts_s k = MakeConsts(p.colour);
    if (Scaled)
        RenderScaledImpl<Op, Blend, Masked, ColourWrite, DepthTest>(g, *this, p, k);
    else
        RenderUnscaledAt<Op, Blend, Masked, ColourWrite, DepthTest>(g, *this, (long long)p.x + OffsetLeft,
                                                                    (long long)p.y + OffsetTop, p, k);
}

template <int Op, int Blend>
void Sprite_c::RenderTiled(toolkit& tk, const RenderParams_s& p) const {
    if (!tk.m_ColourBuffer) return;
    RenderTiledImpl<Op, Blend>(target_of(tk), *this, p, MakeConsts(p.colour));
}

template <int Op, int Blend, bool Masked>
void Sprite_c::RenderParallelogram(toolkit& tk, const ParallelogramRenderParams_s& p) const {
    RenderParallelogramImpl<Op, Blend, Masked>(target_of(tk), *this, p, MakeConsts(p.colour));
}

// ---- instantiations and dispatch ----------------------------------------------------

#define PAVOQEN_SPRITE_OPS(X, ...) \
    X(0, __VA_ARGS__) X(1, __VA_ARGS__) X(2, __VA_ARGS__) X(3, __VA_ARGS__) X(4, __VA_ARGS__)
#define PAVOQEN_SPRITE_RENDER(Op, S, M, C, D)                                                    \
    template void Sprite_c::Render<Op, 0, S, M, C, D>(toolkit&, const RenderParams_s&) const; \
    template void Sprite_c::Render<Op, 1, S, M, C, D>(toolkit&, const RenderParams_s&) const; \
    template void Sprite_c::Render<Op, 2, S, M, C, D>(toolkit&, const RenderParams_s&) const;
#define PAVOQEN_SPRITE_OTHERS(Op, unused)                                                                   \
    template void Sprite_c::RenderTiled<Op, 0>(toolkit&, const RenderParams_s&) const;                   \
    template void Sprite_c::RenderTiled<Op, 1>(toolkit&, const RenderParams_s&) const;                   \
    template void Sprite_c::RenderTiled<Op, 2>(toolkit&, const RenderParams_s&) const;                   \
    template void Sprite_c::RenderParallelogram<Op, 0, false>(toolkit&, const ParallelogramRenderParams_s&) const; \
    template void Sprite_c::RenderParallelogram<Op, 1, false>(toolkit&, const ParallelogramRenderParams_s&) const; \
    template void Sprite_c::RenderParallelogram<Op, 2, false>(toolkit&, const ParallelogramRenderParams_s&) const;

PAVOQEN_SPRITE_OPS(PAVOQEN_SPRITE_RENDER, false, false, true, false)
PAVOQEN_SPRITE_OPS(PAVOQEN_SPRITE_RENDER, true, false, true, false)
PAVOQEN_SPRITE_OPS(PAVOQEN_SPRITE_RENDER, true, false, false, true)
PAVOQEN_SPRITE_OPS(PAVOQEN_SPRITE_RENDER, true, false, true, true)
PAVOQEN_SPRITE_OPS(PAVOQEN_SPRITE_OTHERS, 0)
template void Sprite_c::Render<1, 1, false, true, true, false>(toolkit&, const RenderParams_s&) const;
template void Sprite_c::RenderParallelogram<1, 0, true>(toolkit&, const ParallelogramRenderParams_s&) const;
template void Sprite_c::RenderParallelogram<1, 1, true>(toolkit&, const ParallelogramRenderParams_s&) const;

namespace {

typedef void (Sprite_c::*RenderFn)(toolkit&, const RenderParams_s&) const;
typedef void (Sprite_c::*ParallelogramFn)(toolkit&, const ParallelogramRenderParams_s&) const;

#define PAVOQEN_ROW(Fn, Op, ...) {&Sprite_c::Fn<Op, 0, ##__VA_ARGS__>, &Sprite_c::Fn<Op, 1, ##__VA_ARGS__>, &Sprite_c::Fn<Op, 2, ##__VA_ARGS__>}
#define PAVOQEN_TABLE(Fn, ...)                                                                          \
    {PAVOQEN_ROW(Fn, 0, ##__VA_ARGS__), PAVOQEN_ROW(Fn, 1, ##__VA_ARGS__), PAVOQEN_ROW(Fn, 2, ##__VA_ARGS__), \
     PAVOQEN_ROW(Fn, 3, ##__VA_ARGS__), PAVOQEN_ROW(Fn, 4, ##__VA_ARGS__)}

const RenderFn kUnscaled[5][3] = PAVOQEN_TABLE(Render, false, false, true, false);
const RenderFn kScaled[5][3] = PAVOQEN_TABLE(Render, true, false, true, false);
const RenderFn kScaledDepthOnly[5][3] = PAVOQEN_TABLE(Render, true, false, false, true);
const RenderFn kScaledDepth[5][3] = PAVOQEN_TABLE(Render, true, false, true, true);
const RenderFn kTiled[5][3] = PAVOQEN_TABLE(RenderTiled);
const ParallelogramFn kParallelogram[5][3] = PAVOQEN_TABLE(RenderParallelogram, false);

// The one dispatch of a call: the instantiation for (op, blend), or nothing
// for modes outside the tables.
template <class Fn, class P>
inline void dispatch(const Fn (&table)[5][3], const Sprite_c& s, toolkit& tk, unsigned op, unsigned blend,
                     const P& p) {
    if (op >= 5u || blend >= 3u) return;
    const Fn fn = table[op][blend];
    (s.*fn)(tk, p);
}

}  // namespace

void Sprite_c::Draw(toolkit& tk, int op, int blend, const RenderParams_s& p) const {
    dispatch(kUnscaled, *this, tk, unsigned(op), unsigned(blend), p);
}

void Sprite_c::DrawScaled(toolkit& tk, int op, int blend, const RenderParams_s& p) const {
    dispatch(kScaled, *this, tk, unsigned(op), unsigned(blend), p);
}

void Sprite_c::DrawScaledDepth(toolkit& tk, int op, int blend, const RenderParams_s& p) const {
    if (tk.m_DepthBuffer && tk.m_ColourBuffer)
        dispatch(kScaledDepth, *this, tk, unsigned(op), unsigned(blend), p);
    else if (tk.m_DepthBuffer)
        dispatch(kScaledDepthOnly, *this, tk, unsigned(op), unsigned(blend), p);
    else if (tk.m_ColourBuffer)
        dispatch(kScaled, *this, tk, unsigned(op), unsigned(blend), p);
}

void Sprite_c::DrawTiled(toolkit& tk, int op, int blend, const RenderParams_s& p) const {
    dispatch(kTiled, *this, tk, unsigned(op), unsigned(blend), p);
}

void Sprite_c::DrawParallelogram(toolkit& tk, int op, int blend, const ParallelogramRenderParams_s& p) const {
    dispatch(kParallelogram, *this, tk, unsigned(op), unsigned(blend), p);
}

void Sprite_c::DrawMasked(toolkit& tk, const RenderParams_s& p) const { Render<1, 1, false, true, true, false>(tk, p); }

void Sprite_c::DrawParallelogramMasked(toolkit& tk, bool replace, const ParallelogramRenderParams_s& p) const {
    if (replace)
        RenderParallelogram<1, 0, true>(tk, p);
    else
        RenderParallelogram<1, 1, true>(tk, p);
}
