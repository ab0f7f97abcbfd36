// Maths tables, palette, frustum planes and rasteriser state.
#include <gtest/gtest.h>

#include <cmath>
#include <cstring>

#include "render/Matrix.h"
#include "render/RasterizerState.h"
#include "render/colourutils.h"
#include "render/mymath.h"

namespace {

// Independent HSL->RGB computation written straight from the colour model
// (double-precision branches on the same breakpoints, single-precision power).
unsigned int reference_hsl(unsigned int v) {
    float h = float(v >> 10) / 64.0f + 1.0f / 128.0f;
    float s = float((v >> 7) & 7) / 8.0f + 1.0f / 16.0f;
    float l = float(v & 127) / 128.0f;
    float q = (l < 0.5f) ? l * (1.0f + s) : (l + s - l * s);
    float p = 2.0f * l - q;
    unsigned int out = 0;
    const float offsets[3] = {0.33333334f, 0.0f, -0.33333334f};
    for (int c = 0; c < 3; ++c) {
        float t = h + offsets[c];
        if (t > 1.0f) t -= 1.0f;
        if (t < 0.0f) t += 1.0f;
        float value;
        if (t < 1.0f / 6.0f)
            value = p + (q - p) * 6.0f * t;
        else if (t < 0.5f)
            value = q;
        else if (t < 2.0f / 3.0f)
            value = p + (q - p) * (0.6666667f - t) * 6.0f;
        else
            value = p;
        unsigned int byte = (unsigned int)(int)(powf(value, 0.7f) * 256.0f);
        out = (out << 8) | byte;
    }
    return out;
}

TEST(Palette, WholeTableMatchesTheColourModel) {
    colourutils::init();
    EXPECT_EQ(colourutils::hsl_2_rgb(0), 0x000000u);
    int mismatches = 0;
    for (unsigned int v = 0; v < 65536; ++v) {
        unsigned int c = colourutils::coltab[v], r = reference_hsl(v);
        if (c != r && ++mismatches < 5) ADD_FAILURE() << "hsl " << v << " got " << std::hex << c << " want " << r;
    }
    EXPECT_EQ(mismatches, 0);
}

TEST(TrigTables, ValuesAndWrap) {
    mymath::init();
    EXPECT_EQ(mymath::cos(0), 1.0f);
    EXPECT_EQ(mymath::sin(4096), 1.0f);
    EXPECT_EQ(mymath::sin(16384 + 5), mymath::sin(5));
    EXPECT_EQ(mymath::sin(5), sinf(5.0f * 0.0003834952f));
}

TEST(Matrix, FrustumPlanesOfIdentityAndRowVectorMultiply) {
    __m128 planes[6];
    Matrix_c().ExtractFrustumPlanes(planes);
    const float want[6][4] = {{1, 0, 0, 1}, {-1, 0, 0, 1}, {0, 1, 0, 1}, {0, -1, 0, 1}, {0, 0, 1, 1}, {0, 0, -1, 1}};
    alignas(16) float p[4];
    for (int i = 0; i < 6; ++i) {
        _mm_store_ps(p, planes[i]);
        for (int k = 0; k < 4; ++k) EXPECT_NEAR(p[k], want[i][k], 1.5f / 4096.0f) << i << "," << k;
    }
    float a[16] = {1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 10, 20, 30, 1};  // translation
    float b[16] = {2, 0, 0, 0, 0, 3, 0, 0, 0, 0, 4, 0, 0, 0, 0, 1};     // scale
    _mm_store_ps(p, Matrix_c(a).Multiply(Matrix_c(b)).TransformPoint(1, 1, 1));
    EXPECT_TRUE(p[0] == 22.0f && p[1] == 63.0f && p[2] == 124.0f && p[3] == 1.0f);  // translate first
}

TEST(RasterizerState, ViewportCullerAndFog) {
    Rasterizer_n::Viewport_s vp2 = {10, 20, 100, 50, -0.5f, 1.0f};
    Rasterizer_n::SetViewport(vp2);
    alignas(16) float mul[4], add[4];
    _mm_store_ps(mul, Rasterizer_n::m_ViewportMul);
    _mm_store_ps(add, Rasterizer_n::m_ViewportAdd);
    alignas(16) short lanes[8];
    _mm_store_si128(reinterpret_cast<__m128i*>(lanes), Rasterizer_n::m_TriangleCuller);
    const short want[8] = {110, 70, 32767, -16383, 10, 20, 0, 0};
    for (int i = 0; i < 8; ++i) EXPECT_EQ(lanes[i], want[i]) << i;
    EXPECT_TRUE(mul[0] == 50.0f && mul[1] == 25.0f && mul[2] == 0.75f && add[0] == 60.0f && add[1] == 45.0f && add[2] == 0.25f);
    Rasterizer_n::RecomputeDistanceFogParams(0.5f, 0x80FF4020u);
    EXPECT_EQ(Rasterizer_n::m_InvDistanceFogRange, 2.0f);
    alignas(16) float c[4];
    _mm_store_ps(c, Rasterizer_n::m_DistanceFogColour);
    EXPECT_TRUE(c[0] == 8192.0f && c[1] == 16384.0f && c[2] == 65280.0f && c[3] == 32768.0f);
}

TEST(RasterizerState, CullerStrictNearAndBounds) {
    Rasterizer_n::Viewport_s vp = {0, 0, 640, 480, 0.0f, 1.0f};
    Rasterizer_n::SetViewport(vp);
    auto v = [](float x, float y, float z) { return _mm_setr_ps(x, y, z, 1.0f); };
    auto cull = [&](float x0, float x1, float x2, float z0, float z1, float z2) {
        return Rasterizer_n::CullTriangle<false>(v(x0, 10, z0), v(x1, 10, z1), v(x2, 100, z2));
    };
    EXPECT_TRUE(cull(10, 100, 10, 0.5f, 0.5f, 0.5f));   // inside
    EXPECT_FALSE(cull(10, 100, 10, 0, 0, 0));           // on the near bound: strict
    EXPECT_FALSE(cull(10, 100, 10, 0.5f, 0, 0));        // one vertex in front is not enough
    EXPECT_FALSE(cull(700, 800, 700, 0.5f, 0.5f, 0.5f));
    EXPECT_FALSE(cull(-5, -1, -3, 0.5f, 0.5f, 0.5f));
    EXPECT_TRUE(cull(-5, 5, -3, 0.5f, 0.5f, 0.5f));     // straddling the left edge
    EXPECT_TRUE(cull(10, 100, 10, 1.5f, 1.5f, 1.5f));   // saturation keeps depths at the far lane
    // 640.6 rounds to 641, beyond the bound; truncation gives 640
    EXPECT_FALSE(Rasterizer_n::CullerAccepts(Rasterizer_n::CullerVertexMask<true>(v(640.6f, 10, 0.5f))));
    EXPECT_TRUE(Rasterizer_n::CullerAccepts(Rasterizer_n::CullerVertexMask<false>(v(640.6f, 10, 0.5f))));
    Rasterizer_n::Viewport_s half = {0, 0, 640, 480, 0.0f, 0.5f};
    Rasterizer_n::SetViewport(half);
    EXPECT_FALSE(cull(10, 100, 10, 0.6f, 0.6f, 0.6f));
    EXPECT_TRUE(cull(10, 100, 10, 0.6f, 0.4f, 0.6f));
}

}  // namespace
