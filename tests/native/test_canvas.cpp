// Canvas buffers as the toolkit sees them: activation, the colour-buffer swap
// of a shared-memory flip, and release while active.
#include <gtest/gtest.h>

#include <cstring>

#include "jni/Exception.h"
#include "render/RasterizerState.h"
#include "render/canvas.h"
#include "render/toolkit.h"

namespace {

const unsigned int kFarBits = 0x7F7FC99Eu;  // 3.4e38f

unsigned int float_bits(float f) {
    unsigned int u;
    std::memcpy(&u, &f, 4);
    return u;
}

template <class F>
void expect_illegal_argument(F f) {
    try {
        f();
        ADD_FAILURE() << "no exception";
    } catch (IllegalArgumentException* e) {
        delete e;
    } catch (Exception* e) {
        ADD_FAILURE() << "wrong exception " << e->what();
        delete e;
    }
}

class CanvasTest : public ::testing::Test {
protected:
    void SetUp() override {
        saved_ = toolkit::m_pInstance;
        tk_ = toolkit::create(nullptr, false, 0);
        toolkit::m_pInstance = tk_;
    }
    void TearDown() override {
        toolkit::m_pInstance = saved_;
        toolkit::destroy(tk_);
    }
    toolkit* tk_ = nullptr;
    toolkit* saved_ = nullptr;
};

TEST(CanvasSize, RejectsEmptyNegativeAndOversizedBuffers) {
    expect_illegal_argument([] { canvas::check_size(0, 10); });
    expect_illegal_argument([] { canvas::check_size(10, 0); });
    expect_illegal_argument([] { canvas::check_size(-1, 10); });
    expect_illegal_argument([] { canvas::check_size(10, -100); });
    // 32768 * 16384 * 4 bytes = 2 GiB, one past what 32-bit sizes hold
    expect_illegal_argument([] { canvas::check_size(32768, 16384); });
    // wraps to a small number in 32-bit arithmetic
    expect_illegal_argument([] { canvas::check_size(65536, 65536); });
    expect_illegal_argument([] { canvas::check_size(0x7FFFFFFF, 0x7FFFFFFF); });
    canvas::check_size(32767, 16384);  // just below 2 GiB
    canvas::check_size(1, 1);
    expect_illegal_argument([] { memory_canvas c(0, 5); });
    expect_illegal_argument([] { memory_canvas c(70000, 70000); });
}

TEST_F(CanvasTest, ActivationBindsBuffersAndClearsThem) {
    // Odd sizes leave a tail after the four-pixel stores.
    for (int w : {1, 7, 64, 33}) {
        int h = 3;
        memory_canvas c(w, h);
        int n = w * h;
        for (int i = 0; i < n; ++i) {
            c.colourbuffer()[i] = 0xDEADBEEFu;
            c.depthbuffer()[i] = 1.5f;
        }
        tk_->setclipping(5, 5, 6, 6);
        tk_->set_active_canvas(&c);
        EXPECT_EQ(tk_->m_ColourBuffer, c.colourbuffer());
        EXPECT_EQ(tk_->m_DepthBuffer, c.depthbuffer());
        EXPECT_EQ(tk_->m_Width, w);
        EXPECT_EQ(tk_->m_Height, h);
        int clip[4];
        tk_->getclipping(clip);
        EXPECT_EQ(clip[0], 0);
        EXPECT_EQ(clip[1], 0);
        EXPECT_EQ(clip[2], w);
        EXPECT_EQ(clip[3], h);
        EXPECT_EQ(Rasterizer_n::m_pColourBuffer, c.colourbuffer());
        EXPECT_EQ(Rasterizer_n::m_pDepthBuffer, c.depthbuffer());
        EXPECT_EQ(Rasterizer_n::m_ScreenPitch, w);
        EXPECT_EQ(Rasterizer_n::GetViewport()->Width, w);
        EXPECT_EQ(Rasterizer_n::GetViewport()->Height, h);
        for (int i = 0; i < n; ++i) {
            ASSERT_EQ(c.colourbuffer()[i], 0u) << "w=" << w << " i=" << i;
            ASSERT_EQ(float_bits(c.depthbuffer()[i]), kFarBits) << "w=" << w << " i=" << i;
        }
        tk_->set_active_canvas(nullptr);
    }
}

TEST_F(CanvasTest, NoCanvasLeavesAnEmptyTarget) {
    memory_canvas c(40, 30);
    tk_->set_active_canvas(&c);
    tk_->set_active_canvas(nullptr);
    EXPECT_EQ(tk_->m_ColourBuffer, nullptr);
    EXPECT_EQ(tk_->m_DepthBuffer, nullptr);
    EXPECT_EQ(tk_->m_Width, 0);
    EXPECT_EQ(tk_->m_Height, 0);
    int clip[4];
    tk_->getclipping(clip);
    EXPECT_EQ(clip[2] - clip[0], 0);
    EXPECT_EQ(clip[3] - clip[1], 0);
    EXPECT_EQ(Rasterizer_n::m_pColourBuffer, nullptr);
    EXPECT_EQ(Rasterizer_n::m_pDepthBuffer, nullptr);
    EXPECT_EQ(Rasterizer_n::GetViewport()->Width, 0);
}

TEST_F(CanvasTest, SwapMovesToolkitAndRasteriserAndReturnsAfterTwo) {
    memory_canvas c(16, 8);
    tk_->set_active_canvas(&c);
    unsigned int* first = c.colourbuffer();
    float* depth = c.depthbuffer();
    c.swap_colourbuffer();
    unsigned int* second = c.colourbuffer();
    EXPECT_NE(first, second);
    EXPECT_EQ(tk_->m_ColourBuffer, second);
    EXPECT_EQ(Rasterizer_n::m_pColourBuffer, second);
    EXPECT_EQ(tk_->m_DepthBuffer, depth);  // the depth buffer is not swapped
    c.swap_colourbuffer();
    EXPECT_EQ(c.colourbuffer(), first);
    EXPECT_EQ(tk_->m_ColourBuffer, first);
    EXPECT_EQ(Rasterizer_n::m_pColourBuffer, first);
    tk_->set_active_canvas(nullptr);
}

TEST_F(CanvasTest, SwapLeavesAnotherTargetAlone) {
    memory_canvas target(16, 8), shown(16, 8);
    tk_->set_active_canvas(&shown);
    tk_->set_active_canvas(&target);  // e.g. a second window or an offscreen pass
    shown.swap_colourbuffer();
    EXPECT_EQ(tk_->m_ColourBuffer, target.colourbuffer());
    EXPECT_EQ(Rasterizer_n::m_pColourBuffer, target.colourbuffer());
    tk_->set_active_canvas(nullptr);
}

TEST_F(CanvasTest, ReleasingTheActiveCanvasDropsTheTarget) {
    {
        memory_canvas c(16, 8);
        tk_->set_active_canvas(&c);
        c.swap_colourbuffer();
    }
    EXPECT_EQ(tk_->m_ColourBuffer, nullptr);
    EXPECT_EQ(tk_->m_DepthBuffer, nullptr);
    EXPECT_EQ(tk_->m_Width, 0);
    EXPECT_EQ(Rasterizer_n::m_pColourBuffer, nullptr);
    EXPECT_EQ(Rasterizer_n::m_pDepthBuffer, nullptr);

    // An inactive canvas going away leaves the current target as it is.
    memory_canvas keep(8, 8);
    tk_->set_active_canvas(&keep);
    { memory_canvas other(8, 8); }
    EXPECT_EQ(tk_->m_ColourBuffer, keep.colourbuffer());
    EXPECT_EQ(Rasterizer_n::m_pColourBuffer, keep.colourbuffer());
    tk_->set_active_canvas(nullptr);
}

}  // namespace
