// Particles against the primitives drawn directly: discs, textured blits,
// skipped and culled particles, texture requests.
#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <functional>
#include <vector>

#include "render/DepthBuffer.h"
#include "render/RasterizerState.h"
#include "render/callbacks.h"
#include "render/threadresource.h"
#include "render/toolkit.h"
#include "sprite/Sprite.h"
#include "texture/texturecache.h"

namespace {

const int W = 64, H = 48;

struct RecordingCallbacks : toolkit_callbacks {
    int requests = 0;
    std::function<bool(unsigned short)> answer;
    bool request_texture(unsigned short id) override {
        ++requests;
        return answer ? answer(id) : false;
    }
    void garbagecollect() override {}
    void* createshadow() override { return nullptr; }
};

// A toolkit with a texture cache drawing into a 64 x 48 offscreen pair, with a
// camera and projection under which world (x, y, z) lands on screen pixel
// (x, y) at depth z / 2 + 1/2 and the camera's right axis is +x.
struct ParticleScene : ::testing::Test {
    RecordingCallbacks* cb = new RecordingCallbacks;
    toolkit* tk = nullptr;
    threadresource* tr = nullptr;
    Sprite_c colour, refColour;
    DepthBuffer_c depth, refDepth;
    unsigned int savedCsr = _mm_getcsr();

