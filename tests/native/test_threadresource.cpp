// Thread resources, thick lines, coloured triangles, and two threads drawing
// into disjoint halves of one target.
#include <gtest/gtest.h>

#include <climits>
#include <thread>

#include "jni/Exception.h"
#include "raster_testutil.h"
#include "render/threadresource.h"
#include "render/toolkit.h"

using namespace rasttest;
using namespace Rasterizer_n;

namespace {

struct ToolkitTarget : ::testing::Test {
    toolkit* tk = nullptr;
    Target tg{96, 64, 96};
    void SetUp() override {
        tk = toolkit::create(nullptr, false, 0);
        Bind(true, true);
        Clear();
    }
    void Clear() {
        for (int y = 0; y < tg.height; ++y)
            for (int x = 0; x < tg.pitch; ++x) {
                tg.at(x, y) = 0x5A5A5A5Au;
                tg.zat(x, y) = 3.4e38f;
            }
    }
    void TearDown() override { toolkit::destroy(tk); }
    void Bind(bool colour, bool depth) {
        tk->m_Width = tg.width;
        tk->m_Height = tg.height;
        tk->m_ColourBuffer = colour ? tg.colour() : nullptr;
        tk->m_DepthBuffer = depth ? tg.depth() : nullptr;
        tk->resetclipping();
        tk->setup_backbuffer(tk->m_ColourBuffer, tk->m_DepthBuffer, tg.width, tg.height, tg.pitch);
    }
    int Count(uint32_t c) const {
        int n = 0;
        for (int y = 0; y < tg.height; ++y)
            for (int x = 0; x < tg.width; ++x) n += tg.at(x, y) == c;
        return n;
    }
};

using ThreadResource = ToolkitTarget;
using ThickLine = ToolkitTarget;
using ColouredTriangle = ToolkitTarget;

TEST_F(ThreadResource, StartsClearLinksIntoTheToolkitAndChecksScratchLimits) {
    threadresource* a = threadresource::create(*tk, 3, 4);
    threadresource* b = threadresource::create(*tk, 5, 6);
    EXPECT_EQ(reinterpret_cast<uintptr_t>(a->m_Vertices) % 16, 0u);
    EXPECT_EQ(a->m_SharelightPass, 1);
    EXPECT_EQ(a->m_First * 10 + a->m_Second, 34);
    for (int i = 0; i < threadresource::MaxMarks; ++i) ASSERT_EQ(a->m_MarksA[i] | a->m_MarksB[i], 0) << i;
    EXPECT_EQ(tk->m_Threads.next, &b->m_Link);  // newest first
    EXPECT_EQ(b->m_Link.next, &a->m_Link);
    threadresource::destroy(b);
    EXPECT_EQ(tk->m_Threads.prev, &a->m_Link);
    threadresource::destroy(a);
    EXPECT_TRUE(tk->m_Threads.empty_head());
    EXPECT_NO_THROW(threadresource::check_scratch(threadresource::Scratch_Vertices, 16768));
    EXPECT_NO_THROW(threadresource::check_scratch(threadresource::Scratch_Marks, 10000));
    for (auto c : {std::make_pair(threadresource::Scratch_Vertices, 16769LL), std::make_pair(threadresource::Scratch_Marks, 10001LL),
                   std::make_pair(threadresource::Scratch_Vertices, -1LL), std::make_pair(threadresource::Scratch_Marks, 1LL << 40)}) {
        try {
            threadresource::check_scratch(c.first, c.second);
            ADD_FAILURE() << "no exception for " << c.second;
        } catch (Exception* e) {
            EXPECT_NE(dynamic_cast<IllegalArgumentException*>(e), nullptr);
            delete e;
        }
    }
}

TEST_F(ThickLine, RectanglesOfTheirThicknessRelativeToTheClip) {
    threadresource* tr = threadresource::create(*tk, 0, 0);
    tk->line_thick(*tr, 10, 20, 50, 20, 0xFF00FF00u, 4, 0);
    for (int y = 0; y < tg.height; ++y)
        for (int x = 0; x < tg.width; ++x)
            ASSERT_EQ(tg.at(x, y) == 0xFF00FF00u, y >= 18 && y < 22 && x >= 10 && x < 50) << x << "," << y;
    tk->setclipping(5, 7, 96, 64);
    tk->line_thick(*tr, 15, 27, 55, 27, 0xFF0000FFu, 4, 0);
    EXPECT_EQ(Count(0xFF0000FFu), 160);
    EXPECT_EQ(tg.at(10, 18), 0xFF0000FFu);
    Clear();
    tk->resetclipping();
    tk->line_thick(*tr, 30, 5, 30, 45, 0xFF00FF00u, 6, 0);  // downward: columns 27..32
    for (int y = 6; y < 44; ++y) EXPECT_TRUE(tg.at(29, y) == 0xFF00FF00u && tg.at(32, y) == 0xFF00FF00u && tg.at(40, y) == 0x5A5A5A5Au) << y;
    threadresource::destroy(tr);
}

TEST_F(ThickLine, AnyCoordinatesStayInsideTheBuffer) {
    threadresource* tr = threadresource::create(*tk, 0, 0);
    tk->line_thick(*tr, 20, 20, 20, 20, 0xFF00FF00u, 10, 0);  // no length, then no colour buffer
    Bind(false, true);
    tk->line_thick(*tr, 0, 0, 90, 60, 0xFF00FF00u, 10, 0);
    Bind(true, true);
    EXPECT_EQ(Count(0xFF00FF00u), 0);
    const int ext[] = {INT_MIN, INT_MIN + 1, -40000, -1, 0, 7, 50, 40000, INT_MAX};
    Rng r(5);
    for (int i = 0; i < 400; ++i) {
        int x1 = ext[r.range(0, 8)], y1 = ext[r.range(0, 8)], x2 = ext[r.range(0, 8)], y2 = ext[r.range(0, 8)];
        tk->line_thick(*tr, x1, y1, x2, y2, r.u32(), r.chance(30) ? ext[r.range(0, 8)] : r.range(-20, 20), 0);
    }
    EXPECT_TRUE(tg.guardsIntact());
    tk->line_thick(*tr, -100000, 32, 100000, 32, 0xFF123456u, 1 << 20, 0);  // huge thickness fills it
    EXPECT_EQ(Count(0xFF123456u), 96 * 64);
    EXPECT_TRUE(tg.guardsIntact());
    threadresource::destroy(tr);
}

TEST_F(ColouredTriangle, ChoosesByTheCurrentTargets) {
    const uint32_t c = 0x80FF4020u;
    RenderColouredTriangle(0, 0, 96, 0, 0, 64, c, c, c);
    EXPECT_EQ(tg.at(10, 10), c);         // vertex colours arrive unchanged
    EXPECT_EQ(tg.zat(10, 10), 3.4e38f);  // depth tested, not written
    for (int x = 0; x < 96; ++x) tg.zat(x, 5) = -1.0f;  // depth 0 fails against nearer stored depths
    RenderColouredTriangle(0, 0, 96, 0, 0, 64, 0xFF0000FFu, 0xFF0000FFu, 0xFF0000FFu);
    EXPECT_EQ(tg.at(10, 5), c);
    EXPECT_EQ(tg.at(10, 6), 0xFF0000FFu);
    Bind(true, false);  // colour only: no test
    RenderColouredTriangle(0, 0, 96, 0, 0, 64, 0xFF00FF00u, 0xFF00FF00u, 0xFF00FF00u);
    EXPECT_EQ(tg.at(10, 5), 0xFF00FF00u);
    Bind(false, true);  // depth only, then no buffers: nothing changes
    RenderColouredTriangle(0, 0, 96, 0, 0, 64, 1, 2, 3);
    Bind(false, false);
    RenderColouredTriangle(0, 0, 96, 0, 0, 64, 1, 2, 3);
    EXPECT_EQ(tg.at(10, 30), 0xFF00FF00u);
    EXPECT_EQ(tg.zat(10, 5), -1.0f);
    EXPECT_TRUE(tg.guardsIntact());
}

// Draws the given triangles with the thread's own resource, staging the
// vertices in the resource's scratch region as models do. Resources are
// created and destroyed while no thread draws.
void DrawWith(toolkit& tk, threadresource* tr, const std::vector<Triangle_s>& tris, const Texture* tex,
              int firstRow) {
    for (const Triangle_s& src : tris) {
        for (int i = 0; i < 3; ++i) tr->m_Vertices[i] = src.m_Positions[i];
        Triangle_s t = src;
        for (int i = 0; i < 3; ++i) t.m_Positions[i] = tr->m_Vertices[i];
        RenderTriangle<ShadeMode_Gouraud, TexAddress_Wrap, TexAddress_Wrap, false, FogMode_None, BlendMode_Opaque,
                       false, false, true, true, true>(t);
        t.m_pTexture = tex->texels.data();
        RenderTriangle<ShadeMode_Textured, TexAddress_Repeat, TexAddress_Repeat, false, FogMode_Distance,
                       BlendMode_TriangleAlpha, false, false, true, true, true>(t);
        int y = firstRow + 2 + int(_mm_cvtss_f32(_mm_shuffle_ps(src.m_Positions[1], src.m_Positions[1], 1))) % 120;
        tk.line_thick(*tr, int(_mm_cvtss_f32(src.m_Positions[0])), y, 200, y, 0xFF00FFFFu, 2, 0);
    }
}

TEST(ThreadedDrawing, TwoThreadsInDisjointHalvesMatchOneThread) {
    toolkit* tk = toolkit::create(nullptr, false, 0);
    Target one(256, 256, 256), two(256, 256, 256);
    Rng r(99);
    one.randomise(r, true);
    two.copyFrom(one);
    Texture tex(r);
    const Texture* texs[3] = {&tex, &tex, &tex};
    std::vector<Triangle_s> halves[2];
    for (int i = 0; i < 600; ++i) {
        Triangle_s t;
        RandomTriangle(r, 256, 128, t, texs, nullptr);
        for (int k = 0; k < 3; ++k)  // keep every vertex inside its half
            t.m_Positions[k] = _mm_setr_ps(r.uni(0.0f, 255.9f), r.uni(0.0f, 127.9f) + 128.0f * (i & 1), r.uni(0.05f, 1.0f), 1.0f);
        halves[i & 1].push_back(t);
    }
    auto bind = [&](Target& tg) {
        tk->m_Width = tk->m_Height = 256;
        tk->m_ColourBuffer = tg.colour();
        tk->m_DepthBuffer = tg.depth();
        tk->resetclipping();
        tk->setup_backbuffer(tg.colour(), tg.depth(), 256, 256, 256);
        SetViewportRect(0, 0, 256, 256);
        RecomputeDistanceFogParams(0.4f, 0xFF406080u);
    };
    threadresource* tra = threadresource::create(*tk, 0, 0);
    threadresource* trb = threadresource::create(*tk, 0, 0);
    bind(one);
    std::thread([&] {
        DrawWith(*tk, tra, halves[0], &tex, 0);
        DrawWith(*tk, tra, halves[1], &tex, 128);
    }).join();
    bind(two);
    std::thread a([&] { DrawWith(*tk, tra, halves[0], &tex, 0); });
    std::thread b([&] { DrawWith(*tk, trb, halves[1], &tex, 128); });
    a.join();
    b.join();
    threadresource::destroy(tra);
    threadresource::destroy(trb);
    bool inDepth = false;
    EXPECT_EQ(one.diff(two, inDepth), -1) << (inDepth ? "depth" : "colour");
    EXPECT_TRUE(two.guardsIntact());
    toolkit::destroy(tk);
}

}  // namespace
