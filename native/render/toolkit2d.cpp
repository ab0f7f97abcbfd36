// The toolkit's 2D primitives: clears, filled rectangles, horizontal, vertical
// and general lines, filled circles, and their masked forms. Everything is
// confined to the clipping rectangle (further cut to the buffer itself, so a
// stale clip can never reach outside it). Coordinates are widened to 64 bits
// before any arithmetic, so no input can overflow into a write elsewhere.
#include <cmath>
#include <cstdint>

#include "render/rows2d.h"
#include "render/toolkit.h"
#include "text/clippingmask.h"

using namespace rows2d;

namespace {

typedef long long i64;

inline i64 min64(i64 a, i64 b) { return a < b ? a : b; }
inline i64 max64(i64 a, i64 b) { return a > b ? a : b; }
inline i64 abs64(i64 a) { return a < 0 ? -a : a; }

// Clip rectangle [L, R) x [T, B) of a drawing call, inside the buffer.
struct clip_box {
    i64 L, T, R, B;
    explicit clip_box(const toolkit& tk)
        : L(max64(tk.m_ClipLeft, 0)),
          T(max64(tk.m_ClipTop, 0)),
          R(min64(tk.m_ClipRight, tk.m_Width)),
          B(min64(tk.m_ClipBottom, tk.m_Height)) {}
};

// floor(a / b) for b > 0
inline i64 floor_div(i64 a, i64 b) {
    i64 q = a / b;
    if ((a % b) != 0 && a < 0) --q;
    return q;
}

// Slope of a line in 16.16 fixed point: minor / major rounded to nearest,
// halves upwards (floor(minor * 65536 / major + 0.5)); major > 0.
inline i64 slope16(i64 minor, i64 major) { return floor_div(2 * minor * 65536 + major, 2 * major); }

template <class M>
void fill_rect(toolkit& tk, const clip_box& c, i64 x, i64 y, i64 w, i64 h, const M& m) {
    if (x < c.L) {
        w -= c.L - x;
        x = c.L;
    }
    if (y < c.T) {
        h -= c.T - y;
        y = c.T;
    }
    if (x + w > c.R) w = c.R - x;
    if (y + h > c.B) h = c.B - y;
    if (w <= 0 || h <= 0) return;
    const i64 W = tk.m_Width;
    uint32_t* row = tk.m_ColourBuffer + y * W + x;
    if (x == 0 && w == W) {
        // whole rows: one linear pass
        const i64 n = w * h;
        if constexpr (!M::reads_dest) {
            if (y == 0 && h == tk.m_Height) {
                stream_fill(row, size_t(n), m(0));
                return;
            }
        }
        fill_row(row, ptrdiff_t(n), m);
        return;
    }
    for (i64 j = 0; j < h; ++j, row += W) fill_row(row, ptrdiff_t(w), m);
}

template <class M>
void span_h(toolkit& tk, const clip_box& c, i64 x, i64 y, i64 length, const M& m) {
    if (x < c.L) {
        length -= c.L - x;
        x = c.L;
    }
    if (x + length > c.R) length = c.R - x;
    if (length <= 0) return;
    fill_row(tk.m_ColourBuffer + y * tk.m_Width + x, ptrdiff_t(length), m);
}

template <class M>
void span_v(toolkit& tk, const clip_box& c, i64 x, i64 y, i64 length, const M& m) {
    if (y < c.T) {
        length -= c.T - y;
        y = c.T;
    }
    if (y + length > c.B) length = c.B - y;
    if (length <= 0) return;
    const i64 W = tk.m_Width;
    uint32_t* p = tk.m_ColourBuffer + y * W + x;
    for (i64 j = 0; j < length; ++j, p += W) *p = m(*p);
}

// Which pixels a line may touch besides the clip box: every row and every
// column (plain lines) or the rows and spans of a placed clipping mask.
struct no_mask {
    bool pixel_ok(i64, i64) const { return true; }
};

struct with_mask {
    const mask_placement& mp;
    bool pixel_ok(i64 x, i64 y) const {
        int x0, x1;
        return mp.span(int(y), x0, x1) && x >= x0 && x < x1;
    }
};

// Steps along the major axis a (x when XMajor, else y) from a1 to a1 + da,
// with the minor coordinate b in 16.16 fixed point, rounded from the middle
// of the start pixel. Only the part of the run inside the clip box is walked.
template <bool XMajor, class M, class Mask>
void line_axis(toolkit& tk, const clip_box& c, i64 a1, i64 b1, i64 da, i64 db, const M& m, const Mask& mask) {
    const i64 aLo = XMajor ? c.L : c.T, aHi = XMajor ? c.R : c.B;
    const i64 bLo = XMajor ? c.T : c.L, bHi = XMajor ? c.B : c.R;
    const i64 step = da > 0 ? slope16(db, da) : 0;
    i64 fb = b1 * 65536 + 32768;
    i64 as = a1, ae = min64(a1 + da, aHi - 1);
    if (as < aLo) {
        fb += step * (aLo - as);
        as = aLo;
    }
    for (i64 a = as; a <= ae; ++a, fb += step) {
        const i64 b = fb >> 16;
        const i64 x = XMajor ? a : b, y = XMajor ? b : a;
        if (b >= bLo && b < bHi && mask.pixel_ok(x, y)) {
            uint32_t* p = tk.m_ColourBuffer + y * tk.m_Width + x;
            *p = m(*p);
        }
    }
}

// General line, steps after the horizontal/vertical shortcut: end points
// ordered so that dx + dy >= 0, then stepped along the major axis with the
// minor coordinate in 16.16 fixed point. A zero-length line is a one-row
// y-major line.
template <class M, class Mask>
void line_steps(toolkit& tk, const clip_box& c, i64 x1, i64 y1, i64 dx, i64 dy, const M& m, const Mask& mask) {
    if (dx + dy < 0) {
        x1 += dx;
        y1 += dy;
        dx = -dx;
        dy = -dy;
    }
    if (dx > dy)
        line_axis<true>(tk, c, x1, y1, dx, dy, m, mask);
    else
        line_axis<false>(tk, c, y1, x1, dy, dx, m, mask);
}

// Smallest k' in [k, cap] with !pred(k'), for a predicate that is true up to
// some point and false from there on, and false at cap. A few single steps
// first, then bisection (a large circle clipped at the top would otherwise
// step once per pixel of its radius).
template <class P>
i64 first_false_from(i64 k, i64 cap, const P& pred) {
    for (int i = 0; i < 8 && k < cap; ++i, ++k)
        if (!pred(k)) return k;
    // pred(k - 1) true, pred(cap) false
    while (k < cap) {
        const i64 mid = k + (cap - k) / 2;
        if (pred(mid))
            k = mid + 1;
        else
            cap = mid;
    }
    return k;
}

// Largest k' in [0, k] with pred(k'), for a predicate that is false down to
// some point and true from there on, and true at 0.
template <class P>
i64 last_true_from(i64 k, const P& pred) {
    for (int i = 0; i < 8 && k > 0; ++i, --k)
        if (pred(k)) return k;
    // pred(k + 1) false, pred(0) true
    i64 lo = 0;
    while (lo < k) {
        const i64 mid = lo + (k - lo + 1) / 2;
        if (pred(mid))
            lo = mid;
        else
            k = mid - 1;
    }
    return lo;
}

template <class M>
void circle_span(toolkit& tk, i64 y, i64 x0, i64 x1, float depth, const M& m) {
    if (x0 > x1) return;
    const i64 off = y * tk.m_Width + x0;
    if (tk.m_DepthBuffer)
        fill_row_depth(tk.m_ColourBuffer + off, tk.m_DepthBuffer + off, ptrdiff_t(x1 - x0 + 1), depth, m);
    else
        fill_row(tk.m_ColourBuffer + off, ptrdiff_t(x1 - x0 + 1), m);
}

// Filled disc, row by row from the top with the half-width k carried from row
// to row (growing in the upper half, shrinking in the lower half). The
// incremental terms A, Bv (upper) and C, D (lower) are the squared-distance
// tests of the rows; a run of k steps is taken in one jump, with the same
// final k and terms as stepping one at a time.
template <class M>
void fill_circle(toolkit& tk, const clip_box& c, i64 cx, i64 cy, float depth, i64 radius, const M& m) {
    const i64 r = min64(abs64(radius), 0x7FFFFFFF);
    const i64 q = r * r;
    const i64 y0 = max64(cy - r, c.T);
    const i64 yEnd = min64(cy + r + 1, c.B);
    const i64 yMid = min64(cy, yEnd);

    // upper half
    {
        const i64 d = cy - y0;
        i64 A = d * d, Bv = d * d - d, k = 0, s = -2 * d;
        for (i64 y = y0; y < yMid; ++y) {
            // while q >= A or q >= Bv: A += 2k, Bv += 2k, k += 1
            const i64 lo = min64(A, Bv) - k * (k - 1);
            const i64 k2 = first_false_from(k, r + 2, [&](i64 kk) { return q >= lo + kk * (kk - 1); });
            A += k2 * (k2 - 1) - k * (k - 1);
            Bv += k2 * (k2 - 1) - k * (k - 1);
            k = k2;
            circle_span(tk, y, max64(cx + 1 - k, c.L), min64(cx + k, c.R) - 1, depth, m);
            s += 2;
            A += s - 2;
            Bv += s;
        }
    }
    // lower half
    {
        const i64 yFirst = max64(y0, yMid);
        const i64 e = yFirst - yMid;
        i64 k = r, C = e * e + q - r, D = e * e + q - e, t = 2 * e;
        for (i64 y = yFirst; y < yEnd; ++y) {
            // while neither q >= C nor q >= D: D -= 2k, C -= 2(k - 1), k -= 1
            if (!(q >= C || q >= D)) {
                const i64 c0 = C - k * (k - 1), d0 = D - k * (k + 1);
                const i64 k2 = last_true_from(k, [&](i64 kk) { return q >= c0 + kk * (kk - 1) || q >= d0 + kk * (kk + 1); });
                C = c0 + k2 * (k2 - 1);
                D = d0 + k2 * (k2 + 1);
                k = k2;
            }
            circle_span(tk, y, max64(cx - k, c.L), min64(cx + k, c.R - 1), depth, m);
            C += t;
            D += t;
            t += 2;
        }
    }
}

}  // namespace