    void SetUp() override {
        tk = toolkit::create(cb, true, 100);
        toolkit::m_pInstance = tk;
        Rasterizer_n::Viewport_s vp = *Rasterizer_n::GetViewport();
        vp.MinZ = 0.0f, vp.MaxZ = 1.0f;
        Rasterizer_n::SetViewport(vp);
        const float proj[16] = {2.0f / W, 0, 0, 0, 0, 2.0f / H, 0, 0, 0, 0, 1, 0, -1, -1, 0, 1};
        tk->set_projection(Matrix_c(proj));
        tk->set_camera(Matrix_c());
        colour.Allocate(W, H);
        refColour.Allocate(W, H);
        depth.Allocate(W, H);
        refDepth.Allocate(W, H);
        clear(colour, depth);
        clear(refColour, refDepth);
        tk->start_offscreen_render(&colour, &depth);
        tr = threadresource::create(*tk, 0, 0);
    }
    void TearDown() override {
        threadresource::destroy(tr);
        toolkit::destroy(tk);
        toolkit::m_pInstance = nullptr;
        _mm_setcsr(savedCsr);
    }
    void clear(Sprite_c& c, DepthBuffer_c& d) {
        for (int i = 0; i < W * H; ++i) c.Pixels[i] = 0xFF102030u, d.Data[i] = 3.4e38f;
    }
    // Draws one batch into the main target.
    void particles(const std::vector<int>& pos, const std::vector<int>& col, const std::vector<int>& size,
                   const std::vector<short>& tex, bool colourOn = true, bool depthOn = true) {
        int n = int(col.size());
        if (colourOn && depthOn)
            tr->render_particles<true, true>(pos.data(), col.data(), size.data(), tex.data(), n);
        else if (colourOn)
            tr->render_particles<true, false>(pos.data(), col.data(), size.data(), tex.data(), n);
        else
            tr->render_particles<false, true>(pos.data(), col.data(), size.data(), tex.data(), n);
    }
    // Runs `draw` on the reference target, then returns to the main one.
    void on_reference(const std::function<void()>& draw) {
        tk->start_offscreen_render(&refColour, &refDepth);
        draw();
        tk->start_offscreen_render(&colour, &depth);
    }
    bool same_as_reference() const {
        return std::memcmp(colour.Pixels, refColour.Pixels, W * H * 4) == 0;
    }
    bool untouched() const {
        for (int i = 0; i < W * H; ++i)
            if (colour.Pixels[i] != 0xFF102030u) return false;
        return true;
    }
    static int fx(int v) { return v * 4096; }  // world units with 12 fractional bits
    static std::vector<int> texels(uint32_t seed) {
        std::vector<int> px(128 * 128);
        for (int i = 0; i < 128 * 128; ++i) px[i] = int(0x80000000u | ((uint32_t(i) * 2654435761u) ^ seed) >> 8);
        return px;
    }
};

TEST_F(ParticleScene, UntexturedIsADiscOfRadiusHalfTheSize) {
    // size 20480 / 2048 = 10 pixels: r = 5; positions truncate to whole units
    particles({fx(20) + 4095, fx(15) + 4095, 4095}, {int(0xC0FF8000u)}, {20480}, {-1});
    on_reference([&] { tk->circle_fill(20, 15, 0.5f, 5, 0xC0FF8000u, 1); });
    EXPECT_TRUE(same_as_reference());
    EXPECT_NE(colour.Pixels[15 * W + 20], 0xFF102030u);
    // the largest sizes (2^31 / 2048 = 2^20 pixels) are drawn safely, covering the target
    particles({fx(20), fx(15), 0, fx(20), fx(15), 0}, {-1, -1}, {0x7FFFFFFF, int(0x80000000u)}, {-1, -1});
    EXPECT_EQ(colour.Pixels[0], 0xFFFFFFFFu);
}
TEST_F(ParticleScene, SkippedParticles) {
    particles({fx(20), fx(15), 0, fx(30), fx(20), 0}, {-1, -1}, {1000, 0}, {-1, -1});  // sizes round to 0
    particles({fx(20), fx(15), fx(-3), fx(30), fx(15), fx(-2)}, {-1, -1}, {20480, 20480}, {-1, -1});  // before near
    particles({fx(-20), fx(15), 0, fx(20), fx(200), 0}, {-1, -1}, {20480, 20480}, {-1, -1});  // off screen
    particles({fx(20), fx(15), 0}, {}, {}, {});  // count 0
    EXPECT_TRUE(untouched());
    for (int i = 0; i < W * H; ++i) depth.Data[i] = 0.25f;  // behind what the depth buffer holds
    particles({fx(20), fx(15), 0}, {-1}, {20480}, {-1});
    EXPECT_TRUE(untouched());
}
TEST_F(ParticleScene, TexturedIsAScaledBlitOfTheRequestedTexture) {
    const std::vector<int> px = texels(0x1234);
    texturemetrics m = {};
    cb->answer = [&](unsigned short id) {
        if (id != 7) return false;
        tk->upload_texture(7, px.data(), m);
        return true;
    };
    // two particles of texture 7 (one request), one of texture 9 (refused)
    particles({fx(20), fx(15), 0, fx(40), fx(30), 0, fx(50), fx(10), 0}, {int(0xFFFFFFFFu), int(0x80FF8040u), -1},
              {40960, 16384, 20480}, {7, 7, 9});
    EXPECT_EQ(cb->requests, 2);
    textureslot* slot = tk->gettex(7);
    ASSERT_NE(slot, nullptr);
    on_reference([&] {
        Sprite_c t;
        t.WrapForeign(slot->texels, 128, 128, 256);
        // D = 20: drawn from (20 - 10, 15 - 10) at 21 x 21; D = 8 from (36, 26) at 9 x 9
        Sprite_c::RenderParams_s p = {};
        p.x = 10, p.y = 5, p.depth = 0.5f, p.colour = 0xFFFFFFFFu, p.width = p.height = 21;
        t.Render<0, 1, true, false, true, true>(*tk, p);
        p.x = 36, p.y = 26, p.colour = 0x80FF8040u, p.width = p.height = 9;
        t.Render<0, 1, true, false, true, true>(*tk, p);
        t.Release();
    });
    EXPECT_TRUE(same_as_reference());
    EXPECT_EQ(colour.Pixels[10 * W + 50], 0xFF102030u);  // texture 9 was not drawn
    EXPECT_NE(colour.Pixels[15 * W + 20], 0xFF102030u);
}

TEST_F(ParticleScene, DepthOnlyTargetLeavesNoTrace) {
    const std::vector<int> px = texels(5);
    texturemetrics m = {};
    tk->upload_texture(3, px.data(), m);
    tk->start_offscreen_render(nullptr, &depth);
    particles({fx(20), fx(15), 0, fx(30), fx(20), 0}, {-1, -1}, {20480, 20480}, {3, -1}, false, true);
    tk->start_offscreen_render(&colour, &depth);
    EXPECT_TRUE(untouched());
    for (int i = 0; i < W * H; ++i) ASSERT_EQ(depth.Data[i], 3.4e38f);
}

}  // namespace
