// Fonts: glyph row routines against their per-pixel reference, the pixel
// rules of the three kinds, and normal, masked and upwards plotting against a
// reference that places every glyph pixel by itself.
#include <gtest/gtest.h>

#include <climits>
#include <cstdint>
#include <random>
#include <vector>

#include "render/canvas.h"
#include "render/toolkit.h"
#include "text/font_alpha.h"
#include "text/font_mono.h"
#include "text/font_paletted.h"

namespace {

typedef long long i64;

uint32_t chan(uint32_t c, int i) { return (c >> (8 * i)) & 0xFF; }

// floor(D*p/256) + floor(C*q/256) per colour channel, alpha 0
uint32_t blend_def(uint32_t D, uint32_t C, uint32_t p, uint32_t q) {
    uint32_t out = 0;
    for (int i = 0; i < 3; ++i) out |= (chan(D, i) * p / 256 + chan(C, i) * q / 256) << (8 * i);
    return out;
}

sharedarray<int> ints(memorymanager& pool, const std::vector<int>& v) {
    sharedarray<int> a(&pool, unsigned(v.size()));
    for (size_t i = 0; i < v.size(); ++i) a[int(i)] = v[i];
    return a;
}

struct glyph_spec {
    int w, h, xoff, yoff;
    std::vector<unsigned char> bits;
};

template <class F>
void fill_font(F& f, memorymanager& pool, const std::vector<glyph_spec>& gs) {
    std::vector<int> w, h, x, y;
    for (size_t i = 0; i < gs.size(); ++i) {
        w.push_back(gs[i].w);
        h.push_back(gs[i].h);
        x.push_back(gs[i].xoff);
        y.push_back(gs[i].yoff);
        f.set_glyph(int(i), gs[i].bits.data(), int(gs[i].bits.size()));
    }
    f.m_Widths = ints(pool, w);
    f.m_Heights = ints(pool, h);
    f.m_XOffsets = ints(pool, x);
    f.m_YOffsets = ints(pool, y);
    f.validate();
}

glyph_spec random_glyph(std::mt19937& rng, bool small = false) {
    glyph_spec g;
    g.w = int(rng() % (small ? 6 : 14));
    g.h = int(rng() % (small ? 6 : 14));
    g.xoff = int(rng() % 7) - 3;
    g.yoff = int(rng() % 7) - 3;
    for (int i = 0; i < g.w * g.h; ++i) {
        unsigned r = rng() % 4;
        g.bits.push_back(r == 0 ? 0 : r == 1 ? 255 : (unsigned char)rng());
    }
    return g;
}

class Fonts : public ::testing::Test {
protected:
    static const int W = 48, H = 40;
    void SetUp() override {
        tk = toolkit::create(nullptr, false, 0);
        cv = new memory_canvas(W, H);
        tk->set_active_canvas(cv);
        toolkit::m_pInstance = tk;
        pool = new memorymanager(1 << 18);
    }
    void TearDown() override {
        delete pool;
        toolkit::m_pInstance = nullptr;
        tk->set_active_canvas(nullptr);
        toolkit::destroy(tk);
        delete cv;
    }
    uint32_t* px() { return tk->m_ColourBuffer; }
    void randomise(std::mt19937& rng) {
        for (int i = 0; i < W * H; ++i) px()[i] = rng();
    }
    std::vector<uint32_t> snapshot() { return std::vector<uint32_t>(px(), px() + W * H); }
    bool in_clip(i64 x, i64 y) const {
        return x >= tk->m_ClipLeft && x < tk->m_ClipRight && y >= tk->m_ClipTop && y < tk->m_ClipBottom;
    }
    void random_clip(std::mt19937& rng) {
        if (rng() % 3 == 0) {
            tk->resetclipping();
            return;
        }
        tk->setclipping(int(rng() % (W + 6)) - 3, int(rng() % (H + 6)) - 3, int(rng() % (W + 6)) - 3,
                        int(rng() % (H + 6)) - 3);
    }
    void expect_buffer(const std::vector<uint32_t>& e, const char* what, int seed) {
        for (int i = 0; i < W * H; ++i)
            ASSERT_EQ(px()[i], e[size_t(i)]) << what << " seed " << seed << " at (" << i % W << ", " << i / W << ")";
    }

