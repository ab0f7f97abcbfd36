// The toolkit's 2D primitives drawn into a memory canvas and compared pixel by
// pixel with references computed here: rectangles, lines, circles, masked
// clears and masked lines.
#include <gtest/gtest.h>

#include <algorithm>
#include <climits>
#include <cmath>
#include <cstdint>
#include <functional>
#include <random>
#include <set>
#include <utility>
#include <vector>

#include "render/canvas.h"
#include "render/rows2d.h"
#include "render/toolkit.h"
#include "text/clippingmask.h"
#include "util/memorymanager/memorymanager.h"

namespace {

typedef long long i64;

uint32_t apply_mode(uint32_t d, uint32_t s, unsigned mode) {
    return mode == 0 ? s : mode == 1 ? rows2d::blend_pixel(d, s) : rows2d::add_pixel(d, s);
}

class Draw2D : public ::testing::Test {
protected:
    static const int W = 64, H = 48;
    void SetUp() override {
        tk = toolkit::create(nullptr, false, 0);
        cv = new memory_canvas(W, H);
        tk->set_active_canvas(cv);
    }
    void TearDown() override {
        tk->set_active_canvas(nullptr);
        toolkit::destroy(tk);
        delete cv;
    }
    uint32_t* px() { return tk->m_ColourBuffer; }
    void randomise(std::mt19937& rng) {
        for (int i = 0; i < W * H; ++i) px()[i] = rng();
        for (int i = 0; i < W * H; ++i) tk->m_DepthBuffer[i] = float(int(rng() % 7)) - 3.0f;
    }
    std::vector<uint32_t> snapshot() { return std::vector<uint32_t>(px(), px() + W * H); }
    // Random clipping rectangle: the whole target, a part, or empty.
    void random_clip(std::mt19937& rng) {
        if (rng() % 4 == 0) return tk->resetclipping();
        int l = int(rng() % (W + 10)) - 5, t = int(rng() % (H + 10)) - 5;
        tk->setclipping(l, t, int(rng() % (W + 10)) - 5, int(rng() % (H + 10)) - 5);
    }
    bool in_clip(i64 x, i64 y) const {
        return x >= tk->m_ClipLeft && x < tk->m_ClipRight && y >= tk->m_ClipTop && y < tk->m_ClipBottom;
    }
    // expected[] after applying the mode to every pixel in `set` that lies in the clip
    std::vector<uint32_t> expect_pixels(const std::vector<uint32_t>& before, const std::set<std::pair<i64, i64>>& set,
                                        uint32_t colour, unsigned mode) {
        std::vector<uint32_t> e = before;
        for (auto& p : set)
            if (in_clip(p.first, p.second) && p.first >= 0 && p.first < W && p.second >= 0 && p.second < H) {
                uint32_t& d = e[size_t(p.second * W + p.first)];
                d = apply_mode(d, colour, mode);
            }
        return e;
    }
    void expect_buffer(const std::vector<uint32_t>& e, const char* what, int seed) {
        for (int i = 0; i < W * H; ++i)
            ASSERT_EQ(px()[i], e[size_t(i)]) << what << " seed " << seed << " at (" << i % W << ", " << i / W << ")";
    }

