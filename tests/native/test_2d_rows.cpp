// Pixel modes and row routines of the 2D layer: the per-pixel formulas
// against channel-wise definitions, and every SIMD row routine against its
// scalar reference, bit for bit, over random alignments, lengths and colours.
#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <random>
#include <vector>

#include "render/rows2d.h"

using namespace rows2d;

namespace {

uint32_t chan(uint32_t c, int i) { return (c >> (8 * i)) & 0xFF; }

// Channel by channel, written from the definitions of the modes.
uint32_t blend_def(uint32_t d, uint32_t s) {
    uint32_t a = s >> 24;
    if (a == 255) return s;
    uint32_t out = a << 24;
    for (int i = 0; i < 3; ++i) out |= (chan(s, i) * a / 256 + chan(d, i) * (256 - a) / 256) << (8 * i);
    return out;
}

uint32_t add_def(uint32_t d, uint32_t s) {
    uint32_t out = ((chan(s, 3) + chan(d, 3)) & 0xFF) << 24;
    for (int i = 0; i < 3; ++i) {
        uint32_t v = chan(s, i) + chan(d, i);
        out |= (v > 255 ? 255 : v) << (8 * i);
    }
    return out;
}

uint32_t random_colour(std::mt19937& rng) {
    // favour the alpha bytes that take special paths
    static const uint32_t alphas[] = {0, 1, 127, 128, 254, 255};
    uint32_t c = rng();
    if (rng() % 2) c = (c & 0xFFFFFF) | (alphas[rng() % 6] << 24);
    return c;
}

}  // namespace

TEST(PixelModes, FormulaExamples) {
    EXPECT_EQ(blend_pixel(0xFF0000FFu, 0x80FF0000u), 0x807F007Fu);
    EXPECT_EQ(blend_pixel(0x00ABCDEFu, 0xFF123456u), 0xFF123456u);
    EXPECT_EQ(add_pixel(0x00909090u, 0x00808080u), 0x00FFFFFFu);
    // colour channels saturate, alpha wraps
    EXPECT_EQ(add_pixel(0x80FF0110u, 0x90010203u), 0x10FF0313u);
    // blend with alpha 0 scales nothing of the source in and keeps the destination channels
    EXPECT_EQ(blend_pixel(0xFF102030u, 0x00FFFFFFu), 0x00102030u);
}

TEST(PixelModes, ScalarFormulasMatchChannelDefinitions) {
    // every pair of channel values in each position, then random words
    for (uint32_t x = 0; x < 256; ++x)
        for (uint32_t y = 0; y < 256; ++y) {
            uint32_t d = x * 0x01010101u, s = (y << 24) | (y * 0x010101u ^ 0x5A3C96u);
            ASSERT_EQ(add_pixel(d, s), add_def(d, s)) << std::hex << d << " " << s;
            ASSERT_EQ(blend_pixel(d, s), blend_def(d, s)) << std::hex << d << " " << s;
            ASSERT_EQ(add_pixel(s, d), add_def(s, d)) << std::hex << s << " " << d;
        }
    std::mt19937 rng(7);
    for (int i = 0; i < 200000; ++i) {
        uint32_t d = rng(), s = random_colour(rng);
        ASSERT_EQ(add_pixel(d, s), add_def(d, s)) << i;
        ASSERT_EQ(blend_pixel(d, s), blend_def(d, s)) << i;
    }
}

TEST(PixelModes, FourPixelOpsMatchPerPixelOps) {
    for (int seed = 0; seed < 2000; ++seed) {
        std::mt19937 rng(seed);
        uint32_t s = random_colour(rng);
        alignas(16) uint32_t d[4], out[4];
        for (auto& v : d) v = rng();
        auto check = [&](const auto& m, const char* name) {
            _mm_store_si128(reinterpret_cast<__m128i*>(out), m.op4(_mm_load_si128(reinterpret_cast<__m128i*>(d))));
            for (int i = 0; i < 4; ++i) ASSERT_EQ(out[i], m(d[i])) << name << " seed " << seed << " lane " << i;
        };
        check(replace_mode(s), "replace");
        check(add_mode(s), "add");
        if ((s >> 24) != 255) check(blend_mode(s), "blend");
    }
}