    toolkit* tk = nullptr;
    memory_canvas* cv = nullptr;
    memorymanager* pool = nullptr;
};

struct ref_mask {
    std::vector<int> starts, lengths;
    int x = 0, y = 0;
    bool covers(i64 px, i64 py) const {
        i64 r = py - y;
        if (r < 0 || r >= i64(starts.size())) return false;
        i64 s = x + starts[size_t(r)];
        return px >= s && px < s + lengths[size_t(r)];
    }
};

enum kind { MONO, ALPHA, PALETTED };

// New value of pixel D for glyph byte g, straight from the pixel rules.
// Returns false when the pixel is left alone.
bool rule(kind k, bool masked, bool upwards, bool flag, uint32_t C, const std::vector<uint32_t>& pal, uint32_t D,
          unsigned g, uint32_t& out) {
    if (g == 0) return false;
    const uint32_t a = C >> 24;
    switch (k) {
    case MONO:
        if (upwards || a == 255) {
            out = C;
            return true;
        }
        if (a == 0 && !masked) return false;
        out = blend_def(D, C, 255 - a, a);
        return true;
    case ALPHA:
        out = blend_def(D, C, 256 - g, g);
        return true;
    case PALETTED:
        if (flag) {
            out = C;
            return true;
        }
        if (g >= pal.size()) return false;
        out = pal[g];
        return true;
    }
    return false;
}

}  // namespace

// ------------------------------------------------------------ row routines

TEST(GlyphRows, SimdRowsMatchPerPixelReference) {
    using namespace glyphrows;
    std::vector<uint32_t> pal(256);
    for (int seed = 0; seed < 3000; ++seed) {
        std::mt19937 rng(seed);
        for (auto& p : pal) p = rng();
        const int n = int(rng() % 40), offset = int(rng() % 4);
        const ptrdiff_t stride = (rng() % 2) ? 1 : ptrdiff_t(2 + rng() % 11);
        std::vector<unsigned char> src(size_t(n) * size_t(stride) + 1);
        const int density = int(rng() % 4);
        for (auto& b : src) b = (rng() % 4 < unsigned(density)) ? (unsigned char)(rng() % 256) : 0;
        alignas(16) uint32_t a[64], b[64];
        for (int i = 0; i < 64; ++i) a[i] = b[i] = rng();
        const uint32_t c = rng();
        auto run = [&](const auto& r) {
            glyph_row(a + offset, src.data(), stride, n, r);
            glyph_row_ref(b + offset, src.data(), stride, n, r);
        };
        switch (seed % 4) {
        case 0:
            run(set_colour{c});
            break;
        case 1:
            run(blend_colour{c, 255 - (c >> 24), c >> 24});
            break;
        case 2:
            run(coverage{c});
            break;
        default:
            run(palette_lookup{pal.data(), unsigned(rng() % 257)});
        }
        for (int i = 0; i < 64; ++i) ASSERT_EQ(a[i], b[i]) << "seed " << seed << " index " << i;
    }
}

TEST(GlyphRows, BlendFormula) {
    std::mt19937 rng(5);
    for (int i = 0; i < 100000; ++i) {
        uint32_t D = rng(), C = rng(), q = rng() % 256, p = 256 - q - rng() % 2;  // weights as the fonts use them
        ASSERT_EQ(glyphrows::blend(D, C, p, q), blend_def(D, C, p, q)) << i << " p " << p << " q " << q << std::hex << " D " << D << " C " << C;
    }
    // coverage 255 of white over black: 255 * 255 / 256 rounds down to 254
    EXPECT_EQ(glyphrows::coverage{0xFFFFFFFFu}(0xFF000000u, 255), 0x00FEFEFEu);
}

// ------------------------------------------------------------ pixel rules

