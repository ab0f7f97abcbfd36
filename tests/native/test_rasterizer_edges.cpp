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
#define GOURAUD_NOZ RenderTriangle<ShadeMode_Gouraud, TexAddress_Wrap, TexAddress_Wrap, false, FogMode_None, BlendMode_Opaque, false, false, false, true, false>
#define GOURAUD_ALPHA RenderTriangle<ShadeMode_Gouraud, TexAddress_Wrap, TexAddress_Wrap, false, FogMode_None, BlendMode_TriangleAlpha, false, false, false, true, false>
#define MASK_TRI RenderTriangle<ShadeMode_Mask, TexAddress_Wrap, TexAddress_Wrap, false, FogMode_None, BlendMode_Opaque, false, false, false, true, false>
template <TexAddressMode_e A, BlendMode_e B, bool Tr, bool DT>
void Textured(const Triangle_s& t) {
    RenderTriangle<ShadeMode_Textured, A, A, false, FogMode_None, B, Tr, false, true, true, DT>(t);
}

Triangle_s Tri(float x0, float y0, float x1, float y1, float x2, float y2, float z = 0.5f) {
    Triangle_s t;
    std::memset(&t, 0, sizeof t);
    t.m_Positions[0] = _mm_setr_ps(x0, y0, z, 1.0f);
    t.m_Positions[1] = _mm_setr_ps(x1, y1, z, 1.0f);
    t.m_Positions[2] = _mm_setr_ps(x2, y2, z, 1.0f);
    t.m_FlatColour = 0xFF112233u;
    for (int i = 0; i < 3; ++i) t.m_Colours[i] = _mm_setr_epi16(short(0xC800), short(0x6400), short(0x3200), short(0xFF00), 0, 0, 0, 0);
    return t;
}

struct Fixture : ::testing::Test {
    Target tg{64, 48, 64};
    void SetUp() override {
        for (int y = 0; y < tg.height; ++y)
            for (int x = 0; x < tg.pitch; ++x) {
                tg.at(x, y) = 0x5A5A5A5Au;
                tg.zat(x, y) = 3.4e38f;
            }
        tg.bind();
        SetViewportRect(0, 0, 64, 48);
    }
    int RowCount(int y, uint32_t c) const {
        int n = 0;
        for (int x = 0; x < tg.width; ++x) n += tg.at(x, y) == c;
        return n;
    }
    bool Untouched() const {
        for (int y = 0; y < tg.height; ++y)
            for (int x = 0; x < tg.pitch; ++x)
                if (tg.at(x, y) != 0x5A5A5A5Au || tg.zat(x, y) != 3.4e38f) return false;
        return true;
    }
};

using TriangleSetup = Fixture;
using SpanFill = Fixture;

using BadTriangles = Fixture;

TEST_F(TriangleSetup, RowsAreTruncatedYValues) {
    FLAT_LINE(Tri(4, 10.9f, 40, 10.9f, 4, 20));
    EXPECT_EQ(RowCount(9, 0xFF112233u), 0);
    EXPECT_GT(RowCount(10, 0xFF112233u), 0);
    EXPECT_EQ(RowCount(20, 0xFF112233u), 0);
    SetUp();
    FLAT_LINE(Tri(4, 11.0f, 40, 11.0f, 4, 20));
    EXPECT_EQ(RowCount(10, 0xFF112233u), 0);
    EXPECT_GT(RowCount(11, 0xFF112233u), 0);
    EXPECT_GT(RowCount(19, 0xFF112233u), 0);
}

TEST_F(TriangleSetup, FlatTopDrawsOnlyTheLowerHalfFromTheTopRow) {
    FLAT_LINE(Tri(4, 10, 40, 10, 4, 30));
    // the first row runs from the top vertex to the middle vertex exactly
    EXPECT_EQ(RowCount(10, 0xFF112233u), 36);
    EXPECT_EQ(tg.at(4, 10), 0xFF112233u);
    EXPECT_EQ(tg.at(39, 10), 0xFF112233u);
    EXPECT_NE(tg.at(40, 10), 0xFF112233u);
    for (int y = 11; y < 30; ++y) EXPECT_LT(RowCount(y, 0xFF112233u), RowCount(y - 1, 0xFF112233u) + 1) << y;
    EXPECT_EQ(RowCount(30, 0xFF112233u), 0);
    EXPECT_EQ(RowCount(9, 0xFF112233u), 0);
}

