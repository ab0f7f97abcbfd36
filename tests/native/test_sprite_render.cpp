// Sprite blitters against per-pixel references written from the colour
// operation and blend mode formulas: every operation x blend mode over random
// pixels, positions (alignments) and clips; scaled, depth-tested, tiled,
// parallelogram and masked forms; degenerate inputs.
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
    Scene(int w, int h, bool withColour = true) : t(SpriteRender::shared), w(w), h(h) {
        target.Allocate(w, h);
        depth.Allocate(w, h);
        t->start_offscreen_render(withColour ? &target : nullptr, &depth);
    }
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

// Every operation x blend mode, random sprites (with trims, misaligned rows),
// positions straddling every edge and random clips, against the reference;
// the axis-aligned parallelogram of the same box draws the same pixels.
TEST_F(SpriteRender, UnscaledAndAxisAlignedParallelogramMatchReference) {
    for (int seed = 0; seed < 300; ++seed) {
        SCOPED_TRACE(seed);
        std::mt19937 rng(seed);
        int op = seed % 5, blend = (seed / 5) % 3;
        Scene sc(37, 23);
        sc.fill_random(rng);
        const std::vector<uint32_t> before = sc.pixels();
        int w = 1 + rng() % 30, h = 1 + rng() % 12;
        Source src(rng, w, h, rng() % 4, rng() % 3);
        Sprite_c& s = src.sprite;
        s.OffsetLeft = rng() % 4, s.OffsetTop = rng() % 3, s.OffsetRight = rng() % 3, s.OffsetBottom = rng() % 2;
        if (seed % 4 == 0) sc.clip(int(rng() % 10), int(rng() % 8), 20 + int(rng() % 20), 12 + int(rng() % 12));
        int x = int(rng() % 60) - 20, y = int(rng() % 40) - 15;
        uint32_t col = rng();
        std::vector<uint32_t> expect = before;
        for (int j = 0; j < h; ++j)
            for (int i = 0; i < w; ++i) {
                long long X = x + s.OffsetLeft + i, Y = y + s.OffsetTop + j;
                if (!sc.in_clip(X, Y)) continue;
                uint32_t& d = expect[size_t(Y * 37 + X)];
                d = ref_pixel(op, blend, src.at(i, j), d, col);
            }
        s.Draw(*sc.t, op, blend, params(x, y, col));
        ASSERT_EQ(sc.pixels(), expect) << "op " << op << " blend " << blend;
        std::copy(before.begin(), before.end(), sc.px());
        float fw = float(s.FullWidth()), fh = float(s.FullHeight());
        s.DrawParallelogram(*sc.t, op, blend, corners(float(x), float(y), x + fw, float(y), float(x), y + fh, col));
        ASSERT_EQ(sc.pixels(), expect) << "parallelogram op " << op << " blend " << blend;
    }
}