TEST_F(Fonts, MonoAlphaRules) {
    font_mono f(pool, 1);
    fill_font(f, *pool, {{2, 1, 0, 0, {1, 0}}});
    std::vector<int> s = {0}, l = {10};
    clippingmask mask(pool, 0, 0, s.data(), 1, l.data(), 1);

    px()[0] = 0xFF808080u;
    px()[1] = 0x11223344u;
    f.plotletter(0, 0, 0, 0xFF123456u, false);
    EXPECT_EQ(px()[0], 0xFF123456u);
    EXPECT_EQ(px()[1], 0x11223344u);

    px()[0] = 0xFF808080u;
    f.plotletter(0, 0, 0, 0x80FF0000u, false);
    EXPECT_EQ(px()[0], blend_def(0xFF808080u, 0x80FF0000u, 127, 128));
    EXPECT_EQ(px()[0] >> 24, 0u);

    px()[0] = 0xFF808080u;
    f.plotletter(0, 0, 0, 0x00FFFFFFu, false);
    EXPECT_EQ(px()[0], 0xFF808080u) << "alpha 0 draws nothing";
    f.plotletter(0, 0, 0, 0x00FFFFFFu, false, nullptr, 0, 0);
    EXPECT_EQ(px()[0], 0xFF808080u) << "a null mask draws like the plain form";
    f.plotletter(0, 0, 0, 0x00FFFFFFu, false, &mask, 0, 0);
    EXPECT_EQ(px()[0], 0x007F7F7Fu) << "masked alpha 0 scales by 255/256 and clears alpha";
    EXPECT_EQ(px()[1], 0x11223344u);

    // upwards: the glyph's right column (empty) on row 0, its left column (set) on row 1
    px()[0] = px()[W] = 0xFF808080u;
    f.plotletter_upwards(0, 0, 0, 0x00ABCDEFu, false);
    EXPECT_EQ(px()[0], 0xFF808080u);
    EXPECT_EQ(px()[W], 0x00ABCDEFu) << "upwards ignores the alpha byte";
}

TEST_F(Fonts, AlphaAndPaletteRules) {
    font_alpha fa(pool, 1);
    fill_font(fa, *pool, {{3, 1, 0, 0, {255, 0, 128}}});
    px()[0] = 0xFF000000u;
    px()[1] = 0x12345678u;
    px()[2] = 0xFF000000u;
    fa.plotletter(0, 0, 0, 0x00FFFFFFu, true);
    EXPECT_EQ(px()[0], 0x00FEFEFEu);
    EXPECT_EQ(px()[1], 0x12345678u);
    EXPECT_EQ(px()[2], 0x007F7F7Fu);

    font_paletted fp(pool, 1);
    fill_font(fp, *pool, {{4, 1, 0, 0, {0, 1, 2, 9}}});
    fp.m_Palette = sharedarray<unsigned int>(pool, 3);
    fp.m_Palette[0] = 0xFFFFFFFFu;
    fp.m_Palette[1] = 0x01020304u;
    fp.m_Palette[2] = 0x80FF00FFu;
    for (int i = 0; i < 4; ++i) px()[i] = 0xAAAAAAAAu;
    fp.plotletter(0, 0, 0, 0x55555555u, false);
    EXPECT_EQ(px()[0], 0xAAAAAAAAu) << "index 0 is transparent even with a palette entry";
    EXPECT_EQ(px()[1], 0x01020304u);
    EXPECT_EQ(px()[2], 0x80FF00FFu) << "palette colours are written whole, not blended";
    EXPECT_EQ(px()[3], 0xAAAAAAAAu) << "an index the palette does not hold draws nothing";
    fp.plotletter(0, 0, 0, 0x55555555u, true);
    EXPECT_EQ(px()[0], 0xAAAAAAAAu);
    EXPECT_EQ(px()[1], 0x55555555u);
    EXPECT_EQ(px()[3], 0x55555555u);
}

// --------------------------------------------------------------- geometry