    toolkit* tk = nullptr;
    memory_canvas* cv = nullptr;
};

// Pixels of a line, unclipped, stepped exactly as the line rule describes:
// end points ordered so that dx + dy >= 0, major axis stepped one by one, the
// minor coordinate in 16.16 fixed point starting half a pixel in, the slope
// rounded to nearest (real division, halves upwards).
std::set<std::pair<i64, i64>> line_pixels(i64 x1, i64 y1, i64 x2, i64 y2, bool shortcut) {
    std::set<std::pair<i64, i64>> s;
    i64 dx = x2 - x1, dy = y2 - y1;
    if (shortcut && dy == 0) {
        for (i64 x = std::min(x1, x2); x <= std::max(x1, x2); ++x) s.insert({x, y1});
        return s;
    }
    if (shortcut && dx == 0) {
        for (i64 y = std::min(y1, y2); y <= std::max(y1, y2); ++y) s.insert({x1, y});
        return s;
    }
    if (dx + dy < 0) {
        x1 = x2;
        y1 = y2;
        dx = -dx;
        dy = -dy;
    }
    auto slope = [](i64 minor, i64 major) {
        return (i64)std::floor((long double)minor * 65536.0L / (long double)major + 0.5L);
    };
    if (dx > dy) {
        i64 step = slope(dy, dx), f = y1 * 65536 + 32768;
        for (i64 x = x1; x <= x1 + dx; ++x, f += step) s.insert({x, f >> 16});
    } else {
        i64 step = dy ? slope(dx, dy) : 0, f = x1 * 65536 + 32768;
        for (i64 y = y1; y <= y1 + dy; ++y, f += step) s.insert({f >> 16, y});
    }
    return s;
}

// The disc rule of circle_fill written per pixel. With (L, T, R, B) the clip:
// r = |radius|, q = r^2, y0 = max(cy - r, T), yEnd = min(cy + r + 1, B),
// yMid = min(cy, yEnd). Upper rows y0 <= y < yMid (d = cy - y, m = y - y0)
// hold the pixels with q >= d^2 - max(m, d) + ax(ax - 1), ax = |x - cx|.
// Lower rows from yFirst = max(y0, yMid) (e0 = yFirst - yMid, m = y - yFirst,
// e = e0 + m) hold those with ax <= r and q >= e^2 - m + ax(ax - 1) or
// q >= e^2 - m - e0 - r + ax(ax + 1).
bool disc_has(i64 cx, i64 cy, i64 radius, i64 T, i64 B, i64 x, i64 y) {
    const i64 r = std::min<i64>(radius < 0 ? -radius : radius, INT_MAX), q = r * r;
    const i64 y0 = std::max(cy - r, T), yEnd = std::min(cy + r + 1, B), yMid = std::min(cy, yEnd);
    const i64 ax = x < cx ? cx - x : x - cx;
    if (y >= y0 && y < yMid) {
        const i64 d = cy - y, m = y - y0;
        return q >= d * d - std::max(m, d) + ax * (ax - 1);
    }
    const i64 yFirst = std::max(y0, yMid);
    if (y >= yFirst && y < yEnd) {
        const i64 e0 = yFirst - yMid, m = y - yFirst, e = e0 + m;
        return ax <= r && (q >= e * e - m + ax * (ax - 1) || q >= e * e - m - e0 - r + ax * (ax + 1));
    }
    return false;
}

struct random_mask {
    std::vector<int> starts, lengths;
    int x, y;
    random_mask(std::mt19937& rng) {
        for (int r = int(rng() % 30); r > 0; --r) {
            starts.push_back(int(rng() % 60) - 15);
            lengths.push_back(rng() % 6 == 0 ? -int(rng() % 3) : int(rng() % 50));
        }
        x = int(rng() % 80) - 20;
        y = int(rng() % 70) - 20;
    }
    bool covers(i64 px, i64 py) const {
        i64 r = py - y;
        if (r < 0 || r >= i64(starts.size())) return false;
        return px >= x + starts[size_t(r)] && px < i64(x) + starts[size_t(r)] + lengths[size_t(r)];
    }
};

bool throws_iae(const std::function<void()>& call) {
    try {
        call();
    } catch (IllegalArgumentException* e) {
        delete e;
        return true;
    }
    return false;
}

}  // namespace