TEST_F(TriangleSetup, AllVerticesOnOneTruncatedRowDrawNothing) {
    FLAT_LINE(Tri(0, 10.2f, 50, 10.9f, 20, 10.0f));
    GOURAUD_Z(Tri(0, 10.2f, 50, 10.9f, 20, 10.0f));
    EXPECT_TRUE(Untouched());
}

TEST_F(TriangleSetup, ClippedTopStartsAtTopPlusGradientTimesSkippedRows) {
    SetViewportRect(0, 7, 64, 41);
    const float xt = 2.25f, yt = -5.5f, xb = 50.75f, yb = 40.0f;
    FLAT_LINE(Tri(xt, yt, 60, 20, xb, yb));
    // long edge on the left: first visible row 7, skipped rows 7 - (-5) = 12
    const int yT = -5, yB = 40;
    float g = (xb - xt) * _mm_cvtss_f32(_mm_rcp_ss(_mm_set_ss(float(yB - yT))));
    float x = xt + g * float(7 - yT);
    for (int y = 7; y < 20; ++y) {
        int xl = int(std::nearbyint(x));
        EXPECT_EQ(tg.at(xl, y), 0xFF112233u) << y;
        if (xl > 0) {
            EXPECT_NE(tg.at(xl - 1, y), 0xFF112233u) << y;
        }
        x = x + g;
    }
    EXPECT_EQ(RowCount(6, 0xFF112233u), 0);
}

TEST_F(SpanFill, OnePixelUnalignedSpanWritesOnePixel) {
    FLAT_LINE(Tri(5, 10, 6, 10, 5, 11));
    EXPECT_EQ(tg.at(5, 10), 0xFF112233u);
    tg.at(5, 10) = 0x5A5A5A5Au;
    EXPECT_TRUE(Untouched());
    for (int x = 0; x < 4; ++x) {  // every position inside a group
        SetUp();
        FLAT_LINE(Tri(float(8 + x), 3, float(9 + x), 3, float(8 + x), 4));
        EXPECT_EQ(tg.at(8 + x, 3), 0xFF112233u);
        tg.at(8 + x, 3) = 0x5A5A5A5Au;
        EXPECT_TRUE(Untouched()) << x;
    }
}

TEST_F(SpanFill, AlignedSpansOfWholeGroups) {
    for (int len : {4, 16, 32}) {
        SetUp();
        FLAT_LINE(Tri(8, 10, float(8 + len), 10, 8, 11));
        EXPECT_EQ(RowCount(10, 0xFF112233u), len);
        EXPECT_EQ(tg.at(8, 10), 0xFF112233u);
        EXPECT_EQ(tg.at(7 + len, 10), 0xFF112233u);
    }
    // unaligned start and end in the same group, and crossing groups
    SetUp();
    FLAT_LINE(Tri(9, 12, 11, 12, 9, 13));
    EXPECT_EQ(RowCount(12, 0xFF112233u), 2);
    EXPECT_EQ(tg.at(9, 12), 0xFF112233u);
    EXPECT_EQ(tg.at(10, 12), 0xFF112233u);
    SetUp();
    FLAT_LINE(Tri(10, 12, 23, 12, 10, 13));
    EXPECT_EQ(RowCount(12, 0xFF112233u), 13);
}

