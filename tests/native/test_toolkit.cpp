// Toolkit state: clipping, shadow resolution, point lights, fog and
// underwater mode, projection-derived depth range, buffer scroll.
#include <gtest/gtest.h>

#include <xmmintrin.h>

#include <algorithm>
#include <cmath>
#include <cstring>
#include <memory>
#include <vector>

#include "render/RasterizerState.h"
#include "render/canvas.h"
#include "render/toolkit.h"

namespace {

class ToolkitState : public ::testing::Test {
protected:
    void SetUp() override {
        mxcsr = _mm_getcsr();
        savedViewport = *Rasterizer_n::GetViewport();
        tk = toolkit::create(nullptr, false, 0);
    }
    void TearDown() override {
        tk->set_active_canvas(nullptr);
        toolkit::destroy(tk);
        Rasterizer_n::SetViewport(savedViewport);
        _mm_setcsr(mxcsr);
    }
    void attach(int w, int h) {
        canvas_.reset(new memory_canvas(w, h));
        tk->set_active_canvas(canvas_.get());
    }
    std::vector<int> clip() const {
        int c[4];
        tk->getclipping(c);
        return std::vector<int>(c, c + 4);
    }
    unsigned int mxcsr = 0;
    Rasterizer_n::Viewport_s savedViewport{};
    toolkit* tk = nullptr;
    std::unique_ptr<memory_canvas> canvas_;
};

TEST_F(ToolkitState, CanvasActivationAndClipping) {
    EXPECT_EQ(_mm_getcsr() & 0x8040u, 0x8040u);  // flush-to-zero and denormals-are-zero
    canvas_.reset(new memory_canvas(640, 480));
    std::fill(canvas_->colourbuffer(), canvas_->colourbuffer() + 640 * 480, 0x12345678u);
    std::fill(canvas_->depthbuffer(), canvas_->depthbuffer() + 640 * 480, 1.0f);
    tk->set_active_canvas(canvas_.get());
    for (int i = 0; i < 640 * 480; i += 997) {  // activation clears both buffers
        ASSERT_EQ(canvas_->colourbuffer()[i], 0u);
        ASSERT_EQ(canvas_->depthbuffer()[i], 3.4e38f);
    }
    tk->setclipping(-5, -5, 10000, 10000);
    EXPECT_EQ(clip(), (std::vector<int>{0, 0, 640, 480}));
    tk->setclipping(10, 20, 300, 200);
    tk->setsubclipping(0, 50, 400, 150);
    EXPECT_EQ(clip(), (std::vector<int>{10, 50, 300, 150}));
    tk->setsubclipping(500, 0, 600, 480);  // disjoint: left > right draws nothing
    EXPECT_EQ(clip(), (std::vector<int>{500, 50, 300, 150}));
    tk->resetclipping();
    EXPECT_EQ(clip(), (std::vector<int>{0, 0, 640, 480}));
    tk->set_active_canvas(nullptr);
    EXPECT_EQ(Rasterizer_n::m_pColourBuffer, nullptr);
    tk->scroll(1, 1);  // without a target nothing happens

    const int cases[][3] = {{100, 64, 6}, {0, 1, 0}, {-7, 1, 0}, {3, 2, 1}, {0x7FFFFFFF, 1 << 30, 30}};
    for (const auto& c : cases) {  // shadow resolution: a power of two
        tk->set_shadow_resolution(c[0]);
        EXPECT_EQ(tk->m_ShadowResolution, c[1]) << c[0];
        EXPECT_EQ(tk->m_ShadowResolutionShift, c[2]) << c[0];
    }
}

float lane(__m128 v, int i) {
    alignas(16) float f[4];
    _mm_store_ps(f, v);
    return f[i];
}

TEST_F(ToolkitState, PointLightsAndSun) {
    std::vector<int> lights;
    std::vector<float> intensity;
    for (int i = 0; i < 7; ++i) {
        int l[5] = {100 * i, -5 * i, 7 + i, 10 + i, int(0xFF000000u) + i};
        lights.insert(lights.end(), l, l + 5);
        intensity.push_back(i == 1 ? 2.5f : 0.25f * float(i));
    }
    tk->set_pointlights(7, lights.data(), intensity.data());
    EXPECT_EQ(tk->m_PointLightCount, 4);  // clamped to four
    EXPECT_EQ(lane(tk->m_PointLightPositions[3], 1), -15.0f);
    EXPECT_EQ(tk->m_PointLightColours[3], 0xFF000003u);
    EXPECT_EQ(tk->m_PointLightScales[1], 1.0f * 121.0f * 256.0f);  // intensity 2.5 counts as 1
    EXPECT_EQ(tk->m_PointLightScales[2], 0.5f * 144.0f * 256.0f);
    int big[5] = {0, 0, 0, 50000, 0};  // the squared radius is a 32-bit integer product
    float one = 1.0f;
    tk->set_pointlights(1, big, &one);
    EXPECT_EQ(tk->m_PointLightScales[0], float(int(50000u * 50000u)) * 256.0f);

    tk->set_globalsun(0x00FF8010, 0.5f, 1.5f, 3.0f, 4.0f, 0.0f);
    EXPECT_EQ(tk->m_SunColour[1], 0x80);
    EXPECT_NEAR(tk->m_SunDirection[0], 0.6f, 1e-6);
    EXPECT_EQ(tk->m_ShadowStepX, 192);
    tk->set_globalsun(0, 1, 1, -1.0f, 2.0f, -4.0f);
    EXPECT_EQ(tk->m_ShadowStepX, -128);
    EXPECT_EQ(tk->m_ShadowStepZ, -512);
}

// Row-vector perspective projection: depth -1..1 from near to far.
Matrix_c perspective(float n, float f) {
    const float A = (f + n) / (f - n), B = -2.0f * f * n / (f - n);
    const float m[16] = {1.5f, 0, 0, 0, 0, 2.0f, 0, 0, 0, 0, A, 1, 0, 0, B, 0};
    return Matrix_c(m);
}

float expected_fog_start(const Matrix_c& p, float distance) {
    // (0, 0, zfar - distance, 1) through the projection, divided by w, then
    // the viewport's depth scale and offset.
    __m128 clip = p.TransformPoint(0, 0, Rasterizer_n::m_ZFar - distance);
    float z = lane(clip, 2), w = lane(clip, 3);
    const Rasterizer_n::Viewport_s& vp = *Rasterizer_n::GetViewport();
    float ndc = z / w;
    if (std::signbit(z) && !std::signbit(ndc)) ndc = -ndc;
    return ndc * ((vp.MaxZ - vp.MinZ) * 0.5f) + ((vp.MaxZ - vp.MinZ) * 0.5f + vp.MinZ);
}

TEST_F(ToolkitState, ProjectionSetsDepthRangeAndMovesTheFogStart) {
    attach(320, 200);
    Rasterizer_n::Viewport_s vp = *Rasterizer_n::GetViewport();
    vp.MinZ = 0.0f;
    vp.MaxZ = 1.0f;
    Rasterizer_n::SetViewport(vp);
    tk->set_fog(0xFF102030, 500);
    float before = Rasterizer_n::m_DistanceFogStart;
    Matrix_c p = perspective(50.0f, 3000.0f);
    tk->set_projection(p);
    // Planes are normalised with the approximate reciprocal square root.
    EXPECT_NEAR(Rasterizer_n::m_ZFar, 3000.0f, 3000.0f * 1e-3f);
    EXPECT_NEAR(Rasterizer_n::m_ZNear, 50.0f, 50.0f * 1e-3f);
    EXPECT_NE(Rasterizer_n::m_DistanceFogStart, before);
    EXPECT_NEAR(Rasterizer_n::m_DistanceFogStart, expected_fog_start(p, 500.0f), 1e-6);
    EXPECT_EQ(lane(Rasterizer_n::m_DistanceFogColour, 0), 0x30 * 256.0f);
    const float cam[16] = {1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 10, 20, 30, 1};
    float zfar = Rasterizer_n::m_ZFar;
    tk->set_camera(Matrix_c(cam));  // the camera moves the frustum, not the depth range
    EXPECT_EQ(Rasterizer_n::m_ZFar, zfar);
    // A negative fog distance counts as 0.
    tk->set_fog(0, -100);
    float atNegative = Rasterizer_n::m_DistanceFogStart;
    EXPECT_EQ(tk->m_FogDistance, 0.0f);
    tk->set_fog(0, 0);
    EXPECT_EQ(Rasterizer_n::m_DistanceFogStart, atNegative);
    EXPECT_NEAR(atNegative, 1.0f, 1e-5);
}

TEST_F(ToolkitState, UnderwaterModeSavesAndRestoresTheFogColour) {
    tk->set_fog(0xFF112233, 100);
    tk->underwatermode_enable(-200, 0x80FF4020, 400, 12345);
    EXPECT_EQ(tk->m_FogColour, 0x80FF4020u);
    EXPECT_EQ(tk->m_HeightFogScale, -1.0f / 400.0f);
    EXPECT_EQ(lane(Rasterizer_n::m_HeightFogColour, 2), 65280.0f);
    EXPECT_EQ(lane(Rasterizer_n::m_HeightFogColour, 3), 32768.0f);
    tk->underwatermode_adjust(-100, 0x00000010, 50, 0);  // keeps the saved colour
    tk->underwatermode_disable();
    EXPECT_FALSE(tk->m_Underwater);
    EXPECT_EQ(tk->m_FogColour, 0xFF112233u);
    EXPECT_EQ(lane(Rasterizer_n::m_HeightFogColour, 0), 16.0f * 256.0f);  // height fog stays
}

// Element-wise reference of the linear scroll.
template <class T>
void reference_scroll(std::vector<T>& p, long long o) {
    long long n = (long long)p.size();
    if (o < 0)
        for (long long i = 0; i < n + o; ++i) p[size_t(i)] = p[size_t(i - o)];
    else if (o > 0)
        for (long long i = n - o - 1; i >= 0; --i) p[size_t(i + o)] = p[size_t(i)];
}

TEST_F(ToolkitState, ScrollMovesBothBuffersEitherWay) {
    attach(7, 5);
    const int n = 35;
    const int moves[][2] = {{1, 0}, {0, 1}, {-2, 0}, {3, -1}, {0, -4}, {-1, 2}, {0, 0}, {0, 5}, {-40, 0}, {6, 0}};
    for (const auto& m : moves) {
        std::vector<unsigned int> colour(n);
        std::vector<float> depth(n);
        for (int i = 0; i < n; ++i) {
            colour[size_t(i)] = 0xFF000000u + unsigned(i);
            depth[size_t(i)] = float(i) * 0.5f;
        }
        std::memcpy(canvas_->colourbuffer(), colour.data(), n * 4);
        std::memcpy(canvas_->depthbuffer(), depth.data(), n * 4);
        tk->scroll(m[0], m[1]);
        long long o = (long long)m[1] * 7 + m[0];
        reference_scroll(colour, o);
        reference_scroll(depth, o);
        for (int i = 0; i < n; ++i) {
            ASSERT_EQ(canvas_->colourbuffer()[i], colour[size_t(i)]) << m[0] << "," << m[1] << " at " << i;
            ASSERT_EQ(canvas_->depthbuffer()[i], depth[size_t(i)]) << m[0] << "," << m[1] << " at " << i;
        }
    }
}

}  // namespace