TEST_F(Fonts, UpwardsGeometry) {
    // 3 wide, 5 high, each pixel a distinct index; offsets must be ignored
    glyph_spec g{3, 5, 7, -9, {}};
    for (int i = 0; i < 15; ++i) g.bits.push_back((unsigned char)(i + 1));
    font_paletted f(pool, 1);
    fill_font(f, *pool, {g});
    f.m_Palette = sharedarray<unsigned int>(pool, 256);
    for (int i = 0; i < 256; ++i) f.m_Palette[i] = 0xFF000000u | unsigned(i);
    tk->cls(0);
    f.plotletter_upwards(0, 10, 20, 0, false);
    for (int y = 0; y < H; ++y)
        for (int x = 0; x < W; ++x) {
            const bool inside = x >= 10 && x <= 14 && y >= 20 && y <= 22;
            uint32_t want = 0;
            if (inside) {
                const int i = y - 20, j = x - 10;   // row i, column j shows glyph (row j, column 2 - i)
                want = 0xFF000000u | unsigned(j * 3 + (2 - i) + 1);
            }
            ASSERT_EQ(px()[y * W + x], want) << x << "," << y;
        }
}

// Random glyphs, positions, clips, masks and colours for all three kinds
// and all three plot forms, against per-pixel placement.
TEST_F(Fonts, PlottingMatchesPerPixelPlacement) {
    for (int seed = 0; seed < 3000; ++seed) {
        std::mt19937 rng(seed);
        randomise(rng);
        random_clip(rng);
        const kind k = kind(seed % 3);
        const int form = int(rng() % 3);  // 0 normal, 1 masked, 2 upwards
        std::vector<glyph_spec> gs;
        for (int i = 0; i < 3; ++i) gs.push_back(random_glyph(rng));
        const int gi = int(rng() % 3);
        const glyph_spec& g = gs[size_t(gi)];
        const int x = int(rng() % (W + 30)) - 15, y = int(rng() % (H + 30)) - 15;
        uint32_t C = rng();
        if (rng() % 3 == 0) C = (C & 0xFFFFFF) | ((rng() % 2) ? 0xFF000000u : 0u);
        const bool flag = rng() % 2;
        std::vector<uint32_t> pal(size_t(rng() % 300));
        for (auto& p : pal) p = rng();
        ref_mask rm;
        const bool useMask = form == 1 && rng() % 5 != 0;  // sometimes a null mask
        if (useMask) {
            int rows = int(rng() % 30);
            for (int r = 0; r < rows; ++r) {
                rm.starts.push_back(int(rng() % 50) - 10);
                rm.lengths.push_back(int(rng() % 30) - 3);
            }
            rm.x = int(rng() % 40) - 15;
            rm.y = int(rng() % 40) - 15;
        }
        std::unique_ptr<clippingmask> mask;
        if (useMask)
            mask.reset(new clippingmask(pool, 0, 0, rm.starts.data(), int(rm.starts.size()), rm.lengths.data(),
                                        int(rm.lengths.size())));

        // reference
        std::vector<uint32_t> e = snapshot();
        for (int r = 0; r < g.h; ++r)
            for (int c = 0; c < g.w; ++c) {
                i64 X, Y;
                if (form == 2) {  // glyph (row r, column c) lands in row w - 1 - c, column r
                    X = i64(x) + r;
                    Y = i64(y) + (g.w - 1 - c);
                } else {
                    X = i64(x) + g.xoff + c;
                    Y = i64(y) + g.yoff + r;
                }
                if (!in_clip(X, Y) || (useMask && !rm.covers(X, Y))) continue;
                uint32_t& d = e[size_t(Y * W + X)];
                uint32_t out;
                if (rule(k, form == 1 && useMask, form == 2, flag, C, pal, d, g.bits[size_t(r * g.w + c)], out)) d = out;
            }

        auto draw = [&](auto& f) {
            fill_font(f, *pool, gs);
            if (form == 0)
                f.plotletter(short(gi), x, y, C, flag);
            else if (form == 1)
                f.plotletter(short(gi), x, y, C, flag, mask.get(), rm.x, rm.y);
            else
                f.plotletter_upwards(short(gi), x, y, C, flag);
        };
        if (k == MONO) {
            font_mono f(pool, 3);
            draw(f);
        } else if (k == ALPHA) {
            font_alpha f(pool, 3);
            draw(f);
        } else {
            font_paletted f(pool, 3);
            f.m_Palette = sharedarray<unsigned int>(pool, unsigned(pal.size()));
            for (size_t i = 0; i < pal.size(); ++i) f.m_Palette[int(i)] = pal[i];
            draw(f);
        }
        expect_buffer(e, "plot", seed);
    }
}

