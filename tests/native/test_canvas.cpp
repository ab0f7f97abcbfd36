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
    // 32768 x 16384 x 4 bytes is one past 2 GiB; 65536^2 wraps to a small number in 32 bits
    const int bad[][2] = {{0, 10}, {10, 0}, {-1, 10}, {10, -100}, {32768, 16384}, {65536, 65536}, {0x7FFFFFFF, 0x7FFFFFFF}};
    for (const auto& b : bad) expect_illegal_argument([&] { canvas::check_size(b[0], b[1]); });
    canvas::check_size(32767, 16384);  // just below 2 GiB
    expect_illegal_argument([] { memory_canvas c(70000, 70000); });
}

TEST_F(CanvasTest, ActivationBindsBuffersAndClearsThem) {
    for (int w : {1, 7, 33}) {  // odd sizes leave a tail after the four-pixel stores
        const int h = 3, n = w * h;
        memory_canvas c(w, h);
        for (int i = 0; i < n; ++i) c.colourbuffer()[i] = 0xDEADBEEFu, c.depthbuffer()[i] = 1.5f;
        tk_->setclipping(5, 5, 6, 6);
        tk_->set_active_canvas(&c);
        EXPECT_TRUE(tk_->m_ColourBuffer == c.colourbuffer() && tk_->m_DepthBuffer == c.depthbuffer());
        EXPECT_EQ(tk_->m_Width * 100 + tk_->m_Height, w * 100 + h);
        int clip[4];
        tk_->getclipping(clip);
        EXPECT_TRUE(clip[0] == 0 && clip[1] == 0 && clip[2] == w && clip[3] == h);
        EXPECT_TRUE(Rasterizer_n::m_pColourBuffer == c.colourbuffer() && Rasterizer_n::m_pDepthBuffer == c.depthbuffer());
        EXPECT_EQ(Rasterizer_n::m_ScreenPitch, w);
        EXPECT_EQ(Rasterizer_n::GetViewport()->Height, h);
        for (int i = 0; i < n; ++i) {
            ASSERT_EQ(c.colourbuffer()[i], 0u) << "w=" << w << " i=" << i;
            ASSERT_EQ(float_bits(c.depthbuffer()[i]), kFarBits) << "w=" << w << " i=" << i;
        }
    }
    EXPECT_EQ(tk_->m_ColourBuffer, nullptr);  // the last canvas went away while active
    EXPECT_EQ(tk_->m_Width, 0);
    EXPECT_EQ(Rasterizer_n::m_pDepthBuffer, nullptr);
}

TEST_F(CanvasTest, SwapFollowsOnlyTheActiveCanvasAndReturnsAfterTwo) {
    memory_canvas c(16, 8), other(16, 8);
    tk_->set_active_canvas(&c);
    unsigned int* first = c.colourbuffer();
    c.swap_colourbuffer();
    EXPECT_NE(c.colourbuffer(), first);
    EXPECT_TRUE(tk_->m_ColourBuffer == c.colourbuffer() && Rasterizer_n::m_pColourBuffer == c.colourbuffer());
    EXPECT_EQ(tk_->m_DepthBuffer, c.depthbuffer());  // the depth buffer is not swapped
    c.swap_colourbuffer();
    EXPECT_TRUE(c.colourbuffer() == first && Rasterizer_n::m_pColourBuffer == first);
    tk_->set_active_canvas(&other);  // a shown canvas flipping leaves another target alone
    c.swap_colourbuffer();
    { memory_canvas gone(8, 8); }  // as does an inactive canvas going away
    EXPECT_TRUE(tk_->m_ColourBuffer == other.colourbuffer() && Rasterizer_n::m_pColourBuffer == other.colourbuffer());
    tk_->set_active_canvas(nullptr);
    int clip[4];
    tk_->getclipping(clip);
    EXPECT_TRUE(tk_->m_DepthBuffer == nullptr && tk_->m_Height == 0 && clip[2] == clip[0] && clip[3] == clip[1]);
    EXPECT_TRUE(Rasterizer_n::m_pColourBuffer == nullptr && Rasterizer_n::GetViewport()->Width == 0);
}

}  // namespace