// Scaled blits, every third one depth-tested (never writing depth; with no
// colour buffer nothing is drawn). Without trims destination pixel (i, j)
// samples texel (trunc(i x w / dw), trunc(j x h / dh)), steps in single precision.
TEST_F(SpriteRender, ScaledAndDepthTestedMatchReference) {
    for (int seed = 0; seed < 180; ++seed) {
        SCOPED_TRACE(seed);
        std::mt19937 rng(1000 + seed);
        int op = seed % 5, blend = (seed / 5) % 3;
        bool tested = seed % 3 == 1, colour = seed % 27 != 13;
        Scene sc(41, 29, colour);
        sc.fill_random(rng);
        for (int i = 0; i < 41 * 29; ++i) sc.depth.Data[i] = float(rng() % 8);
        const std::vector<float> depthBefore(sc.depth.Data, sc.depth.Data + 41 * 29);
        int w = 1 + rng() % 12, h = 1 + rng() % 9;
        Source src(rng, w, h, rng() % 4, 0);
        int dw = 1 + rng() % 50, dh = 1 + rng() % 35;
        int x = int(rng() % 50) - 15, y = int(rng() % 40) - 10;
        if (seed % 4 == 0) sc.clip(int(rng() % 10), int(rng() % 8), 25 + int(rng() % 20), 15 + int(rng() % 14));
        uint32_t col = rng();
        float depth = float(rng() % 8);
        std::vector<uint32_t> expect = sc.pixels();
        for (int j = 0; j < dh && colour; ++j)
            for (int i = 0; i < dw; ++i) {
                int X = x + i, Y = y + j;
                if (!sc.in_clip(X, Y) || (tested && !(depth <= sc.depth.Data[Y * 41 + X]))) continue;
                int u = std::min(int(float(i) * (float(w) / float(dw))), w - 1);
                int v = std::min(int(float(j) * (float(h) / float(dh))), h - 1);
                uint32_t& d = expect[size_t(Y * 41 + X)];
                d = ref_pixel(op, blend, src.at(u, v), d, col);
            }
        if (tested)
            src.sprite.DrawScaledDepth(*sc.t, op, blend, params(x, y, col, dw, dh, depth));
        else
            src.sprite.DrawScaled(*sc.t, op, blend, params(x, y, col, dw, dh));
        ASSERT_EQ(sc.pixels(), expect) << "op " << op << " blend " << blend << " " << w << "x" << h << " -> " << dw << "x" << dh;
        ASSERT_TRUE(std::equal(depthBefore.begin(), depthBefore.end(), sc.depth.Data));
    }
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

// Invalid modes, odd sizes, empty or huge trims and bad corners draw nothing;
// a huge tiled area of 1 x 1 tiles visits only the tiles inside the clip.
TEST_F(SpriteRender, DegenerateInputsDrawNothing) {
    Scene sc(16, 16);
    std::fill(sc.px(), sc.px() + 256, 7u);
    Sprite_c s;
    s.Allocate(4, 4);
    std::fill(s.Pixels, s.Pixels + 16, 0xFFFFFFFFu);
    s.Draw(*sc.t, 5, 0, params(3, 3, 0));
    s.Draw(*sc.t, 1, 3, params(3, 3, 0));
    s.Draw(*sc.t, -1, 0, params(3, 3, 0));
    s.DrawScaled(*sc.t, 1, 0, params(0, 0, 0, 0x7FFFFFFF, 8));
    s.DrawScaled(*sc.t, 1, 0, params(0, 0, 0, 8, -3));
    const float inf = std::numeric_limits<float>::infinity(), nan = std::numeric_limits<float>::quiet_NaN();
    const float bad[][6] = {{nan, 0, 8, 0, 0, 8}, {0, 0, inf, 0, 0, 8},   {1e30f, 0, 8, 0, 0, 8},
                            {0, 0, 8, 8, 16, 16}, {0, 0, 0, 0, 0, 0},     {0, 0, 1e-7f, 0, 0, 1e-7f}};
    for (const auto& c : bad) s.DrawParallelogram(*sc.t, 1, 0, corners(c[0], c[1], c[2], c[3], c[4], c[5], 0));
    for (int left : {-4, -0x7FFFFFFF}) {  // full width 0 or negative
        s.OffsetLeft = left;
        s.DrawScaled(*sc.t, 1, 0, params(0, 0, 0, 8, 8));
        s.DrawTiled(*sc.t, 1, 0, params(0, 0, 0, 10, 10));
        s.DrawParallelogram(*sc.t, 1, 0, corners(0, 0, 8, 0, 0, 8, 0));
    }
    s.OffsetLeft = s.OffsetRight = 0x7FFFFFFF;
    s.DrawScaled(*sc.t, 1, 0, params(0, 0, 0, 8, 8));
    for (int i = 0; i < 256; ++i) ASSERT_EQ(sc.px()[i], 7u) << i;
    Sprite_c one;
    one.Allocate(1, 1);
    one.Pixels[0] = 0xFFFFFFFFu;
    sc.clip(0, 0, 15, 15);
    one.DrawTiled(*sc.t, 1, 0, params(-0x7FFFFFF0, -0x7FFFFFF0, 0, 0x7FFFFFFF, 0x7FFFFFFF));
    for (int i = 0; i < 256; ++i) ASSERT_EQ(sc.px()[i], i < 15 * 16 && i % 16 < 15 ? 0xFFFFFFFFu : 7u) << i;
}

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

// The masked blit and the masked axis-aligned parallelogram (replaced and
// blended) against a per-pixel reference.
TEST_F(SpriteRender, MaskedMatchesPerPixelReference) {
    memorymanager pool(1 << 16);
    for (int seed = 0; seed < 120; ++seed) {
        SCOPED_TRACE(seed);
        std::mt19937 rng(6000 + seed);
        Scene sc(37, 23);
        int w = 1 + rng() % 30, h = 1 + rng() % 12;
        Source src(rng, w, h, rng() % 4, rng() % 2);
        Sprite_c& s = src.sprite;
        s.OffsetLeft = rng() % 3, s.OffsetTop = rng() % 3;
        RandomMask m(rng);
        clippingmask mask(&pool, 0, 0, m.starts.data(), int(m.starts.size()), m.lengths.data(), int(m.lengths.size()));
        if (seed % 3 == 0) sc.clip(int(rng() % 10), int(rng() % 8), 20 + int(rng() % 20), 12 + int(rng() % 12));
        int x = int(rng() % 50) - 15, y = int(rng() % 34) - 10;
        float fw = float(s.FullWidth()), fh = float(s.FullHeight());
        for (int form = 0; form < 3; ++form) {  // blit, parallelogram blended, parallelogram replaced
            sc.fill_random(rng);
            std::vector<uint32_t> expect = sc.pixels();
            for (int j = 0; j < h; ++j)
                for (int i = 0; i < w; ++i) {
                    long long X = x + s.OffsetLeft + i, Y = y + s.OffsetTop + j;
                    if (!sc.in_clip(X, Y) || !m.covers(X, Y)) continue;
                    uint32_t& d = expect[size_t(Y * 37 + X)];
                    d = ref_pixel(1, form == 2 ? 0 : 1, src.at(i, j), d, 0);
                }
            if (form == 0) {
                Sprite_c::RenderParams_s p = params(x, y, 0);
                p.mask = &mask, p.maskx = m.x, p.masky = m.y;
                s.DrawMasked(*sc.t, p);
            } else {
                Sprite_c::ParallelogramRenderParams_s q = corners(float(x), float(y), x + fw, float(y), float(x), y + fh, 0);
                q.mask = &mask, q.maskx = m.x, q.masky = m.y;
                s.DrawParallelogramMasked(*sc.t, form == 2, q);
            }
            ASSERT_EQ(sc.pixels(), expect) << "form " << form;
        }
    }
}
}  // namespace