TEST_F(Fonts, LettersClippedAwayOrEmptyDrawNothing) {
    std::mt19937 rng(11);
    randomise(rng);
    const std::vector<uint32_t> before = snapshot();
    font_mono f(pool, 3);
    fill_font(f, *pool, {{4, 4, 0, 0, std::vector<unsigned char>(16, 1)}, {0, 5, 0, 0, {}}, {5, 0, 0, 0, {}}});
    tk->setclipping(10, 10, 30, 30);
    f.plotletter(0, 6, 12, 0xFFFFFFFFu, false);  // entirely left of the clip
    f.plotletter(0, 30, 12, 0xFFFFFFFFu, false);
    f.plotletter(0, 12, 6, 0xFFFFFFFFu, false);
    f.plotletter(0, 12, 30, 0xFFFFFFFFu, false);
    f.plotletter(1, 12, 12, 0xFFFFFFFFu, false);  // width 0
    f.plotletter(2, 12, 12, 0xFFFFFFFFu, false);  // height 0
    f.plotletter_upwards(1, 12, 12, 0xFFFFFFFFu, false);
    f.plotletter(0, INT_MAX, INT_MAX, 0xFFFFFFFFu, false);
    f.plotletter(0, INT_MIN, INT_MIN, 0xFFFFFFFFu, false);
    f.plotletter_upwards(0, INT_MAX - 1, INT_MIN, 0xFFFFFFFFu, false);
    expect_buffer(before, "clipped away", 11);
}

// ------------------------------------------------------- arrays and indices

TEST_F(Fonts, GlyphIndicesOutsideTheArraysDrawNothing) {
    std::mt19937 rng(12);
    randomise(rng);
    const std::vector<uint32_t> before = snapshot();
    font_alpha f(pool, 2);
    fill_font(f, *pool, {{4, 4, 0, 0, std::vector<unsigned char>(16, 200)}, {4, 4, 0, 0, std::vector<unsigned char>(16, 200)}});
    f.m_YOffsets = ints(*pool, {0});  // metrics for glyph 0 only
    for (short g : {short(1), short(2), short(-1), short(-32768), short(32767)}) {
        f.plotletter(g, 5, 5, 0xFFFFFFFFu, false);
        f.plotletter(g, 5, 5, 0xFFFFFFFFu, false, nullptr, 0, 0);
        f.plotletter_upwards(g, 5, 5, 0xFFFFFFFFu, false);
    }
    expect_buffer(before, "indices outside", 12);
    f.plotletter(0, 5, 5, 0xFFFFFFFFu, false);
    EXPECT_NE(px()[5 * W + 5], before[5 * W + 5]);
}

TEST_F(Fonts, ShortBitmapsAreRejectedAndReleasedPoolsDrawNothing) {
    font_mono f(pool, 2);
    f.set_glyph(0, std::vector<unsigned char>(12, 1).data(), 12);
    f.set_glyph(1, nullptr, 0);  // empty glyph
    f.m_Widths = ints(*pool, {3, 0});
    f.m_Heights = ints(*pool, {4, 7});
    f.m_XOffsets = ints(*pool, {0, 0});
    f.m_YOffsets = ints(*pool, {0, 0});
    EXPECT_NO_THROW(f.validate());
    f.m_Widths = ints(*pool, {3, 1});  // the empty glyph now needs 7 bytes
    EXPECT_THROW(
        try { f.validate(); } catch (IllegalArgumentException* e) {
            delete e;
            throw 1;
        },
        int);
    f.m_Widths = ints(*pool, {4, 0});  // 16 bytes needed, 12 given
    EXPECT_THROW(
        try { f.validate(); } catch (IllegalArgumentException* e) {
            delete e;
            throw 1;
        },
        int);
    f.m_Widths = ints(*pool, {3, 0});
    std::mt19937 rng(13);
    randomise(rng);
    const std::vector<uint32_t> before = snapshot();
    pool->release_resources();
    f.plotletter(0, 1, 1, 0xFFFFFFFFu, false);
    f.plotletter_upwards(0, 1, 1, 0xFFFFFFFFu, false);
    expect_buffer(before, "released pool", 13);
}