TEST(PixelModes, DispatchValidatesAndPicksReplaceForOpaqueBlend) {
    EXPECT_NO_THROW(check_mode(0));
    EXPECT_NO_THROW(check_mode(2));
    for (unsigned int bad : {3u, 4u, 0x80000000u, 0xFFFFFFFFu}) {
        try {
            check_mode(bad);
            ADD_FAILURE() << "mode " << bad << " accepted";
        } catch (IllegalArgumentException* e) {
            EXPECT_STREQ(e->what() ? e->what() : "", "");
            delete e;
        }
    }
    int picked = -1;
    auto probe = [&](const auto& m) {
        using M = std::decay_t<decltype(m)>;
        picked = std::is_same_v<M, replace_mode> ? 0 : std::is_same_v<M, blend_mode> ? 1 : 2;
    };
    with_mode(1, 0xFF123456u, probe);
    EXPECT_EQ(picked, 0);
    with_mode(1, 0xFE123456u, probe);
    EXPECT_EQ(picked, 1);
    with_mode(2, 0xFF123456u, probe);
    EXPECT_EQ(picked, 2);
    with_mode(0, 0x00123456u, probe);
    EXPECT_EQ(picked, 0);
}

// Rows at every 4-byte offset of a 16-byte boundary, lengths 0..70, random
// colours and destinations; guard pixels on both sides must stay.
TEST(RowRoutines, SimdRowsMatchScalarReference) {
    const uint32_t guard = 0xDEADBEEFu;
    for (int seed = 0; seed < 3000; ++seed) {
        std::mt19937 rng(seed);
        const int offset = int(rng() % 4), n = int(rng() % 71), mode = int(rng() % 3);
        const uint32_t s = random_colour(rng);
        alignas(16) uint32_t a[96], b[96];
        alignas(16) float z[96];
        for (int i = 0; i < 96; ++i) {
            a[i] = b[i] = rng();
            z[i] = float(int(rng() % 5)) - 2.0f;
        }
        for (int i = 0; i < 4; ++i) a[offset + i] = b[offset + i] = guard;
        for (int i = 0; i < 4; ++i) a[offset + 4 + n + i] = b[offset + 4 + n + i] = guard;
        uint32_t* pa = a + offset + 4;
        uint32_t* pb = b + offset + 4;
        const bool depth = rng() % 2;
        const float dz = float(int(rng() % 3)) - 1.0f;
        with_mode(unsigned(mode), s, [&](const auto& m) {
            if (depth) {
                fill_row_depth(pa, z + offset + 4, n, dz, m);
                fill_row_depth_ref(pb, z + offset + 4, n, dz, m);
            } else {
                fill_row(pa, n, m);
                fill_row_ref(pb, n, m);
            }
        });
        for (int i = 0; i < 96; ++i)
            ASSERT_EQ(a[i], b[i]) << "seed " << seed << " index " << i << " mode " << mode << " depth " << depth;
        for (int i = 0; i < 4; ++i) {
            ASSERT_EQ(a[offset + i], guard) << "seed " << seed;
            ASSERT_EQ(a[offset + 4 + n + i], guard) << "seed " << seed;
        }
    }
}

TEST(RowRoutines, StreamFillWritesExactlyTheRange) {
    for (int seed = 0; seed < 300; ++seed) {
        std::mt19937 rng(seed);
        const int offset = int(rng() % 4), n = int(rng() % 300);
        const uint32_t v = rng();
        std::vector<uint32_t> buf(320 + 8, 0x12345678u);
        uint32_t* base = buf.data();
        while (reinterpret_cast<uintptr_t>(base) & 15) ++base;
        stream_fill(base + offset, size_t(n), v);
        for (int i = 0; i < 320; ++i) {
            uint32_t expect = (i >= offset && i < offset + n) ? v : 0x12345678u;
            ASSERT_EQ(base[i], expect) << "seed " << seed << " index " << i;
        }
    }
}
