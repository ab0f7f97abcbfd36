// Sprite blitters against per-pixel references written from the colour
// operation and blend mode formulas: every operation x blend mode over random
// pixels, positions (alignments) and clips; scaled sampling positions; depth
// tests; tiling; parallelograms.
#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <limits>
#include <random>
#include <vector>

#include "render/DepthBuffer.h"
#include "render/toolkit.h"
#include "sprite/Sprite.h"
#include "sprite/SpritePixel.h"
#include "text/clippingmask.h"
#include "util/memorymanager/memorymanager.h"

namespace {

// ---- reference formulas, per channel ------------------------------------------

uint32_t ref_op(int op, uint32_t s, uint32_t col) {
    uint32_t a = col >> 24, out = 0;
    for (int c = 0; c < 4; ++c) {
        int sc = (s >> (8 * c)) & 255, kc = (col >> (8 * c)) & 255, r = 0;
        switch (op) {
            case 0: r = sc * kc / 256; break;
            case 1: r = sc; break;
            case 2: r = sc * int(a) / 256 + kc * (255 - int(a)) / 256; break;
            case 3: r = std::min(sc + kc, 255); break;
            case 4: r = std::max(sc - kc, 0); break;
        }
        out |= uint32_t(r) << (8 * c);
    }
    return out;
}

uint32_t ref_blend(int blend, uint32_t s, uint32_t d) {
    int A = int(s >> 24);
    uint32_t out = 0;
    for (int c = 0; c < 4; ++c) {
        int sc = (s >> (8 * c)) & 255, dc = (d >> (8 * c)) & 255, r = 0;
        switch (blend) {
            case 0: r = sc; break;
            case 1: r = (sc * A + dc * (256 - A)) / 256; break;
            case 2: r = std::min(sc + dc, 255); break;
        }
        out |= uint32_t(r) << (8 * c);
    }
    return out;
}

uint32_t ref_pixel(int op, int blend, uint32_t s, uint32_t d, uint32_t col) {
    return ref_blend(blend, ref_op(op, s, col), d);
}

// ---- a toolkit drawing into an offscreen pair --------------------------------------

// One toolkit for the whole suite (building one fills the colour tables).
class SpriteRender : public ::testing::Test {
public:
    static toolkit* shared;
    static void SetUpTestSuite() { shared = toolkit::create(nullptr, false, 0); }
    static void TearDownTestSuite() {
        toolkit::destroy(shared);
        shared = nullptr;
    }
};
toolkit* SpriteRender::shared = nullptr;

struct Scene {
    toolkit* t;
    Sprite_c target;
    DepthBuffer_c depth;
    int w, h;
    bool withColour, withDepth;
    Scene(int w, int h, bool withColour = true, bool withDepth = true)
        : t(SpriteRender::shared), w(w), h(h), withColour(withColour), withDepth(withDepth) {
        target.Allocate(w, h);
        depth.Allocate(w, h);
        activate();
    }
    void activate() { t->start_offscreen_render(withColour ? &target : nullptr, withDepth ? &depth : nullptr); }
    ~Scene() { t->start_offscreen_render(nullptr, nullptr); }
    uint32_t* px() { return target.Pixels; }
    std::vector<uint32_t> pixels() const { return std::vector<uint32_t>(target.Pixels, target.Pixels + w * h); }
    void fill_random(std::mt19937& rng) {
        for (int i = 0; i < w * h; ++i) target.Pixels[i] = rng();
    }
    void clip(int l, int t_, int r, int b) { t->setclipping(l, t_, r, b); }
    bool in_clip(long long x, long long y) const {
        return x >= t->m_ClipLeft && x < t->m_ClipRight && y >= t->m_ClipTop && y < t->m_ClipBottom;
    }
};

// A source sprite whose pixels start at a chosen misalignment, with a pitch
// larger than its width.
struct Source {
    std::vector<uint32_t> store;
    Sprite_c sprite;
    Source(std::mt19937& rng, int w, int h, int misalign, int extraPitch) {
        int pitch = w + extraPitch;
        store.resize(size_t(pitch) * h + 4);
        for (auto& v : store) {
            uint32_t r = rng();
            // plenty of fully transparent and fully opaque pixels
            if (r % 7 == 0) v = r & 0x00FFFFFFu;
            else if (r % 7 == 1) v = r | 0xFF000000u;
            else v = r;
        }
        sprite.WrapForeign(store.data() + misalign, w, h, pitch);
    }
    uint32_t at(int x, int y) const { return sprite.Pixels[y * sprite.Pitch + x]; }
};

Sprite_c::RenderParams_s params(int x, int y, uint32_t col, int w = 0, int h = 0, float depth = 0) {
    Sprite_c::RenderParams_s p = {};
    p.x = x, p.y = y, p.colour = col, p.width = w, p.height = h, p.depth = depth;
    return p;
}

Sprite_c::ParallelogramRenderParams_s corners(float x0, float y0, float x1, float y1, float x2, float y2, uint32_t col) {
    Sprite_c::ParallelogramRenderParams_s p = {};
    p.x0 = x0, p.y0 = y0, p.x1 = x1, p.y1 = y1, p.x2 = x2, p.y2 = y2, p.colour = col;
    return p;
}

// ---- the formulas' own examples ---------------------------------------------------

TEST(SpritePixel, Examples) {
    using namespace SpritePixel_n;
    // modulate by 0xFFFFFFFF maps 255 to 254
    EXPECT_EQ((Pixel1<0, 0>(0xFFFFFFFFu, 0, MakeConsts(0xFFFFFFFFu))), 0xFEFEFEFEu);
    // add saturates per channel, alpha included
    EXPECT_EQ((Pixel1<1, 2>(0x80F01080u, 0x90209090u, MakeConsts(0))), 0xFFFFA0FFu);
    EXPECT_EQ((Pixel1<3, 0>(0x10F08001u, 0, MakeConsts(0x20208080u))), 0x30FFFF81u);
    EXPECT_EQ((Pixel1<4, 0>(0x10F08001u, 0, MakeConsts(0x20208080u))), 0x00D00000u);
    // tint at alpha 255: the source times 255/256; at alpha 0: col times 255/256
    EXPECT_EQ((Pixel1<2, 0>(0x80FF4020u, 0, MakeConsts(0xFF123456u))), 0x7FFE3F1Fu);
    EXPECT_EQ((Pixel1<2, 0>(0x80FF4020u, 0, MakeConsts(0x00FF8040u))), 0x00FE7F3Fu);
    // alpha blend of a half-transparent red over blue
    EXPECT_EQ((Pixel1<1, 1>(0x80FF0000u, 0xFF0000FFu, MakeConsts(0))), 0xBF7F007Fu);
    // the four-pixel form agrees on the same examples
    alignas(16) uint32_t out[4];
    _mm_store_si128(reinterpret_cast<__m128i*>(out),
                    Pixel4<2, 0>(_mm_set1_epi32(int(0x80FF4020u)), _mm_setzero_si128(), MakeConsts(0xFF123456u)));
    EXPECT_EQ(out[3], 0x7FFE3F1Fu);
}

// Both per-pixel forms against the reference formulas over random words.
TEST(SpritePixel, BothFormsMatchTheFormulas) {
    using namespace SpritePixel_n;
    std::mt19937 rng(1);
    for (int round = 0; round < 2000; ++round) {
        uint32_t col = rng();
        if (round % 5 == 0) col = (col & 0x00FFFFFFu) | (round % 2 ? 0xFF000000u : 0u);
        Consts_s k = MakeConsts(col);
        alignas(16) uint32_t s[4], d[4], o[4];
        for (int i = 0; i < 4; ++i) s[i] = rng(), d[i] = rng();
        __m128i vs = _mm_load_si128(reinterpret_cast<const __m128i*>(s));
        __m128i vd = _mm_load_si128(reinterpret_cast<const __m128i*>(d));
#define CHECK_MODE(Op, Blend)                                                                          \
    _mm_store_si128(reinterpret_cast<__m128i*>(o), Pixel4<Op, Blend>(vs, vd, k));                     \
    for (int i = 0; i < 4; ++i) {                                                                      \
        uint32_t e = ref_pixel(Op, Blend, s[i], d[i], col);                                            \
        ASSERT_EQ((Pixel1<Op, Blend>(s[i], d[i], k)), e) << "op " << Op << " blend " << Blend << " round " << round; \
        ASSERT_EQ(o[i], e) << "op " << Op << " blend " << Blend << " round " << round;                 \
    }
#define CHECK_OP(Op) CHECK_MODE(Op, 0) CHECK_MODE(Op, 1) CHECK_MODE(Op, 2)
        CHECK_OP(0) CHECK_OP(1) CHECK_OP(2) CHECK_OP(3) CHECK_OP(4)
#undef CHECK_OP
#undef CHECK_MODE
    }
}

// ---- unscaled ------------------------------------------------------------------------

// Every operation x blend mode, random sprites (with trims, misaligned rows),
// positions straddling every edge and random clips, against the reference.
TEST_F(SpriteRender, UnscaledEveryModeMatchesReference) {
    for (int seed = 0; seed < 300; ++seed) {
        SCOPED_TRACE(seed);
        std::mt19937 rng(seed);
        int op = seed % 5, blend = (seed / 5) % 3;
        Scene sc(37, 23);
        sc.fill_random(rng);
        int w = 1 + rng() % 30, h = 1 + rng() % 12;
        Source src(rng, w, h, rng() % 4, rng() % 3);
        Sprite_c& s = src.sprite;
        s.OffsetLeft = rng() % 4, s.OffsetTop = rng() % 3, s.OffsetRight = rng() % 3, s.OffsetBottom = rng() % 2;
        if (seed % 4 == 0) sc.clip(int(rng() % 10), int(rng() % 8), 20 + int(rng() % 20), 12 + int(rng() % 12));
        int x = int(rng() % 60) - 20, y = int(rng() % 40) - 15;
        uint32_t col = rng();
        std::vector<uint32_t> expect = sc.pixels();
        for (int j = 0; j < h; ++j)
            for (int i = 0; i < w; ++i) {
                long long X = x + s.OffsetLeft + i, Y = y + s.OffsetTop + j;
                if (!sc.in_clip(X, Y)) continue;
                uint32_t& d = expect[size_t(Y * 37 + X)];
                d = ref_pixel(op, blend, src.at(i, j), d, col);
            }
        s.Draw(*sc.t, op, blend, params(x, y, col));
        ASSERT_EQ(sc.pixels(), expect) << "op " << op << " blend " << blend;
    }
}

TEST_F(SpriteRender, ClippedAtTheLeftStartsAtTheFirstVisibleColumn) {
    Scene sc(16, 4);
    std::fill(sc.px(), sc.px() + 64, 0u);
    std::vector<uint32_t> pix(8);
    for (int i = 0; i < 8; ++i) pix[i] = 0xFF000000u + i;
    Sprite_c s;
    s.Allocate(8, 1);
    s.Copy(pix.data(), 8, false);
    sc.clip(3, 0, 16, 4);
    s.Draw(*sc.t, 1, 0, params(0, 1, 0));
    for (int x = 0; x < 16; ++x) EXPECT_EQ(sc.px()[16 + x], x >= 3 && x < 8 ? 0xFF000000u + x : 0u) << x;
    // entirely left of the clip: nothing
    s.Draw(*sc.t, 1, 0, params(-6, 2, 0));
    for (int x = 0; x < 16; ++x) EXPECT_EQ(sc.px()[32 + x], 0u);
    // invalid modes draw nothing
    s.Draw(*sc.t, 5, 0, params(3, 3, 0));
    s.Draw(*sc.t, 1, 3, params(3, 3, 0));
    s.Draw(*sc.t, -1, 0, params(3, 3, 0));
    for (int x = 0; x < 16; ++x) EXPECT_EQ(sc.px()[48 + x], 0u);
}

// ---- scaled --------------------------------------------------------------------------

TEST_F(SpriteRender, ScaledSamplingPositions) {
    // a 4 x 1 sprite of distinct pixels
    Sprite_c s;
    s.Allocate(4, 1);
    for (int i = 0; i < 4; ++i) s.Pixels[i] = 0xFF000010u + i;
    auto row = [&](int width, int x, int off) {
        Scene sc(24, 2);
        std::fill(sc.px(), sc.px() + 48, 0u);
        s.OffsetLeft = off;
        s.OffsetRight = off;
        s.DrawScaled(*sc.t, 1, 0, params(x, 0, 0, width, 1));
        std::vector<int> got;
        for (int i = 0; i < 24; ++i) got.push_back(sc.px()[i] ? int(sc.px()[i] - 0xFF000010u) : -1);
        return got;
    };
    std::vector<int> up = row(8, 1, 0);  // doubled
    EXPECT_EQ(up, (std::vector<int>{-1, 0, 0, 1, 1, 2, 2, 3, 3, -1, -1, -1, -1, -1, -1, -1, -1, -1, -1, -1, -1, -1, -1, -1}));
    std::vector<int> down = row(2, 0, 0);  // halved: columns 0 and 2
    EXPECT_EQ(std::vector<int>(down.begin(), down.begin() + 3), (std::vector<int>{0, 2, -1}));
    std::vector<int> seven = row(7, 0, 0);  // trunc(i x 4/7)
    EXPECT_EQ(std::vector<int>(seven.begin(), seven.begin() + 8), (std::vector<int>{0, 0, 1, 1, 2, 2, 3, -1}));
    // trimmed: full width 6 (1 + 4 + 1) drawn at 12: trims scale to 2, the
    // stored pixels cover columns 2..9, two each
    std::vector<int> trimmed = row(12, 0, 1);
    EXPECT_EQ(std::vector<int>(trimmed.begin(), trimmed.begin() + 12),
              (std::vector<int>{-1, -1, 0, 0, 1, 1, 2, 2, 3, 3, -1, -1}));
    // trims truncated: full width 6 drawn at 9: trims trunc(1.5) = 1, 7 columns
    std::vector<int> odd = row(9, 0, 1);
    EXPECT_EQ(std::vector<int>(odd.begin(), odd.begin() + 10), (std::vector<int>{-1, 0, 0, 1, 1, 2, 2, 3, -1, -1}));
}

TEST_F(SpriteRender, ScaledEveryModeMatchesReference) {
    for (int seed = 0; seed < 150; ++seed) {
        SCOPED_TRACE(seed);
        std::mt19937 rng(1000 + seed);
        int op = seed % 5, blend = (seed / 5) % 3;
        Scene sc(41, 29);
        sc.fill_random(rng);
        int w = 1 + rng() % 12, h = 1 + rng() % 9;
        Source src(rng, w, h, rng() % 4, 0);
        Sprite_c& s = src.sprite;
        int dw = 1 + rng() % 50, dh = 1 + rng() % 35;
        int x = int(rng() % 50) - 15, y = int(rng() % 40) - 10;
        if (seed % 3 == 0) sc.clip(int(rng() % 10), int(rng() % 8), 25 + int(rng() % 20), 15 + int(rng() % 14));
        uint32_t col = rng();
        // without trims destination pixel (i, j) of the box samples texel
        // (trunc(i x step), trunc(j x step)), steps w / dw and h / dh in
        // single precision
        std::vector<uint32_t> expect = sc.pixels();
        for (int j = 0; j < dh; ++j)
            for (int i = 0; i < dw; ++i) {
                if (!sc.in_clip(x + i, y + j)) continue;
                int u = std::min(int(float(i) * (float(w) / float(dw))), w - 1);
                int v = std::min(int(float(j) * (float(h) / float(dh))), h - 1);
                uint32_t& d = expect[size_t((y + j) * 41 + x + i)];
                d = ref_pixel(op, blend, src.at(u, v), d, col);
            }
        s.DrawScaled(*sc.t, op, blend, params(x, y, col, dw, dh));
        ASSERT_EQ(sc.pixels(), expect) << "op " << op << " blend " << blend << " " << w << "x" << h << " -> " << dw << "x" << dh;
    }
}

TEST_F(SpriteRender, ScaledOddSizesDrawNothing) {
    Scene sc(16, 16);
    std::fill(sc.px(), sc.px() + 256, 7u);
    Sprite_c s;
    s.Allocate(4, 4);
    std::fill(s.Pixels, s.Pixels + 16, 0xFFFFFFFFu);
    s.DrawScaled(*sc.t, 1, 0, params(0, 0, 0, 0x7FFFFFFF, 8));
    s.DrawScaled(*sc.t, 1, 0, params(0, 0, 0, 8, -3));
    s.DrawScaled(*sc.t, 1, 0, params(0, 0, 0, 0, 8));
    s.OffsetLeft = -4;  // full width 0
    s.DrawScaled(*sc.t, 1, 0, params(0, 0, 0, 8, 8));
    s.OffsetLeft = -0x7FFFFFFF;  // full width negative
    s.DrawScaled(*sc.t, 1, 0, params(0, 0, 0, 8, 8));
    s.OffsetLeft = 0x7FFFFFFF;  // huge trims
    s.OffsetRight = 0x7FFFFFFF;
    s.DrawScaled(*sc.t, 1, 0, params(0, 0, 0, 8, 8));
    for (int i = 0; i < 256; ++i) ASSERT_EQ(sc.px()[i], 7u) << i;
}

// ---- depth-tested ------------------------------------------------------------------------

TEST_F(SpriteRender, DepthTested) {
    for (int seed = 0; seed < 45; ++seed) {
        SCOPED_TRACE(seed);
        std::mt19937 rng(2000 + seed);
        int op = seed % 5, blend = (seed / 5) % 3;
        bool colour = seed % 9 != 4;
        Scene sc(33, 20, colour, true);
        sc.fill_random(rng);
        for (int i = 0; i < 33 * 20; ++i) sc.depth.Data[i] = float(rng() % 8);
        std::vector<float> depthBefore(sc.depth.Data, sc.depth.Data + 33 * 20);
        int w = 1 + rng() % 10, h = 1 + rng() % 10;
        Source src(rng, w, h, rng() % 4, 0);
        int dw = w * (1 + rng() % 3), dh = h;
        int x = int(rng() % 40) - 8, y = int(rng() % 25) - 5;
        float depth = float(rng() % 8);
        uint32_t col = rng();
        std::vector<uint32_t> expect = sc.pixels();
        if (colour)
            for (int j = 0; j < dh; ++j)
                for (int i = 0; i < dw; ++i) {
                    int X = x + i, Y = y + j;
                    if (!sc.in_clip(X, Y) || !(depth <= sc.depth.Data[Y * 33 + X])) continue;
                    uint32_t& d = expect[size_t(Y * 33 + X)];
                    d = ref_pixel(op, blend, src.at(i * w / dw, j), d, col);
                }
        src.sprite.DrawScaledDepth(*sc.t, op, blend, params(x, y, col, dw, dh, depth));
        ASSERT_EQ(sc.pixels(), expect);
        ASSERT_TRUE(std::equal(depthBefore.begin(), depthBefore.end(), sc.depth.Data));  // depth not written
    }
}

TEST_F(SpriteRender, DepthTestWithoutDepthBufferDrawsPlainScaled) {
    Scene sc(8, 8, true, false);
    std::fill(sc.px(), sc.px() + 64, 0u);
    Sprite_c s;
    s.Allocate(1, 1);
    s.Pixels[0] = 0xFF00FF00u;
    s.DrawScaledDepth(*sc.t, 1, 0, params(2, 2, 0, 3, 3, 1e30f));
    EXPECT_EQ(sc.px()[2 * 8 + 2], 0xFF00FF00u);
    EXPECT_EQ(sc.px()[4 * 8 + 4], 0xFF00FF00u);
    EXPECT_EQ(sc.px()[5 * 8 + 5], 0u);
}

// ---- tiled -----------------------------------------------------------------------------

TEST_F(SpriteRender, Tiled10x10Over25x5) {
    Scene sc(40, 20);
    std::fill(sc.px(), sc.px() + 800, 0u);
    Sprite_c s;
    s.Allocate(10, 10);
    for (int i = 0; i < 100; ++i) s.Pixels[i] = 0xFF000000u + i;
    s.DrawTiled(*sc.t, 1, 0, params(3, 2, 0, 25, 5));
    for (int y = 0; y < 20; ++y)
        for (int x = 0; x < 40; ++x) {
            int i = x - 3, j = y - 2;
            uint32_t e = (i >= 0 && i < 25 && j >= 0 && j < 5) ? 0xFF000000u + (j % 10) * 10 + i % 10 : 0u;
            ASSERT_EQ(sc.px()[y * 40 + x], e) << x << "," << y;
        }
    // the clipping rectangle is the caller's again afterwards
    int clip[4];
    sc.t->getclipping(clip);
    EXPECT_EQ(clip[2], 40);
    EXPECT_EQ(clip[3], 20);
}

TEST_F(SpriteRender, TiledWithTrimsClipAndModes) {
    for (int seed = 0; seed < 60; ++seed) {
        SCOPED_TRACE(seed);
        std::mt19937 rng(3000 + seed);
        int op = seed % 5, blend = (seed / 5) % 3;
        Scene sc(45, 31);
        sc.fill_random(rng);
        int w = 1 + rng() % 7, h = 1 + rng() % 6;
        Source src(rng, w, h, rng() % 4, 1);
        Sprite_c& s = src.sprite;
        s.OffsetLeft = rng() % 3, s.OffsetTop = rng() % 3, s.OffsetRight = rng() % 3, s.OffsetBottom = rng() % 3;
        int fw = int(s.FullWidth()), fh = int(s.FullHeight());
        int x = int(rng() % 30) - 10, y = int(rng() % 20) - 6, tw = 1 + rng() % 40, th = 1 + rng() % 30;
        if (seed % 2) sc.clip(int(rng() % 8), int(rng() % 8), 20 + int(rng() % 25), 15 + int(rng() % 16));
        uint32_t col = rng();
        std::vector<uint32_t> expect = sc.pixels();
        for (int Y = 0; Y < 31; ++Y)
            for (int X = 0; X < 45; ++X) {
                if (!sc.in_clip(X, Y) || X >= x + tw || Y >= y + th || X < x || Y < y) continue;
                int i = (X - x) % fw - s.OffsetLeft, j = (Y - y) % fh - s.OffsetTop;
                if (i < 0 || j < 0 || i >= w || j >= h) continue;
                uint32_t& d = expect[size_t(Y * 45 + X)];
                d = ref_pixel(op, blend, src.at(i, j), d, col);
            }
        s.DrawTiled(*sc.t, op, blend, params(x, y, col, tw, th));
        ASSERT_EQ(sc.pixels(), expect);
    }
}

TEST_F(SpriteRender, TilingEmptyOrHugeIsSafe) {
    Scene sc(16, 16);
    std::fill(sc.px(), sc.px() + 256, 5u);
    Sprite_c empty;
    empty.Allocate(0, 4);  // full width 0
    empty.DrawTiled(*sc.t, 1, 0, params(0, 0, 0, 10, 10));
    Sprite_c s;
    s.Allocate(1, 1);
    s.Pixels[0] = 0xFFFFFFFFu;
    s.OffsetLeft = -1;  // full width 0 with stored pixels
    s.DrawTiled(*sc.t, 1, 0, params(0, 0, 0, 10, 10));
    for (int i = 0; i < 256; ++i) ASSERT_EQ(sc.px()[i], 5u);
    // a huge area of 1 x 1 tiles visits only the tiles inside the clip
    s.OffsetLeft = 0;
    s.DrawTiled(*sc.t, 1, 0, params(-0x7FFFFFF0, -0x7FFFFFF0, 0, 0x7FFFFFFF, 0x7FFFFFFF));
    for (int i = 0; i < 256; ++i) ASSERT_EQ(sc.px()[i], i < 15 * 16 && i % 16 < 15 ? 0xFFFFFFFFu : 5u) << i;
}

// ---- parallelograms ------------------------------------------------------------------------

TEST_F(SpriteRender, AxisAlignedParallelogramEqualsUnscaledBlit) {
    for (int seed = 0; seed < 150; ++seed) {
        SCOPED_TRACE(seed);
        std::mt19937 rng(4000 + seed);
        int op = seed % 5, blend = (seed / 5) % 3;
        Scene a(37, 23), b(37, 23);
        a.fill_random(rng);
        std::copy(a.px(), a.px() + 37 * 23, b.px());
        int w = 1 + rng() % 30, h = 1 + rng() % 12;
        Source src(rng, w, h, rng() % 4, 0);
        Sprite_c& s = src.sprite;
        s.OffsetLeft = rng() % 4, s.OffsetTop = rng() % 3, s.OffsetRight = rng() % 3, s.OffsetBottom = rng() % 2;
        int l = 0, t = 0, r = 37, bt = 23;
        if (seed % 3 == 0) l = int(rng() % 10), t = int(rng() % 8), r = 20 + int(rng() % 20), bt = 12 + int(rng() % 12);
        int x = int(rng() % 60) - 20, y = int(rng() % 40) - 15;
        float fw = float(s.FullWidth()), fh = float(s.FullHeight());
        uint32_t col = rng();
        a.activate();
        a.clip(l, t, r, bt);
        s.Draw(*a.t, op, blend, params(x, y, col));
        b.activate();
        b.clip(l, t, r, bt);
        s.DrawParallelogram(*b.t, op, blend, corners(float(x), float(y), x + fw, float(y), float(x), y + fh, col));
        ASSERT_EQ(b.pixels(), a.pixels()) << "op " << op << " blend " << blend;
    }
}

TEST_F(SpriteRender, QuarterTurnAndShear) {
    std::mt19937 rng(5);
    const int w = 8, h = 4;
    Source src(rng, w, h, 1, 0);
    for (int c = 0; c < 2; ++c) {
        Scene sc(24, 24);
        std::fill(sc.px(), sc.px() + 576, 0x12345678u);
        int x = 5, y = 3;
        if (c == 0)  // a quarter turn clockwise: the top edge runs down, the left edge to the left
            src.sprite.DrawParallelogram(*sc.t, 1, 0, corners(x + h, y, x + h, y + w, x, y, 0));
        else  // sheared: each row one pixel further right
            src.sprite.DrawParallelogram(*sc.t, 1, 0, corners(x, y, x + w, y, x + h, y + h, 0));
        for (int Y = 0; Y < 24; ++Y)
            for (int X = 0; X < 24; ++X) {
                int u, v;
                if (c == 0)
                    u = Y - y, v = x + h - 1 - X;
                else
                    v = Y - y, u = X - x - v;
                uint32_t e = (u >= 0 && u < w && v >= 0 && v < h) ? src.at(u, v) : 0x12345678u;
                ASSERT_EQ(sc.px()[Y * 24 + X], e) << "case " << c << " at " << X << "," << Y;
            }
    }
}

// A rotated and scaled parallelogram against a double-precision inverse map:
// every pixel whose centre maps well inside a texel must show that texel, and
// nothing is drawn outside the parallelogram (with half a pixel of slack).
TEST_F(SpriteRender, RotatedParallelogramSamplesTheRightTexels) {
    std::mt19937 rng(6);
    const int w = 16, h = 12;
    Source src(rng, w, h, 0, 0);
    for (int i = 0; i < w * h; ++i) src.sprite.Pixels[i] |= 0xFF000000u;
    for (int step = 0; step < 24; ++step) {
        SCOPED_TRACE(step);
        double angle = step * 0.27, scale = 0.7 + 0.1 * (step % 7);
        double cx = 30, cy = 28, ca = std::cos(angle) * scale, sa = std::sin(angle) * scale;
        auto map = [&](double u, double v, double& X, double& Y) {
            X = cx + (u - w / 2.0) * ca - (v - h / 2.0) * sa;
            Y = cy + (u - w / 2.0) * sa + (v - h / 2.0) * ca;
        };
        double X0, Y0, X1, Y1, X2, Y2;
        map(0, 0, X0, Y0);
        map(w, 0, X1, Y1);
        map(0, h, X2, Y2);
        Scene sc(60, 56);
        std::fill(sc.px(), sc.px() + 60 * 56, 0u);
        src.sprite.DrawParallelogram(*sc.t, 1, 0, corners(float(X0), float(Y0), float(X1), float(Y1), float(X2), float(Y2), 0));
        int checked = 0;
        for (int Y = 0; Y < 56; ++Y)
            for (int X = 0; X < 60; ++X) {
                // inverse map of the pixel centre
                double dx = X + 0.5 - cx, dy = Y + 0.5 - cy;
                double u = (dx * ca + dy * sa) / (scale * scale) + w / 2.0;
                double v = (-dx * sa + dy * ca) / (scale * scale) + h / 2.0;
                double fu = u - std::floor(u), fv = v - std::floor(v);
                bool inside = u >= 0 && u < w && v >= 0 && v < h;
                bool clear = fu > 0.01 && fu < 0.99 && fv > 0.01 && fv < 0.99;
                uint32_t got = sc.px()[Y * 60 + X];
                if (inside && clear) {
                    ASSERT_EQ(got, src.at(int(u), int(v))) << X << "," << Y;
                    ++checked;
                }
                double slack = 0.75 / scale;
                if (u < -slack || u > w + slack || v < -slack || v > h + slack) {
                    ASSERT_EQ(got, 0u) << X << "," << Y;
                }
            }
        EXPECT_GT(checked, 40);
    }
}

TEST_F(SpriteRender, ParallelogramWithBadCornersDrawsNothing) {
    Scene sc(16, 16);
    std::fill(sc.px(), sc.px() + 256, 9u);
    Sprite_c s;
    s.Allocate(4, 4);
    std::fill(s.Pixels, s.Pixels + 16, 0xFFFFFFFFu);
    const float inf = std::numeric_limits<float>::infinity(), nan = std::numeric_limits<float>::quiet_NaN();
    const float bad[][6] = {
        {nan, 0, 8, 0, 0, 8},   {0, 0, inf, 0, 0, 8},       {0, 0, 8, 0, 0, -inf},   {1e30f, 0, 8, 0, 0, 8},
        {0, 0, 8, 0, 0, 1e20f}, {0, 0, 8, 8, 16, 16},        // degenerate: all corners on a line
        {0, 0, 0, 0, 0, 0},     {0, 0, 1e-7f, 0, 0, 1e-7f},  // collapsed to a point, tiny
    };
    for (const auto& c : bad) s.DrawParallelogram(*sc.t, 1, 0, corners(c[0], c[1], c[2], c[3], c[4], c[5], 0));
    s.OffsetLeft = -4;  // full width 0
    s.DrawParallelogram(*sc.t, 1, 0, corners(0, 0, 8, 0, 0, 8, 0));
    for (int i = 0; i < 256; ++i) ASSERT_EQ(sc.px()[i], 9u) << i;
}

// ---- masked ----------------------------------------------------------------------------

struct RandomMask {
    std::vector<int> starts, lengths;
    int x, y;
    RandomMask(std::mt19937& rng) {
        int rows = int(rng() % 30);
        for (int r = 0; r < rows; ++r) {
            starts.push_back(int(rng() % 40) - 10);
            lengths.push_back(int(rng() % 30) - 4);  // some empty or negative
        }
        x = int(rng() % 20) - 8;
        y = int(rng() % 24) - 8;
    }
    bool covers(long long X, long long Y) const {
        long long r = Y - y;
        if (r < 0 || r >= (long long)starts.size()) return false;
        long long a = x + starts[size_t(r)];
        return X >= a && X < a + lengths[size_t(r)];
    }
};

TEST_F(SpriteRender, MaskedMatchesPerPixelReference) {
    memorymanager pool(1 << 16);
    for (int seed = 0; seed < 120; ++seed) {
        SCOPED_TRACE(seed);
        std::mt19937 rng(6000 + seed);
        Scene sc(37, 23);
        sc.fill_random(rng);
        int w = 1 + rng() % 30, h = 1 + rng() % 12;
        Source src(rng, w, h, rng() % 4, rng() % 2);
        Sprite_c& s = src.sprite;
        s.OffsetLeft = rng() % 3, s.OffsetTop = rng() % 3;
        RandomMask m(rng);
        clippingmask mask(&pool, 0, 0, m.starts.data(), int(m.starts.size()), m.lengths.data(), int(m.lengths.size()));
        if (seed % 3 == 0) sc.clip(int(rng() % 10), int(rng() % 8), 20 + int(rng() % 20), 12 + int(rng() % 12));
        int x = int(rng() % 50) - 15, y = int(rng() % 34) - 10;
        std::vector<uint32_t> expect = sc.pixels();
        for (int j = 0; j < h; ++j)
            for (int i = 0; i < w; ++i) {
                long long X = x + s.OffsetLeft + i, Y = y + s.OffsetTop + j;
                if (!sc.in_clip(X, Y) || !m.covers(X, Y)) continue;
                uint32_t& d = expect[size_t(Y * 37 + X)];
                d = ref_pixel(1, 1, src.at(i, j), d, 0);
            }
        Sprite_c::RenderParams_s p = params(x, y, 0);
        p.mask = &mask, p.maskx = m.x, p.masky = m.y;
        s.DrawMasked(*sc.t, p);
        ASSERT_EQ(sc.pixels(), expect);

        // the parallelogram form, axis-aligned, replaced and blended
        for (int replace = 0; replace < 2; ++replace) {
            sc.fill_random(rng);
            expect = sc.pixels();
            for (int j = 0; j < h; ++j)
                for (int i = 0; i < w; ++i) {
                    long long X = x + s.OffsetLeft + i, Y = y + s.OffsetTop + j;
                    if (!sc.in_clip(X, Y) || !m.covers(X, Y)) continue;
                    uint32_t& d = expect[size_t(Y * 37 + X)];
                    d = ref_pixel(1, replace ? 0 : 1, src.at(i, j), d, 0);
                }
            float fw = float(s.FullWidth()), fh = float(s.FullHeight());
            Sprite_c::ParallelogramRenderParams_s q = corners(float(x), float(y), x + fw, float(y), float(x), y + fh, 0);
            q.mask = &mask, q.maskx = m.x, q.masky = m.y;
            s.DrawParallelogramMasked(*sc.t, replace != 0, q);
            ASSERT_EQ(sc.pixels(), expect) << "replace " << replace;
        }
    }
}

TEST_F(SpriteRender, NullOrEmptyMask) {
    memorymanager pool(4096);
    Scene sc(8, 8);
    std::fill(sc.px(), sc.px() + 64, 0u);
    Sprite_c s;
    s.Allocate(2, 2);
    std::fill(s.Pixels, s.Pixels + 4, 0xFF0000FFu);
    std::vector<int> zero(8, 0);
    clippingmask empty(&pool, 8, 8, zero.data(), 8, zero.data(), 8);  // every row covers nothing
    Sprite_c::RenderParams_s p = params(1, 1, 0);
    p.mask = &empty;
    s.DrawMasked(*sc.t, p);
    for (int i = 0; i < 64; ++i) ASSERT_EQ(sc.px()[i], 0u);
    p.mask = nullptr;  // no mask: drawn whole
    s.DrawMasked(*sc.t, p);
    const uint32_t blended = ref_pixel(1, 1, 0xFF0000FFu, 0, 0);
    EXPECT_EQ(sc.px()[9], blended);
    EXPECT_EQ(sc.px()[18], blended);
    EXPECT_EQ(sc.px()[19], 0u);
}

}  // namespace