// --- public operations ----------------------------------------------------

void toolkit::rect_fill(int x, int y, int w, int h, unsigned int colour, unsigned int mode) {
    if (!m_ColourBuffer) return;
    check_mode(mode);
    const clip_box c(*this);
    with_mode(mode, colour, [&](const auto& m) { fill_rect(*this, c, x, y, w, h, m); });
}

void toolkit::cls(unsigned int colour) { rect_fill(0, 0, m_Width, m_Height, colour, 0); }

void toolkit::line_h(int x, int y, int length, unsigned int colour, unsigned int mode) {
    if (!m_ColourBuffer) return;
    const clip_box c(*this);
    if (y < c.T || y >= c.B) return;
    check_mode(mode);
    with_mode(mode, colour, [&](const auto& m) { span_h(*this, c, x, y, length, m); });
}

void toolkit::line_v(int x, int y, int length, unsigned int colour, unsigned int mode) {
    if (!m_ColourBuffer) return;
    const clip_box c(*this);
    if (x < c.L || x >= c.R) return;
    check_mode(mode);
    with_mode(mode, colour, [&](const auto& m) { span_v(*this, c, x, y, length, m); });
}

void toolkit::line(int x1, int y1, int x2, int y2, unsigned int colour, unsigned int mode) {
    if (!m_ColourBuffer) return;
    check_mode(mode);
    const clip_box c(*this);
    const i64 dx = i64(x2) - x1, dy = i64(y2) - y1;
    with_mode(mode, colour, [&](const auto& m) {
        if (dy == 0) {
            if (y1 >= c.T && y1 < c.B) span_h(*this, c, min64(x1, x2), y1, abs64(dx) + 1, m);
        } else if (dx == 0) {
            if (x1 >= c.L && x1 < c.R) span_v(*this, c, x1, min64(y1, y2), abs64(dy) + 1, m);
        } else {
            line_steps(*this, c, x1, y1, dx, dy, m, no_mask());
        }
    });
}