TEST_F(Draw2D, RectFillMatchesClippedReference) {
    for (int seed = 0; seed < 600; ++seed) {
        std::mt19937 rng(seed);
        randomise(rng);
        random_clip(rng);
        int x = int(rng() % 100) - 20, y = int(rng() % 80) - 20, w = int(rng() % 90) - 10, h = int(rng() % 70) - 10;
        if (seed % 10 == 0) {  // extreme coordinates
            x = (rng() % 2) ? INT_MIN + int(rng() % 8) : INT_MAX - int(rng() % 8);
            w = (rng() % 2) ? INT_MAX : INT_MIN;
        }
        unsigned mode = rng() % 3;
        uint32_t colour = rng();
        std::set<std::pair<i64, i64>> set;
        for (i64 py = 0; py < H; ++py)
            for (i64 pxl = 0; pxl < W; ++pxl)
                if (pxl >= x && pxl < i64(x) + w && py >= y && py < i64(y) + h) set.insert({pxl, py});
        std::vector<uint32_t> e = expect_pixels(snapshot(), set, colour, mode);
        tk->rect_fill(x, y, w, h, colour, mode);
        expect_buffer(e, "rect_fill", seed);
    }
}

TEST_F(Draw2D, UnknownModesThrowBeforeDrawingAndNoTargetDrawsNothing) {
    std::mt19937 rng(1);
    randomise(rng);
    const std::vector<uint32_t> before = snapshot();
    tk->setclipping(10, 10, 20, 20);
    EXPECT_TRUE(throws_iae([&] { tk->rect_fill(-100, -100, 5, 5, 0xFFFFFFFFu, 3); }));
    EXPECT_TRUE(throws_iae([&] { tk->line(-50, -50, -40, -50, 0xFFFFFFFFu, 3); }));  // horizontal, off-clip
    EXPECT_TRUE(throws_iae([&] { tk->circle_fill(-500, -500, 0.0f, 3, 0xFFFFFFFFu, 7); }));
    EXPECT_TRUE(throws_iae([&] { tk->line_h(0, 15, 1, 0xFFFFFFFFu, 3); }));  // row inside, run outside
    // a run whose row (column) lies outside the clip returns before the mode is looked at
    EXPECT_FALSE(throws_iae([&] { tk->line_h(0, 5, 10, 0xFFFFFFFFu, 3); }));
    EXPECT_FALSE(throws_iae([&] { tk->line_v(25, 12, 10, 0xFFFFFFFFu, 3); }));
    tk->circle_outline(30, 20, 0, 10, 0xFFFFFFFFu, 17);  // the outline draws nothing
    expect_buffer(before, "after rejected modes", 1);
    tk->set_active_canvas(nullptr);
    EXPECT_NO_THROW(tk->rect_fill(0, 0, 10, 10, 0, 9));
    EXPECT_NO_THROW(tk->line(0, 0, 10, 10, 0, 9));
    EXPECT_NO_THROW(tk->circle_fill(0, 0, 0.0f, 10, 0, 9));
    EXPECT_NO_THROW(tk->cls(0));
}

TEST_F(Draw2D, LinesMatchSteppedReferenceUnderClipping) {
    for (int seed = 0; seed < 1500; ++seed) {
        std::mt19937 rng(seed);
        randomise(rng);
        random_clip(rng);
        const int x1 = int(rng() % 160) - 50, y1 = int(rng() % 140) - 45;
        int x2 = int(rng() % 160) - 50, y2 = int(rng() % 140) - 45;
        if (seed % 7 == 0) y2 = y1;
        if (seed % 11 == 0) x2 = x1;
        const unsigned mode = rng() % 3;
        const uint32_t colour = rng();
        std::vector<uint32_t> e = expect_pixels(snapshot(), line_pixels(x1, y1, x2, y2, true), colour, mode);
        tk->line(x1, y1, x2, y2, colour, mode);
        expect_buffer(e, "line", seed);
        const int len = int(rng() % 90) - 10;  // runs from the first end point
        std::set<std::pair<i64, i64>> h, v;
        for (int i = 0; i < len; ++i) {
            h.insert({x1 + i, y1});
            v.insert({x1, y1 + i});
        }
        e = expect_pixels(snapshot(), h, colour, 0);
        tk->line_h(x1, y1, len, colour, 0);
        expect_buffer(e, "line_h", seed);
        e = expect_pixels(snapshot(), v, colour, 2);
        tk->line_v(x1, y1, len, colour, 2);
        expect_buffer(e, "line_v", seed);
    }
}