TEST_F(SpanFill, LeftClippedSpanStartsAtTheFirstVisibleColumn) {
    Triangle_s t = Tri(0.2f, 5, 60, 5, 0.2f, 40);
    t.m_Colours[0] = _mm_setr_epi16(0, 0, 0, short(0xFF00), 0, 0, 0, 0);
    t.m_Colours[1] = _mm_setr_epi16(short(0xFF00), short(0x8000), 0x1000, short(0xFF00), 0, 0, 0, 0);
    t.m_Colours[2] = _mm_setr_epi16(0x2000, short(0xF000), short(0xFF00), short(0xFF00), 0, 0, 0, 0);
    GOURAUD_NOZ(t);
    Target full(64, 48, 64);
    full.copyFrom(tg);
    SetUp();
    SetViewportRect(13, 0, 51, 48);  // 13: not a group boundary
    GOURAUD_NOZ(t);
    for (int y = 5; y < 40; ++y) {
        for (int x = 0; x < 13; ++x) EXPECT_EQ(tg.at(x, y), 0x5A5A5A5Au);
        for (int x = 13; x < 64; ++x) ASSERT_EQ(tg.at(x, y), full.at(x, y)) << x << "," << y;
    }
}

TEST_F(SpanFill, DepthEqualToStoredPasses) {
    for (int y = 0; y < 48; ++y)
        for (int x = 0; x < 64; ++x) tg.zat(x, y) = 0.5f;
    GOURAUD_Z(Tri(0, 0, 64, 0, 0, 48, 0.5f));
    EXPECT_EQ(tg.at(1, 1), 0xFF3264C8u);
    EXPECT_EQ(tg.at(30, 10), 0xFF3264C8u);
    SetUp();
    for (int y = 0; y < 48; ++y)
        for (int x = 0; x < 64; ++x) tg.zat(x, y) = 0.5f;
    GOURAUD_Z(Tri(0, 0, 64, 0, 0, 48, std::nextafter(0.5f, 1.0f)));
    EXPECT_EQ(tg.at(1, 1), 0x5A5A5A5Au);
}

TEST_F(SpanFill, TriangleAlphaFormula) {
    // src 200/100/50/255 over 100/50/25/128 with a = 64
    for (int y = 0; y < 48; ++y)
        for (int x = 0; x < 64; ++x) tg.at(x, y) = 0x80643219u;
    Triangle_s t = Tri(0, 0, 64, 0, 0, 48);
    t.m_Alpha = 64u * 0x10001u;
    GOURAUD_ALPHA(t);
    auto ch = [](unsigned s, unsigned d) {
        return ((s * (64 * 256)) >> 16) + (((d * 256) * (256 - 64)) >> 16);
    };
    // vertex colour: blue 200, green 100, red 50, alpha 255
    uint32_t want = (ch(255, 0x80) << 24) | (ch(50, 0x64) << 16) | (ch(100, 0x32) << 8) | ch(200, 0x19);
    EXPECT_EQ(tg.at(2, 2), want);
}

