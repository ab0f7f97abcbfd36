// Offscreen targets, depth buffers, copies between them and the current
// target, pixel read-back and write, depth clear, and the shared clip and
// array checks used by the entries.
#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <random>
#include <vector>

#include "render/DepthBuffer.h"
#include "render/OffscreenSurface.h"
#include "render/RasterizerState.h"
#include "render/blitclip.h"
#include "render/canvas.h"
#include "render/toolkit.h"
#include "sprite/Sprite.h"
#include "throws_native.h"

namespace {

struct Toolkit : ::testing::Test {
    toolkit* t = nullptr;
    void SetUp() override { t = toolkit::create(nullptr, false, 0); }
    void TearDown() override { toolkit::destroy(t); }
};

uint32_t pattern(int x, int y, uint32_t salt) { return (uint32_t(y) << 16 | uint32_t(x)) ^ salt; }

void fill_sprite(Sprite_c& s, uint32_t salt) {
    for (uint32_t y = 0; y < s.Height; ++y)
        for (uint32_t x = 0; x < s.Width; ++x) s.Pixels[y * s.Pitch + x] = pattern(int(x), int(y), salt);
}

void fill_depth(DepthBuffer_c& d, float base) {
    for (uint32_t y = 0; y < d.Height; ++y)
        for (uint32_t x = 0; x < d.Width; ++x) d.Data[y * d.Width + x] = base + float(y * 1000 + x);
}

TEST(BlitClip, ClipsBothSurfacesTogether) {
    // {sx, sy, dx, dy, w, h} on a 10 x 10 source and an 8 x 6 destination
    struct Case {
        BlitRect_s in;
        bool ok;
        BlitRect_s out;
    } cases[] = {
        {{0, 0, 0, 0, 5, 5}, true, {0, 0, 0, 0, 5, 5}},
        {{-2, 1, 3, -3, 5, 5}, true, {0, 4, 5, 0, 3, 2}},  // left cut by the source, top by the destination
        {{8, 8, 0, 0, 5, 5}, true, {8, 8, 0, 0, 2, 2}},      // right and bottom cut by the source
        {{0, 0, 0, 0, 0, 5}, false, {}},
        {{-20, 0, 0, 0, 5, 5}, false, {}},
        {{0, 0, 8, 0, 5, 5}, false, {}},
        {{0x7FFFFFF0, 0, 0, 0, 0x7FFFFFFF, 1}, false, {}},
        {{-0x7FFFFFFF, -5, 0, 0, 0x7FFFFFFF, 0x7FFFFFFF}, false, {}},
        {{0, 0, -0x7FFFFFFF, 0, 0x7FFFFFFF, 3}, false, {}},
    };
    for (const Case& c : cases) {
        BlitRect_s r = c.in;
        int n = int(&c - cases);
        ASSERT_EQ(ClipBlit(r, 10, 10, 8, 6), c.ok) << n;
        if (c.ok) {
            EXPECT_EQ((std::vector<int>{r.sx, r.sy, r.dx, r.dy, r.w, r.h}),
                      (std::vector<int>{c.out.sx, c.out.sy, c.out.dx, c.out.dy, c.out.w, c.out.h})) << n;
        }
    }
}
TEST(BlitClip, SizeAndArrayChecks) {
    CheckImageSize(32768, 32767);
    EXPECT_TRUE(throws_native<IllegalArgumentException>([] { CheckImageSize(-1, 5); }));
    EXPECT_TRUE(throws_native<IllegalArgumentException>([] { CheckImageSize(65536, 16384); }));
    EXPECT_TRUE(throws_native<IllegalArgumentException>([] { CheckImageSize(0x7FFFFFFF, 0x7FFFFFFF); }));
    // 3 x 2 at offset 4, stride 5: elements 4..6 and 9..11
    CheckRectElements(3, 2, 4, 5, 12);
    EXPECT_TRUE(throws_native<ArrayIndexOutOfBoundsException>([] { CheckRectElements(3, 2, 4, 5, 11); }));
    EXPECT_TRUE(throws_native<ArrayIndexOutOfBoundsException>([] { CheckRectElements(3, 2, -1, 5, 100); }));
    // negative stride walks backwards from the offset: elements 5..7 and 0..2
    CheckRectElements(3, 2, 5, -5, 8);
    EXPECT_TRUE(throws_native<ArrayIndexOutOfBoundsException>([] { CheckRectElements(3, 3, 5, -5, 100); }));
    EXPECT_TRUE(throws_native<ArrayIndexOutOfBoundsException>(
        [] { CheckRectElements(0x7FFFFFFF, 0x7FFFFFFF, 0x7FFFFFFF, 0x7FFFFFFF, 100); }));
    CheckRectElements(0, 5, -100, 5, 0);  // empty rectangles need nothing
}
TEST_F(Toolkit, OffscreenPairBecomesTheTarget) {
    Sprite_c s;
    s.Allocate(40, 30);
    DepthBuffer_c d;
    d.Allocate(40, 30);
    Rasterizer_n::Viewport_s vp = *Rasterizer_n::GetViewport();
    vp.MinZ = 0.25f, vp.MaxZ = 0.75f;
    Rasterizer_n::SetViewport(vp);
    t->setclipping(1, 2, 3, 4);
    t->start_offscreen_render(&s, &d);
    EXPECT_EQ(Rasterizer_n::m_pColourBuffer, s.Pixels);
    EXPECT_EQ(Rasterizer_n::m_pDepthBuffer, d.Data);
    EXPECT_EQ(Rasterizer_n::m_ScreenPitch, 40);
    int clip[4];
    t->getclipping(clip);
    EXPECT_EQ((std::vector<int>(clip, clip + 4)), (std::vector<int>{0, 0, 40, 30}));
    const Rasterizer_n::Viewport_s& v = *Rasterizer_n::GetViewport();
    EXPECT_EQ((std::vector<float>{float(v.X), float(v.Y), float(v.Width), float(v.Height), v.MinZ, v.MaxZ}),
              (std::vector<float>{0, 0, 40, 30, 0.25f, 0.75f}));
    // Destroying a surface of the current target detaches it.
    OffscreenSurface_c::Forget(*t, &s, nullptr);
    EXPECT_EQ(Rasterizer_n::m_pColourBuffer, nullptr);
    EXPECT_EQ(t->m_DepthBuffer, d.Data);
    OffscreenSurface_c::Forget(*t, nullptr, &d);
    EXPECT_EQ(Rasterizer_n::m_pDepthBuffer, nullptr);
}
TEST_F(Toolkit, DepthOnlyTargetAndDepthClear) {
    DepthBuffer_c d;
    d.Allocate(24, 16);
    for (int i = 0; i < 24 * 16; ++i) d.Data[i] = 1.0f;
    t->start_offscreen_render(nullptr, &d);
    EXPECT_EQ(Rasterizer_n::m_pColourBuffer, nullptr);
    EXPECT_EQ(Rasterizer_n::m_ScreenPitch, 24);
    EXPECT_EQ(Rasterizer_n::GetViewport()->Height, 16);
    int px = 5;
    t->setarea(0, 0, 1, 1, &px, 0, 1);  // no colour buffer: harmless
    EXPECT_TRUE(throws_native<Exception>([&] { t->getarea(0, 0, 1, 1, &px); }));
    t->setclipping(2, 3, 10, 8);
    t->zbuffer_clear(0, 0, 24, 16, 3.4e38f);
    for (int y = 0; y < 16; ++y)
        for (int x = 0; x < 24; ++x) {
            bool in = x >= 2 && x < 10 && y >= 3 && y < 8;
            ASSERT_EQ(d.Data[y * 24 + x], in ? 3.4e38f : 1.0f) << x << "," << y;
        }
    t->resetclipping();
    t->zbuffer_clear(-5, -5, 100, 100, 2.0f);  // whole buffer
    t->zbuffer_clear(24, 0, 5, 5, 9.0f);      // outside or empty: nothing
    t->zbuffer_clear(3, 3, 5, -5, 9.0f);
    for (int i = 0; i < 24 * 16; ++i) ASSERT_EQ(d.Data[i], 2.0f);
}
TEST_F(Toolkit, PairsThatCannotBeRenderedAreRejected) {
    Sprite_c s;
    s.Allocate(40, 30);
    DepthBuffer_c small, large;
    small.Allocate(40, 29);
    large.Allocate(64, 64);  // holds every pixel: accepted
    EXPECT_TRUE(throws_native<IllegalArgumentException>([&] { t->start_offscreen_render(&s, &small); }));
    EXPECT_EQ(t->m_ColourBuffer, nullptr);
    t->start_offscreen_render(&s, &large);
    EXPECT_EQ(t->m_DepthBuffer, large.Data);
}
TEST_F(Toolkit, AreaReadAndWriteAreClipped) {
    memory_canvas c(17, 11);
    t->set_active_canvas(&c);
    std::mt19937 rng(7);
    for (int seed = 0; seed < 60; ++seed) {
        rng.seed(seed);
        for (int i = 0; i < 17 * 11; ++i) c.colourbuffer()[i] = 0xC0000000u + i;
        int x = int(rng() % 30) - 10, y = int(rng() % 24) - 8, w = int(rng() % 25), h = int(rng() % 20);
        std::vector<int> out(size_t(w) * h + 1, 0x55555555);
        t->getarea(x, y, w, h, out.data());
        for (int j = 0; j < h; ++j)
            for (int i = 0; i < w; ++i) {
                int px = x + i, py = y + j;
                int expect = (px >= 0 && px < 17 && py >= 0 && py < 11) ? int(0xC0000000u + py * 17 + px) : 0x55555555;
                ASSERT_EQ(out[size_t(j) * w + i], expect) << "seed " << seed;
            }
        ASSERT_EQ(out.back(), 0x55555555) << "seed " << seed;

        int stride = w + int(rng() % 4), offset = int(rng() % 5);
        std::vector<int> in(size_t(offset) + size_t(stride) * h + 1);
        for (int j = 0; j < h; ++j)
            for (int i = 0; i < stride; ++i) {
                int px = x + i, py = y + j;
                bool used = i < w && px >= 0 && px < 17 && py >= 0 && py < 11;
                // Elements that must not reach the target hold a marker.
                in[offset + size_t(j) * stride + i] = used ? 0x33000000 + j * 100 + i : 0x0BADBAD0;
            }
        t->setarea(x, y, w, h, in.data(), offset, stride);
        for (int py = 0; py < 11; ++py)
            for (int px = 0; px < 17; ++px) {
                int i = px - x, j = py - y;
                uint32_t expect = (i >= 0 && i < w && j >= 0 && j < h) ? uint32_t(0x33000000 + j * 100 + i)
                                                                       : 0xC0000000u + py * 17 + px;
                ASSERT_EQ(c.colourbuffer()[py * 17 + px], expect) << "seed " << seed;
            }
    }
    t->set_active_canvas(nullptr);
}

struct BlitFixture : Toolkit {
    // target 20 x 12; the pair: sprite 9 x 7, depth buffer 13 x 8 (different
    // widths, so each must be addressed with its own stride)
    memory_canvas screen{20, 12};
    Sprite_c sprite;
    DepthBuffer_c depth;
    void SetUp() override {
        Toolkit::SetUp();
        sprite.Allocate(9, 7);
        depth.Allocate(13, 8);
        t->set_active_canvas(&screen);
        reset();
    }
    void reset() {
        for (int i = 0; i < 20 * 12; ++i) {
            screen.colourbuffer()[i] = 0xEE000000u + i;
            screen.depthbuffer()[i] = -1.0f - float(i);
        }
        fill_sprite(sprite, 0x5A000000u);
        fill_depth(depth, 0.5f);
    }
    void TearDown() override {
        t->set_active_canvas(nullptr);
        Toolkit::TearDown();
    }
};

TEST_F(BlitFixture, ToFramebufferColourDepthAndBoth) {
    struct Case {
        int sx, sy, w, h, dx, dy;
    } cases[] = {{0, 0, 9, 7, 0, 0}, {2, 1, 5, 4, 14, 9}, {-3, -2, 8, 8, 5, 3}, {1, 1, 30, 30, -2, -3}, {0, 0, 0, 5, 1, 1}};
    for (int flags = 0; flags < 4; ++flags) {
        bool colour = flags & 1, dep = flags & 2;
        int n = 0;
        for (const Case& c : cases) {
            reset();
            OffscreenSurface_c::BlitToFramebuffer(*t, &sprite, &depth, c.sx, c.sy, c.w, c.h, c.dx, c.dy, colour, dep);
            for (int y = 0; y < 12; ++y)
                for (int x = 0; x < 20; ++x) {
                    int i = x - c.dx + c.sx, j = y - c.dy + c.sy;  // source coordinates
                    bool inRect = x - c.dx >= 0 && x - c.dx < c.w && y - c.dy >= 0 && y - c.dy < c.h;
                    uint32_t ec = 0xEE000000u + y * 20 + x;
                    if (colour && inRect && i >= 0 && j >= 0 && i < 9 && j < 7) ec = pattern(i, j, 0x5A000000u);
                    float ed = -1.0f - float(y * 20 + x);
                    if (dep && inRect && i >= 0 && j >= 0 && i < 13 && j < 8) ed = 0.5f + float(j * 1000 + i);
                    ASSERT_EQ(screen.colourbuffer()[y * 20 + x], ec) << "flags " << flags << " case " << n;
                    ASSERT_EQ(screen.depthbuffer()[y * 20 + x], ed) << "flags " << flags << " case " << n;
                }
            ++n;
        }
    }
}

TEST_F(BlitFixture, FromFramebufferColourDepthAndBoth) {
    struct Case {
        int sx, sy, w, h, dx, dy;
    } cases[] = {{0, 0, 9, 7, 0, 0}, {15, 8, 10, 10, 2, 1}, {-4, 2, 9, 3, 1, -1}, {3, 3, 20, 20, 0, 0}};
    for (int flags = 0; flags < 4; ++flags) {
        bool colour = flags & 1, dep = flags & 2;
        int n = 0;
        for (const Case& c : cases) {
            reset();
            OffscreenSurface_c::BlitFromFramebuffer(*t, &sprite, &depth, c.sx, c.sy, c.w, c.h, c.dx, c.dy, colour,
                                                    dep);
            for (int y = 0; y < 8; ++y)
                for (int x = 0; x < 13; ++x) {
                    int i = x - c.dx + c.sx, j = y - c.dy + c.sy;  // screen coordinates
                    bool from = x - c.dx >= 0 && x - c.dx < c.w && y - c.dy >= 0 && y - c.dy < c.h && i >= 0 &&
                                j >= 0 && i < 20 && j < 12;
                    if (x < 9 && y < 7) {
                        uint32_t ec = from && colour ? 0xEE000000u + j * 20 + i : pattern(x, y, 0x5A000000u);
                        ASSERT_EQ(sprite.Pixels[y * 9 + x], ec) << "flags " << flags << " case " << n;
                    }
                    float ed = from && dep ? -1.0f - float(j * 20 + i) : 0.5f + float(y * 1000 + x);
                    ASSERT_EQ(depth.Data[y * 13 + x], ed) << "flags " << flags << " case " << n;
                }
            ++n;
        }
    }
}

TEST_F(BlitFixture, MissingPartsAreSkipped) {
    // A depth-only target: a colour request copies only depth.
    t->start_offscreen_render(nullptr, &depth);
    DepthBuffer_c other;
    other.Allocate(13, 8);
    fill_depth(other, 100.0f);
    OffscreenSurface_c::BlitToFramebuffer(*t, &sprite, &other, 0, 0, 3, 3, 0, 0, true, true);
    EXPECT_EQ(depth.Data[13 + 2], 100.0f + 1002.0f);
    // No sprite or no depth buffer given: that part is skipped.
    t->set_active_canvas(&screen);
    reset();
    OffscreenSurface_c::BlitToFramebuffer(*t, nullptr, &depth, 0, 0, 2, 2, 0, 0, true, true);
    EXPECT_EQ(screen.colourbuffer()[0], 0xEE000000u);
    EXPECT_EQ(screen.depthbuffer()[0], 0.5f);
    OffscreenSurface_c::BlitFromFramebuffer(*t, &sprite, nullptr, 0, 0, 2, 2, 0, 0, true, true);
    EXPECT_EQ(sprite.Pixels[1], 0xEE000001u);
}

}  // namespace
