// Every RenderTriangle instantiation against the scalar reference: thousands
// of random triangles, colour, depth and mask buffers compared exactly,
// sentinel guards around the targets. A failure names its variant, target
// configuration and triangle, and replays from that seed.
#include <gtest/gtest.h>

#include <set>
#include <sstream>
#include <tuple>

#include "raster_reference.h"
#include "raster_testutil.h"

using namespace rasttest;
using namespace Rasterizer_n;

namespace {

struct Config {
    int width, height, pitch;
    int vx, vy, vw, vh;
    const char* what;
};

const Config kConfigs[] = {
    {64, 48, 64, 0, 0, 64, 48, "aligned rows, viewport = target"},
    {61, 37, 61, 3, 2, 50, 30, "odd pitch, viewport inside the target"},
    {64, 48, 68, -10, -7, 100, 80, "viewport larger than the target"},
    {40, 30, 44, 0, 0, 40, 30, "padded rows"},
};

std::string Describe(const RasterVariant_s& v) {
    std::ostringstream o;
    o << "(" << int(v.m_Shade) << "," << int(v.m_AddrU) << "," << int(v.m_AddrV) << "," << v.m_TexTransform << ","
      << int(v.m_Fog) << "," << int(v.m_Blend) << "," << v.m_Transparent << "," << v.m_MapMod << ","
      << v.m_DepthWrite << "," << v.m_ColourWrite << "," << v.m_DepthTest << ")";
    return o.str();
}

void SetFog(Rng& r) {
    RecomputeDistanceFogParams(r.uni(0.1f, 0.9f), r.u32());
}

TEST(RasterizerVariants, TableHoldsTheDocumentedCombinations) {
    ASSERT_EQ(VariantCount(), 182);
    std::set<std::tuple<int, int, int, int, int, int, int, int, int, int, int>> seen;
    int perShade[5] = {0, 0, 0, 0, 0};
    for (int i = 0; i < VariantCount(); ++i) {
        const RasterVariant_s& v = Variant(i);
        EXPECT_TRUE(seen.insert({v.m_Shade, v.m_AddrU, v.m_AddrV, v.m_TexTransform, v.m_Fog, v.m_Blend,
                                 v.m_Transparent, v.m_MapMod, v.m_DepthWrite, v.m_ColourWrite, v.m_DepthTest})
                        .second)
            << Describe(v);
        EXPECT_EQ(v.m_AddrU, v.m_AddrV);
        EXPECT_NE(v.m_Blend, 1);
        ++perShade[v.m_Shade + 1];
        EXPECT_EQ(FindVariant(v.m_Shade, v.m_AddrU, v.m_AddrV, v.m_TexTransform, v.m_Fog, v.m_Blend, v.m_Transparent,
                              v.m_MapMod, v.m_DepthWrite, v.m_ColourWrite, v.m_DepthTest),
                  v.m_Render);
    }
    EXPECT_EQ(perShade[0], 1);                // shadow masks
    EXPECT_EQ(perShade[1], 2);                // thick lines, depth-only faces
    EXPECT_EQ(perShade[2], 3 + 8 + 8);        // thread resource, Gouraud opaque and alpha
    EXPECT_EQ(perShade[3], 80 + 32 + 16);     // models and terrain, textured
    EXPECT_EQ(perShade[4], 32);               // terrain texture blend
    EXPECT_EQ(FindVariant(1, 0, 0, false, 0, 1, false, false, false, true, false), nullptr);
}

TEST(RasterizerVariants, EveryInstantiationMatchesTheReference) {
    Rng texRng(77);
    Texture t0(texRng), t1(texRng), t2(texRng);
    const Texture* tex[3] = {&t0, &t1, &t2};
    std::vector<unsigned char> map(65536);
    for (unsigned char& b : map) b = (unsigned char)texRng.u32();

    const int kTriangles = 48;
    long long drawn = 0, touched = 0;
    for (int vi = 0; vi < VariantCount(); ++vi) {
        const RasterVariant_s& v = Variant(vi);
        const rastref::Modes modes = rastref::ModesOf(v);
        for (int ci = 0; ci < int(sizeof(kConfigs) / sizeof(kConfigs[0])); ++ci) {
            const Config& c = kConfigs[ci];
            const uint64_t seed = uint64_t(vi) * 16 + uint64_t(ci);
            Rng r(seed);
            Target ours(c.width, c.height, c.pitch), ref(c.width, c.height, c.pitch),
                initial(c.width, c.height, c.pitch);
            ours.randomise(r);
            ref.copyFrom(ours);
            initial.copyFrom(ours);
            SetViewportRect(c.vx, c.vy, c.vw, c.vh);
            SetFog(r);
            bool failed = false;
            for (int ti = 0; ti < kTriangles && !failed; ++ti) {
                Triangle_s t;
                RandomTriangle(r, c.width, c.height, t, tex, map.data());
                ours.bind();
                v.m_Render(t);
                ref.bind();
                rastref::RenderTriangle(modes, t);
                ++drawn;
                bool inDepth = false;
                long long at = ours.diff(ref, inDepth);
                if (at >= 0) {
                    failed = true;
                    long long px = at;
                    ADD_FAILURE() << "variant " << vi << " " << Describe(v) << ", config " << ci << " (" << c.what
                                  << "), seed " << seed << ", triangle " << ti << ": " << (inDepth ? "depth" : "colour")
                                  << " element " << px << " (x " << (px % c.pitch) << ", y " << (px / c.pitch)
                                  << ") differs";
                }
                EXPECT_TRUE(ours.guardsIntact()) << "variant " << vi << " config " << ci << " triangle " << ti;
            }
            // count configurations in which anything changed, so a no-op would be noticed
            bool unused;
            if (ours.diff(initial, unused) != -1) ++touched;
        }
    }
    EXPECT_EQ(drawn, (long long)VariantCount() * 4 * kTriangles);
    // every configuration of every variant writes something (depth-only
    // variants without depth write excepted: they never write)
    EXPECT_GE(touched, (long long)(VariantCount() - 1) * 4);
}

}  // namespace