TEST_F(SpanFill, ShadowMaskWritesOnesInsideTheMaskWidth) {
    unsigned char* bytes = reinterpret_cast<unsigned char*>(tg.colour());
    std::memset(bytes, 0, size_t(tg.pitch) * 4 * tg.height);
    Viewport_s vp = {0, 0, 20, 10, 0.0f, 1.0f};
    SetViewport(vp);
    m_ScreenPitch = 20;
    MASK_TRI(Tri(-30, 2.5f, 50, 2.5f, 10, 9.5f));
    int ones = 0;
    for (int i = 0; i < 20 * 12; ++i) ones += bytes[i] == 1;
    for (int i = 0; i < 20 * 2; ++i) EXPECT_EQ(bytes[i], 0) << i;
    for (int x = 0; x < 20; ++x) EXPECT_EQ(bytes[2 * 20 + x], 1) << x;
    for (int i = 20 * 10; i < 20 * 12; ++i) EXPECT_EQ(bytes[i], 0) << i;
    EXPECT_GT(ones, 20);
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
using TexAddressing = TexFixture;

TEST_F(TexAddressing, CoordinateAboveAndBelowTheTexture) {
    for (int v = 0; v < 128; ++v)
        for (int u = 0; u < 128; ++u) tex[v * 256 + u] = 0xFF000000u | (uint32_t(u) << 8) | uint32_t(v);
    auto texelAt = [&](uint32_t px) { return px; };
    // depth 1: u/d * d is u times the approximate reciprocal of 1, just below u
    struct Case {
        float u;
        int wrapCol, clampCol;
    } cases[] = {{128.5f, 0, 127}, {-1.5f, 127, 0}, {64.5f, 64, 64}, {300.5f, 44, 127}};
    for (const Case& c : cases) {
        SetUp();
        Textured<TexAddress_Repeat, BlendMode_Opaque, false, false>(Quad(c.u, 3.5f));
        uint32_t got = texelAt(tg.at(5, 5));
        EXPECT_EQ((got >> 8) & 0xFF, uint32_t(c.wrapCol * 0xFF00) >> 16) << c.u;
        SetUp();
        Textured<TexAddress_Clamp, BlendMode_Opaque, false, false>(Quad(c.u, 3.5f));
        got = tg.at(5, 5);
        EXPECT_EQ((got >> 8) & 0xFF, uint32_t(c.clampCol * 0xFF00) >> 16) << c.u;
    }
    // modulation: channel word 65280 maps texel 255 to 254
    for (uint32_t& t : tex) t = 0xFFFFFFFFu;
    SetUp();
    Textured<TexAddress_Repeat, BlendMode_Opaque, false, false>(Quad(10.5f, 10.5f));
    EXPECT_EQ(tg.at(3, 3), 0xFEFEFEFEu);
}

TEST_F(TexAddressing, TransparentTexelsAndAlphaZero) {
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
    for (int y = 0; y < 48; ++y)
        for (int x = 0; x < 64; ++x) tg.at(x, y) = 0x00000064u;  // blue 100
    for (uint32_t& t : tex) t = 0x800000C8u;                     // alpha 128, blue 200
    Textured<TexAddress_Repeat, BlendMode_TexelAlpha, false, true>(Quad(10.5f, 10.5f, 0xFFFF));
    // shaded src: blue (200 * 65535) >> 16 = 199, alpha 127
    EXPECT_EQ(tg.at(3, 3) & 0xFF, (100u * (256 - 127) + 199u * 127) >> 8);
    EXPECT_EQ(tg.at(3, 3) >> 24, (0u * (256 - 127) + 127u * 127) >> 8);
    EXPECT_EQ(tg.zat(3, 3), 1.0f);
}

TEST_F(BadTriangles, NonFiniteVerticesAreRejected) {
    GOURAUD_Z(Tri(NAN, 0, 64, 0, 0, 48));
    GOURAUD_Z(Tri(0, INFINITY, 64, 0, 0, 48));
    GOURAUD_Z(Tri(0, 0, 64, 0, 0, 48, NAN));
    FLAT_LINE(Tri(0, 0, -INFINITY, 0, 0, 48));
    EXPECT_TRUE(Untouched());
}

TEST_F(BadTriangles, HugeFiniteCoordinatesStayInsideTheTarget) {
    Target small(16, 8, 16);
    small.bind();
    SetViewportRect(-1000000, -1000000, 2000000, 2000000);  // far larger than the target
    FLAT_LINE(Tri(-3e38f, -3e38f, 3e38f, 1.0f, 2.0f, 3e38f));
    FLAT_LINE(Tri(-1e9f, 4, 1e9f, 4.5f, 0, 1e9f));
    GOURAUD_Z(Tri(-2e10f, -1e10f, 5e10f, 3, 7, 9e10f));
    EXPECT_TRUE(small.guardsIntact());
    EXPECT_EQ(small.at(8, 5), 0xFF112233u);
}

TEST_F(BadTriangles, MissingBuffersDrawNothing) {
    SetTarget(nullptr, nullptr, 64, 64, 48);
    FLAT_LINE(Tri(0, 0, 64, 0, 0, 48));
    GOURAUD_Z(Tri(0, 0, 64, 0, 0, 48));
    SetTarget(tg.colour(), nullptr, 64, 64, 48);
    GOURAUD_Z(Tri(0, 0, 64, 0, 0, 48));
    EXPECT_TRUE(Untouched());
}

}  // namespace
