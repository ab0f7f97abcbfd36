// Pixel modes and row routines of the 2D layer: the per-pixel formulas against
// channel-wise definitions, and every SIMD routine against its scalar
// reference, bit for bit, over random alignments, lengths and colours.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
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
    uint32_t out = ((chan(s, 3) + chan(d, 3)) & 0xFF) << 24;  // colour channels saturate, alpha wraps
    for (int i = 0; i < 3; ++i) out |= std::min(chan(s, i) + chan(d, i), 255u) << (8 * i);
    return out;
}

uint32_t random_colour(std::mt19937& rng) {  // favour the alpha bytes that take special paths
    static const uint32_t alphas[] = {0, 1, 127, 128, 254, 255};
    uint32_t c = rng();
    return (rng() % 2) ? (c & 0xFFFFFF) | (alphas[rng() % 6] << 24) : c;
}

}  // namespace

TEST(PixelModes, ScalarFormulasMatchChannelDefinitions) {
    EXPECT_EQ(blend_pixel(0xFF0000FFu, 0x80FF0000u), 0x807F007Fu);
    std::mt19937 rng(7);
    for (int i = 0; i < 200000; ++i) {
        const uint32_t d = rng(), s = random_colour(rng);
        ASSERT_EQ(add_pixel(d, s), add_def(d, s)) << i;
        ASSERT_EQ(blend_pixel(d, s), blend_def(d, s)) << i;
    }
}

TEST(PixelModes, DispatchValidatesAndPicksReplaceForOpaqueBlend) {
    try {
        check_mode(3);
        ADD_FAILURE() << "mode 3 accepted";
    } catch (IllegalArgumentException* e) {
        delete e;
    }
    const struct { unsigned mode; uint32_t colour; int want; } cases[] = {
        {1, 0xFF123456u, 0}, {1, 0xFE123456u, 1}, {2, 0xFF123456u, 2}, {0, 0x00123456u, 0}};
    for (auto& c : cases) {
        int picked = -1;
        with_mode(c.mode, c.colour, [&](const auto& m) {
            using M = std::decay_t<decltype(m)>;
            picked = std::is_same_v<M, replace_mode> ? 0 : std::is_same_v<M, blend_mode> ? 1 : 2;
        });
        EXPECT_EQ(picked, c.want) << c.mode << " " << std::hex << c.colour;
    }
}

// Rows at every 4-byte offset of a 16-byte boundary, lengths 0..70; the
// sentinel pixels around each row must stay.
TEST(RowRoutines, SimdRowsMatchScalarReference) {
    const uint32_t guard = 0xDEADBEEFu;
    for (int seed = 0; seed < 3000; ++seed) {
        std::mt19937 rng(seed);
        const int off = int(rng() % 4) + 4, n = int(rng() % 71), mode = int(rng() % 3);
        const uint32_t s = random_colour(rng);
        alignas(16) uint32_t a[96], b[96];
        alignas(16) float z[96];
        for (int i = 0; i < 96; ++i) {
            a[i] = b[i] = (i < off || i >= off + n) ? guard : rng();
            z[i] = float(int(rng() % 5)) - 2.0f;
        }
        const bool depth = rng() % 2;
        const float dz = float(int(rng() % 3)) - 1.0f;
        with_mode(unsigned(mode), s, [&](const auto& m) {
            if (depth) {
                fill_row_depth(a + off, z + off, n, dz, m);
                fill_row_depth_ref(b + off, z + off, n, dz, m);
            } else {
                fill_row(a + off, n, m);
                fill_row_ref(b + off, n, m);
            }
        });
        for (int i = 0; i < 96; ++i) {
            ASSERT_EQ(a[i], b[i]) << "seed " << seed << " index " << i;
            ASSERT_TRUE((i >= off && i < off + n) || a[i] == guard) << "sentinel, seed " << seed << " index " << i;
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
        for (int i = 0; i < 320; ++i)
            ASSERT_EQ(base[i], (i >= offset && i < offset + n) ? v : 0x12345678u) << "seed " << seed << " index " << i;
    }
}