void toolkit::circle_fill(int cx, int cy, float depth, int radius, unsigned int colour, unsigned int mode) {
    if (!m_ColourBuffer) return;
    check_mode(mode);
    const clip_box c(*this);
    with_mode(mode, colour, [&](const auto& m) { fill_circle(*this, c, cx, cy, depth, radius, m); });
}

void toolkit::circle_outline(int, int, int, int, unsigned int, unsigned int) {}

void toolkit::cls_masked(unsigned int colour, clippingmask& mask, int maskx, int masky) {
    if (!m_ColourBuffer) return;
    const clip_box c(*this);
    const mask_placement mp(&mask, maskx, masky, int(c.L), int(c.T), int(c.R), int(c.B));
    const replace_mode m(colour);
    for (int y = mp.first_row(); y < mp.end_row(); ++y) {
        int x0, x1;
        if (mp.span(y, x0, x1)) fill_row(m_ColourBuffer + i64(y) * m_Width + x0, x1 - x0, m);
    }
}

void toolkit::line(int x1, int y1, int x2, int y2, unsigned int colour, unsigned int mode, clippingmask& mask,
                   int maskx, int masky) {
    if (!m_ColourBuffer) return;
    check_mode(mode);
    const clip_box c(*this);
    const mask_placement mp(&mask, maskx, masky, int(c.L), int(c.T), int(c.R), int(c.B));
    with_mode(mode, colour, [&](const auto& m) {
        line_steps(*this, c, x1, y1, i64(x2) - x1, i64(y2) - y1, m, with_mask{mp});
    });
}

// --- streaming fill -------------------------------------------------------

void rows2d::stream_fill(uint32_t* p, size_t n, uint32_t value) {
    while (n > 0 && !aligned16(p)) {
        *p++ = value;
        --n;
    }
    const __m128i v = _mm_set1_epi32(int(value));
    for (; n >= 16; n -= 16, p += 16) {
        __m128i* q = reinterpret_cast<__m128i*>(p);
        _mm_stream_si128(q, v);
        _mm_stream_si128(q + 1, v);
        _mm_stream_si128(q + 2, v);
        _mm_stream_si128(q + 3, v);
    }
    for (; n >= 4; n -= 4, p += 4) _mm_stream_si128(reinterpret_cast<__m128i*>(p), v);
    for (; n > 0; --n) *p++ = value;
    _mm_sfence();
}
