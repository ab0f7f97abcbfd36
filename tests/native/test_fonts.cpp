// Fonts: glyph row routines against their per-pixel reference, and normal, masked and upwards plotting against a
// reference that places every glyph pixel by itself.
#include <gtest/gtest.h>

#include <climits>
#include <cstdint>
#include <memory>
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
    std::vector<int> m[4];
    for (size_t i = 0; i < gs.size(); ++i) {
        const int v[4] = {gs[i].w, gs[i].h, gs[i].xoff, gs[i].yoff};
        for (int j = 0; j < 4; ++j) m[j].push_back(v[j]);
        f.set_glyph(int(i), gs[i].bits.data(), int(gs[i].bits.size()));
    }
    f.m_Widths = ints(pool, m[0]);
    f.m_Heights = ints(pool, m[1]);
    f.m_XOffsets = ints(pool, m[2]);
    f.m_YOffsets = ints(pool, m[3]);
    f.validate();
}

glyph_spec random_glyph(std::mt19937& rng) {
    glyph_spec g;
    g.w = int(rng() % 14), g.h = int(rng() % 14), g.xoff = int(rng() % 7) - 3, g.yoff = int(rng() % 7) - 3;
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
        if (rng() % 3 == 0) return tk->resetclipping();
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
    const uint32_t a = C >> 24;
    if (g == 0 || (k == MONO && a == 0 && !masked && !upwards) || (k == PALETTED && !flag && g >= pal.size()))
        return false;
    if (k == ALPHA) out = blend_def(D, C, 256 - g, g);
    else if (k == PALETTED) out = flag ? C : pal[g];
    else out = (upwards || a == 255) ? C : blend_def(D, C, 255 - a, a);
    return true;
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
        const unsigned density = rng() % 4;
        for (auto& b : src) b = (rng() % 4 < density) ? (unsigned char)(rng() % 256) : 0;
        alignas(16) uint32_t a[64], b[64];
        for (int i = 0; i < 64; ++i) a[i] = b[i] = rng();
        const uint32_t c = rng();
        auto run = [&](const auto& r) {
            glyph_row(a + offset, src.data(), stride, n, r);
            glyph_row_ref(b + offset, src.data(), stride, n, r);
        };
        if (seed % 4 == 0) run(set_colour{c});
        else if (seed % 4 == 1) run(blend_colour{c, 255 - (c >> 24), c >> 24});
        else if (seed % 4 == 2) run(coverage{c});
        else run(palette_lookup{pal.data(), unsigned(rng() % 257)});
        for (int i = 0; i < 64; ++i) ASSERT_EQ(a[i], b[i]) << "seed " << seed << " index " << i;
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
        std::unique_ptr<clippingmask> mask;
        if (useMask) {
            for (int r = int(rng() % 30); r > 0; --r) {
                rm.starts.push_back(int(rng() % 50) - 10);
                rm.lengths.push_back(int(rng() % 30) - 3);
            }
            rm.x = int(rng() % 40) - 15;
            rm.y = int(rng() % 40) - 15;
            mask.reset(new clippingmask(pool, 0, 0, rm.starts.data(), int(rm.starts.size()), rm.lengths.data(),
                                        int(rm.lengths.size())));
        }
        std::vector<uint32_t> e = snapshot();
        for (int r = 0; r < g.h; ++r)
            for (int c = 0; c < g.w; ++c) {
                // upwards, glyph (row r, column c) lands in row w - 1 - c, column r
                const i64 X = form == 2 ? i64(x) + r : i64(x) + g.xoff + c;
                const i64 Y = form == 2 ? i64(y) + (g.w - 1 - c) : i64(y) + g.yoff + r;
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

TEST_F(Fonts, ClippedAwayEmptyOrMissingGlyphsDrawNothing) {
    std::mt19937 rng(11);
    randomise(rng);
    const std::vector<uint32_t> before = snapshot();
    const glyph_spec full{4, 4, 0, 0, std::vector<unsigned char>(16, 200)};
    font_alpha f(pool, 4);
    fill_font(f, *pool, {full, {0, 5, 0, 0, {}}, {5, 0, 0, 0, {}}, full});
    f.m_YOffsets = ints(*pool, {0, 0, 0});  // no metrics for glyph 3
    tk->setclipping(10, 10, 30, 30);
    const int at[][2] = {{6, 12}, {30, 12}, {12, 6}, {12, 30}, {INT_MAX, INT_MAX}, {INT_MIN, INT_MIN}, {INT_MAX - 1, INT_MIN}};
    for (auto& p : at) {
        f.plotletter(0, p[0], p[1], 0xFFFFFFFFu, false);
        f.plotletter_upwards(0, p[0], p[1], 0xFFFFFFFFu, false);
    }
    for (short g : {short(1), short(2), short(3), short(4), short(-1), short(-32768), short(32767)}) {
        f.plotletter(g, 12, 12, 0xFFFFFFFFu, false);
        f.plotletter(g, 12, 12, 0xFFFFFFFFu, false, nullptr, 0, 0);
        f.plotletter_upwards(g, 12, 12, 0xFFFFFFFFu, false);
    }
    expect_buffer(before, "nothing drawn", 11);
    f.plotletter(0, 12, 12, 0xFFFFFFFFu, false);
    EXPECT_NE(px()[12 * W + 12], before[12 * W + 12]);
}

TEST_F(Fonts, ShortBitmapsAreRejectedAndReleasedPoolsDrawNothing) {
    font_mono f(pool, 2);
    f.set_glyph(0, std::vector<unsigned char>(12, 1).data(), 12);
    f.set_glyph(1, nullptr, 0);  // empty glyph
    f.m_Heights = ints(*pool, {4, 7});
    f.m_XOffsets = ints(*pool, {0, 0});
    f.m_YOffsets = ints(*pool, {0, 0});
    auto rejected = [&](std::vector<int> widths) {
        f.m_Widths = ints(*pool, widths);
        try {
            f.validate();
        } catch (IllegalArgumentException* e) {
            delete e;
            return true;
        }
        return false;
    };
    EXPECT_TRUE(rejected({3, 1}));  // the empty glyph would need 7 bytes
    EXPECT_TRUE(rejected({4, 0}));  // 16 bytes needed, 12 given
    EXPECT_FALSE(rejected({3, 0}));
    std::mt19937 rng(13);
    randomise(rng);
    const std::vector<uint32_t> before = snapshot();
    pool->release_resources();
    f.plotletter(0, 1, 1, 0xFFFFFFFFu, false);
    f.plotletter_upwards(0, 1, 1, 0xFFFFFFFFu, false);
    expect_buffer(before, "released pool", 13);
}