// Coordinate differences of 32768 and more: every written pixel lies inside
// the clip and on the ideal line (within the 16.16 slope's rounding), each
// column (x-major) or row (y-major) gets at most one.
TEST_F(Draw2D, LongLinesStayInsideTheClipAndOnTheLine) {
    const int cases[][4] = {{-40000, 5, 40000, 40},     {5, -40000, 60, 40000},     {INT_MIN, 10, INT_MAX, 30},
                            {20, INT_MAX, 40, INT_MIN}, {INT_MAX, INT_MAX, INT_MIN, INT_MIN}, {0, 0, 32768, 32767}};
    for (int n = 0; n < 12; ++n) {
        const int* c = cases[n / 2];
        tk->resetclipping();
        tk->cls(0x01020304u);
        if (n % 2) tk->setclipping(7, 9, 50, 30);
        tk->line(c[0], c[1], c[2], c[3], 0xFF00FF00u, 0);
        const long double x1 = c[0], y1 = c[1], x2 = c[2], y2 = c[3];
        const bool xmajor = std::fabs(x2 - x1) > std::fabs(y2 - y1);
        const long double tol = 0.51L + (xmajor ? std::fabs(x2 - x1) : std::fabs(y2 - y1)) / 131072.0L;
        std::vector<int> perMajor(xmajor ? W : H, 0);
        for (int y = 0; y < H; ++y)
            for (int x = 0; x < W; ++x) {
                if (px()[y * W + x] == 0x01020304u) continue;
                ASSERT_TRUE(in_clip(x, y)) << "case " << n << " wrote (" << x << "," << y << ")";
                long double off = xmajor ? (y1 + (y2 - y1) * (x - x1) / (x2 - x1)) - y
                                         : (x1 + (x2 - x1) * (y - y1) / (y2 - y1)) - x;
                ASSERT_LE(tol < 4 ? std::fabs(off) : 0.0L, tol) << "case " << n << " (" << x << "," << y << ")";
                ASSERT_LE(++perMajor[size_t(xmajor ? x : y)], 1) << "case " << n;
            }
        // every column (row) where the line crosses the clip well inside gets its pixel
        for (int i = 0; tol < 4 && i < int(perMajor.size()); ++i) {
            const long double other = xmajor ? y1 + (y2 - y1) * (i - x1) / (x2 - x1) : x1 + (x2 - x1) * (i - y1) / (y2 - y1);
            const int lo = xmajor ? tk->m_ClipTop : tk->m_ClipLeft, hi = xmajor ? tk->m_ClipBottom : tk->m_ClipRight;
            const bool inMajor = xmajor ? i >= tk->m_ClipLeft && i < tk->m_ClipRight : i >= tk->m_ClipTop && i < tk->m_ClipBottom;
            const bool crossesInside = inMajor && other > lo + tol + 1 && other < hi - tol - 1;
            ASSERT_TRUE(!crossesInside || perMajor[size_t(i)] == 1) << "case " << n << " at " << i;
        }
    }
}

