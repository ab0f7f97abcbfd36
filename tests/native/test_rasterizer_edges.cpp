// Directed cases of triangle set-up and span filling: row truncation, flat
// tops, clipping start values, group masks, depth equality, texture
// addressing, transparent and alpha-0 texels, blend formulas, bad input.
#include <gtest/gtest.h>

#include <cmath>

#include "raster_testutil.h"

using namespace rasttest;
using namespace Rasterizer_n;

namespace {

#define FLAT_LINE RenderTriangle<ShadeMode_Flat, TexAddress_Wrap, TexAddress_Wrap, false, FogMode_None, BlendMode_Opaque, false, false, false, true, false>
#define GOURAUD_Z RenderTriangle<ShadeMode_Gouraud, TexAddress_Wrap, TexAddress_Wrap, false, FogMode_None, BlendMode_Opaque, false, false, true, true, true>
template <TexAddressMode_e A, BlendMode_e B, bool Tr, bool DT>
void Textured(const Triangle_s& t) {
    RenderTriangle<ShadeMode_Textured, A, A, false, FogMode_None, B, Tr, false, true, true, DT>(t);
}
const uint32_t kFlat = 0xFF112233u, kBg = 0x5A5A5A5Au;

Triangle_s Tri(float x0, float y0, float x1, float y1, float x2, float y2, float z = 0.5f) {
    Triangle_s t;
    std::memset(&t, 0, sizeof t);
    t.m_Positions[0] = _mm_setr_ps(x0, y0, z, 1.0f);
    t.m_Positions[1] = _mm_setr_ps(x1, y1, z, 1.0f);
    t.m_Positions[2] = _mm_setr_ps(x2, y2, z, 1.0f);
    t.m_FlatColour = kFlat;
    for (int i = 0; i < 3; ++i) t.m_Colours[i] = _mm_setr_epi16(short(0xC800), short(0x6400), short(0x3200), short(0xFF00), 0, 0, 0, 0);
    return t;
}

struct Fixture : ::testing::Test {
    Target tg{64, 48, 64};
    void SetUp() override { Fill(kBg, 3.4e38f); }
    void Fill(uint32_t c, float z) {
        for (int y = 0; y < tg.height; ++y)
            for (int x = 0; x < tg.pitch; ++x) tg.at(x, y) = c, tg.zat(x, y) = z;
        tg.bind();
        SetViewportRect(0, 0, 64, 48);
    }
    int RowCount(int y) const {
        int n = 0;
        for (int x = 0; x < tg.width; ++x) n += tg.at(x, y) == kFlat;
        return n;
    }
    bool Untouched() const {
        for (int y = 0; y < tg.height; ++y)
            for (int x = 0; x < tg.pitch; ++x)
                if (tg.at(x, y) != kBg || tg.zat(x, y) != 3.4e38f) return false;
        return true;
    }
};
using Raster = Fixture;

TEST_F(Raster, RowsTruncateAndFlatTopsStartAtTheTopRow) {
    FLAT_LINE(Tri(4, 10.9f, 40, 10.9f, 4, 20));
    EXPECT_EQ(RowCount(9), 0);
    EXPECT_GT(RowCount(10), 0);
    EXPECT_EQ(RowCount(20), 0);
    SetUp();
    FLAT_LINE(Tri(4, 10, 40, 10, 4, 30));
    EXPECT_EQ(RowCount(10), 36);  // top vertex to middle vertex exactly
    EXPECT_EQ(tg.at(4, 10), kFlat);
    EXPECT_NE(tg.at(40, 10), kFlat);
    for (int y = 11; y < 30; ++y) EXPECT_LE(RowCount(y), RowCount(y - 1)) << y;
    EXPECT_EQ(RowCount(30), 0);
    EXPECT_EQ(RowCount(9), 0);
    SetUp();  // all vertices on one truncated row: nothing
    FLAT_LINE(Tri(0, 10.2f, 50, 10.9f, 20, 10.0f));
    GOURAUD_Z(Tri(0, 10.2f, 50, 10.9f, 20, 10.0f));
    EXPECT_TRUE(Untouched());
}

TEST_F(Raster, ClippedTopStartsAtTopPlusGradientTimesSkippedRows) {
    SetViewportRect(0, 7, 64, 41);
    const float xt = 2.25f, yt = -5.5f, xb = 50.75f, yb = 40.0f;
    FLAT_LINE(Tri(xt, yt, 60, 20, xb, yb));
    const int yT = -5, yB = 40;  // long edge on the left, skipped rows 7 - (-5)
    float g = (xb - xt) * _mm_cvtss_f32(_mm_rcp_ss(_mm_set_ss(float(yB - yT))));
    float x = xt + g * float(7 - yT);
    for (int y = 7; y < 20; ++y, x = x + g) {
        int xl = int(std::nearbyint(x));
        EXPECT_EQ(tg.at(xl, y), kFlat) << y;
        if (xl > 0) EXPECT_NE(tg.at(xl - 1, y), kFlat) << y;
    }
    EXPECT_EQ(RowCount(6), 0);
}

TEST_F(Raster, SpansCoverExactlyTheirPixelsAtEveryGroupPosition) {
    const struct { int x0, len; } cases[] = {{8, 1}, {9, 1}, {10, 1}, {11, 1}, {8, 4}, {8, 16}, {8, 32}, {9, 2}, {10, 13}};
    for (const auto& c : cases) {
        SetUp();
        FLAT_LINE(Tri(float(c.x0), 10, float(c.x0 + c.len), 10, float(c.x0), 11));
        EXPECT_EQ(RowCount(10), c.len) << c.x0 << "+" << c.len;
        for (int x = c.x0; x < c.x0 + c.len; ++x) tg.at(x, 10) = kBg;
        EXPECT_TRUE(Untouched()) << c.x0 << "+" << c.len;
    }
}

TEST_F(Raster, DepthEqualToStoredPassesAndTriangleAlphaFormula) {
    Fill(kBg, 0.5f);
    GOURAUD_Z(Tri(0, 0, 64, 0, 0, 48, 0.5f));
    EXPECT_EQ(tg.at(30, 10), 0xFF3264C8u);
    Fill(kBg, 0.5f);
    GOURAUD_Z(Tri(0, 0, 64, 0, 0, 48, std::nextafter(0.5f, 1.0f)));
    EXPECT_EQ(tg.at(1, 1), kBg);
    // src 200/100/50/255 over 100/50/25/128 with a = 64
    Fill(0x80643219u, 3.4e38f);
    Triangle_s t = Tri(0, 0, 64, 0, 0, 48);
    t.m_Alpha = 64u * 0x10001u;
    RenderTriangle<ShadeMode_Gouraud, TexAddress_Wrap, TexAddress_Wrap, false, FogMode_None, BlendMode_TriangleAlpha, false, false, false, true, false>(t);
    auto ch = [](unsigned s, unsigned d) { return ((s * (64 * 256)) >> 16) + (((d * 256) * (256 - 64)) >> 16); };
    EXPECT_EQ(tg.at(2, 2), (ch(255, 0x80) << 24) | (ch(50, 0x64) << 16) | (ch(100, 0x32) << 8) | ch(200, 0x19));
}

TEST_F(Raster, ShadowMaskWritesOnesInsideTheMaskWidth) {
    unsigned char* bytes = reinterpret_cast<unsigned char*>(tg.colour());
    std::memset(bytes, 0, size_t(tg.pitch) * 4 * tg.height);
    Viewport_s vp = {0, 0, 20, 10, 0.0f, 1.0f};
    SetViewport(vp);
    m_ScreenPitch = 20;
    RenderTriangle<ShadeMode_Mask, TexAddress_Wrap, TexAddress_Wrap, false, FogMode_None, BlendMode_Opaque, false, false, false, true, false>(
        Tri(-30, 2.5f, 50, 2.5f, 10, 9.5f));
    for (int i = 0; i < 20 * 12; ++i) EXPECT_EQ(bytes[i], (i >= 40 && i < 200) ? bytes[i] : 0) << i;
    for (int x = 0; x < 20; ++x) EXPECT_EQ(bytes[2 * 20 + x], 1) << x;
    tg.bind();
}

struct TexFixture : Fixture {
    std::vector<uint32_t> tex = std::vector<uint32_t>(256 * 128);
    Triangle_s Quad(float u, float v, uint32_t colourWord = 0xFF00) {
        Triangle_s t = Tri(0, 0, 64, 0, 0, 48, 1.0f);
        for (int i = 0; i < 3; ++i) {
            t.m_TexCoords[i] = _mm_setr_ps(u, v, 0, 0);
            t.m_Colours[i] = _mm_set1_epi16(short(colourWord));
        }
        t.m_pTexture = tex.data();
        return t;
    }
};
using Texturing = TexFixture;

TEST_F(Texturing, WrapClampAndModulation) {
    for (int v = 0; v < 128; ++v)
        for (int u = 0; u < 128; ++u) tex[v * 256 + u] = 0xFF000000u | (uint32_t(u) << 8) | uint32_t(v);
    // depth 1: u/d * d is u times the approximate reciprocal of 1, just below u
    const struct { float u; int wrapCol, clampCol; } cases[] = {{128.5f, 0, 127}, {-1.5f, 127, 0}, {64.5f, 64, 64}, {300.5f, 44, 127}};
    for (const auto& c : cases) {
        SetUp();
        Textured<TexAddress_Repeat, BlendMode_Opaque, false, false>(Quad(c.u, 3.5f));
        EXPECT_EQ((tg.at(5, 5) >> 8) & 0xFF, uint32_t(c.wrapCol * 0xFF00) >> 16) << c.u;
        SetUp();
        Textured<TexAddress_Clamp, BlendMode_Opaque, false, false>(Quad(c.u, 3.5f));
        EXPECT_EQ((tg.at(5, 5) >> 8) & 0xFF, uint32_t(c.clampCol * 0xFF00) >> 16) << c.u;
    }
    for (uint32_t& t : tex) t = 0xFFFFFFFFu;  // channel word 65280 maps texel 255 to 254
    SetUp();
    Textured<TexAddress_Repeat, BlendMode_Opaque, false, false>(Quad(10.5f, 10.5f));
    EXPECT_EQ(tg.at(3, 3), 0xFEFEFEFEu);
}

TEST_F(Texturing, TransparentTexelsAndAlphaZero) {
    for (uint32_t& t : tex) t = 0;
    Textured<TexAddress_Repeat, BlendMode_Opaque, true, true>(Quad(10.5f, 10.5f, 0xFFFF));
    EXPECT_TRUE(Untouched());
    for (uint32_t& t : tex) t = 0x01000000u;  // alpha 1: drawn (shaded to 0)
    Textured<TexAddress_Repeat, BlendMode_Opaque, true, true>(Quad(10.5f, 10.5f, 0xFFFF));
    EXPECT_EQ(tg.at(3, 3), 0x00000000u);
    EXPECT_EQ(tg.zat(3, 3), 1.0f);
    SetUp();
    for (uint32_t& t : tex) t = 0x00FFFFFFu;  // alpha 0 with texel-alpha blending: colour and depth untouched
    Textured<TexAddress_Repeat, BlendMode_TexelAlpha, false, true>(Quad(10.5f, 10.5f, 0xFFFF));
    EXPECT_TRUE(Untouched());
    Fill(0x00000064u, 3.4e38f);               // blue 100
    for (uint32_t& t : tex) t = 0x800000C8u;  // alpha 128, blue 200
    Textured<TexAddress_Repeat, BlendMode_TexelAlpha, false, true>(Quad(10.5f, 10.5f, 0xFFFF));
    // shaded src: blue (200 * 65535) >> 16 = 199, alpha 127
    EXPECT_EQ(tg.at(3, 3) & 0xFF, (100u * (256 - 127) + 199u * 127) >> 8);
    EXPECT_EQ(tg.at(3, 3) >> 24, (127u * 127) >> 8);
    EXPECT_EQ(tg.zat(3, 3), 1.0f);
}

TEST_F(Raster, BadTrianglesAndMissingBuffers) {
    GOURAUD_Z(Tri(NAN, 0, 64, 0, 0, 48));
    GOURAUD_Z(Tri(0, INFINITY, 64, 0, 0, 48));
    GOURAUD_Z(Tri(0, 0, 64, 0, 0, 48, NAN));
    FLAT_LINE(Tri(0, 0, -INFINITY, 0, 0, 48));
    SetTarget(nullptr, nullptr, 64, 64, 48);
    FLAT_LINE(Tri(0, 0, 64, 0, 0, 48));
    GOURAUD_Z(Tri(0, 0, 64, 0, 0, 48));
    SetTarget(tg.colour(), nullptr, 64, 64, 48);
    GOURAUD_Z(Tri(0, 0, 64, 0, 0, 48));
    EXPECT_TRUE(Untouched());
    Target small(16, 8, 16);  // huge finite coordinates stay inside the target
    small.bind();
    SetViewportRect(-1000000, -1000000, 2000000, 2000000);
    FLAT_LINE(Tri(-3e38f, -3e38f, 3e38f, 1.0f, 2.0f, 3e38f));
    FLAT_LINE(Tri(-1e9f, 4, 1e9f, 4.5f, 0, 1e9f));
    GOURAUD_Z(Tri(-2e10f, -1e10f, 5e10f, 3, 7, 9e10f));
    EXPECT_TRUE(small.guardsIntact());
    EXPECT_EQ(small.at(8, 5), kFlat);
}

}  // namespace