TEST_F(Draw2D, CirclesMatchTheDiscRuleUnderClipping) {
    const int huge[][3] = {{20, -2000000000, 2000000030}, {30, 20, INT_MIN}, {INT_MAX, INT_MAX, INT_MAX}, {INT_MIN, 0, 40000}};
    for (int seed = 0; seed < 1500; ++seed) {
        std::mt19937 rng(seed);
        randomise(rng);
        random_clip(rng);
        int cx = int(rng() % 120) - 30, cy = int(rng() % 100) - 26, radius = int(rng() % 60) - 30;
        if (seed % 13 == 0) radius = int(rng() % 4);
        if (seed < 4) cx = huge[seed][0], cy = huge[seed][1], radius = huge[seed][2];
        const unsigned mode = rng() % 3;
        const uint32_t colour = rng();
        const bool depth = seed % 3 == 0;
        const float dz = float(int(rng() % 5)) - 2.0f;
        if (!depth) tk->m_DepthBuffer = nullptr;
        std::vector<uint32_t> e = snapshot();
        for (int y = 0; y < H; ++y)
            for (int x = 0; x < W; ++x)
                if (in_clip(x, y) && disc_has(cx, cy, radius, tk->m_ClipTop, tk->m_ClipBottom, x, y) &&
                    (!depth || cv->depthbuffer()[y * W + x] > dz))
                    e[size_t(y * W + x)] = apply_mode(e[size_t(y * W + x)], colour, mode);
        tk->circle_fill(cx, cy, dz, radius, colour, mode);
        tk->m_DepthBuffer = cv->depthbuffer();
        expect_buffer(e, "circle_fill", seed);
    }
}

TEST_F(Draw2D, MaskedClearsAndLinesMatchPerPixelReference) {
    memorymanager pool(1 << 16);
    for (int seed = 0; seed < 1500; ++seed) {
        std::mt19937 rng(seed);
        randomise(rng);
        random_clip(rng);
        random_mask m(rng);
        clippingmask mask(&pool, 0, 0, m.starts.data(), int(m.starts.size()), m.lengths.data(), int(m.lengths.size()));
        const uint32_t colour = rng();
        std::vector<uint32_t> e = snapshot();
        for (int y = 0; y < H; ++y)
            for (int x = 0; x < W; ++x)
                if (in_clip(x, y) && m.covers(x, y)) e[size_t(y * W + x)] = colour;
        tk->cls_masked(colour, mask, m.x, m.y);
        expect_buffer(e, "cls_masked", seed);

        const int x1 = int(rng() % 120) - 30, y1 = int(rng() % 100) - 26;
        int x2 = int(rng() % 120) - 30, y2 = int(rng() % 100) - 26;
        if (seed % 5 == 0) y2 = y1;
        if (seed % 7 == 0) x2 = x1;
        const unsigned mode = rng() % 3;
        std::set<std::pair<i64, i64>> pixels;
        for (auto& p : line_pixels(x1, y1, x2, y2, false))
            if (m.covers(p.first, p.second)) pixels.insert(p);
        e = expect_pixels(snapshot(), pixels, colour, mode);
        tk->line(x1, y1, x2, y2, colour, mode, mask, m.x, m.y);
        expect_buffer(e, "masked line", seed);
    }
}

TEST(ClippingMask, CreationRejectsShortLengthsAndExtremePlacementsStayInside) {
    memorymanager pool(4096);
    std::vector<int> s = {1, 2, 3}, l = {4, 5};
    EXPECT_TRUE(throws_iae([&] { clippingmask bad(&pool, 1, 1, s.data(), 3, l.data(), 2); }));
    EXPECT_TRUE(throws_iae([&] { clippingmask bad(&pool, 1, 1, s.data(), 3, nullptr, 0); }));
    std::vector<int> big = {INT_MAX, INT_MIN}, bigl = {INT_MAX, INT_MAX};
    clippingmask far(&pool, 0, 0, big.data(), 2, bigl.data(), 2);
    int x0 = 0, x1 = 0;
    mask_placement p(&far, INT_MAX, 10, 0, 0, 64, 48);
    EXPECT_FALSE(p.span(10, x0, x1));
    EXPECT_TRUE(p.span(11, x0, x1));  // INT_MAX + INT_MIN = -1, covers -1 .. 2^31 - 2
    EXPECT_EQ(x0, 0);
    EXPECT_EQ(x1, 64);
    mask_placement q(&far, 0, INT_MAX, 0, 0, 64, 48);
    EXPECT_GE(q.first_row(), q.end_row());
}
