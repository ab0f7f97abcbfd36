// Sprite images: allocation, wrapping, conversions and clipped copies.
#include <gtest/gtest.h>

#include <cstdint>
#include <random>
#include <vector>

#include "sprite/Sprite.h"
#include "throws_native.h"

namespace {

const uint32_t kSentinel = 0xDEADBEEFu;

// A sprite wrapping the inner part of a larger buffer, so that writes outside
// the sprite land on sentinels that can be checked.
struct FramedSprite {
    static const int kBorder = 3;
    std::vector<uint32_t> buffer;
    Sprite_c sprite;
    int w, h, pitch;
    FramedSprite(int w, int h, uint32_t fill = 0x11111111u) : w(w), h(h), pitch(w + 2 * kBorder + 1) {
        buffer.assign(size_t(pitch) * (h + 2 * kBorder), kSentinel);
        sprite.WrapForeign(buffer.data() + kBorder * pitch + kBorder, w, h, pitch);
        for (int y = 0; y < h; ++y)
            for (int x = 0; x < w; ++x) at(x, y) = fill;
    }
    uint32_t& at(int x, int y) { return sprite.Pixels[y * pitch + x]; }
    // Number of words outside the sprite that are no longer the sentinel.
    int frame_damage() const {
        int n = 0;
        for (int y = 0; y < h + 2 * kBorder; ++y)
            for (int x = 0; x < pitch; ++x) {
                bool inside = y >= kBorder && y < kBorder + h && x >= kBorder && x < kBorder + w;
                if (!inside && buffer[size_t(y) * pitch + x] != kSentinel) ++n;
            }
        return n;
    }
};

TEST(Sprite, AllocateSizesAndFailures) {
    Sprite_c s;
    s.Allocate(7, 5);
    ASSERT_NE(s.Pixels, nullptr);
    EXPECT_EQ(reinterpret_cast<uintptr_t>(s.Pixels) & 15, 0u);
    s.OffsetLeft = 0x7FFFFFFF, s.OffsetRight = 0x7FFFFFFF;
    EXPECT_EQ(s.FullWidth(), 2LL * 0x7FFFFFFF + 7);  // no 32-bit overflow
    // 65536 x 16384 x 4 bytes does not fit in 32 bits: rejected, sprite empty.
    EXPECT_TRUE(throws_native<IllegalArgumentException>([&] { s.Allocate(65536, 16384); }));
    EXPECT_EQ(s.Pixels, nullptr);
    EXPECT_EQ(s.Width, 0u);
    EXPECT_TRUE(throws_native<IllegalArgumentException>([&] { s.Allocate(0x80000000u, 0); }));
    s.Allocate(0, 1000000);  // 0 x huge fits; copying into it reads nothing
    uint32_t src = 0x12345678;
    s.Copy(&src, 1, true);
}

TEST(Sprite, WrapsForeignPixelsWithoutOwningThem) {
    std::vector<uint32_t> foreign(6 * 4, 0x01020304u);
    {
        Sprite_c s;
        s.WrapForeign(foreign.data() + 1, 4, 4, 6);
        EXPECT_FALSE(s.OwnsPixels);
        std::vector<uint32_t> src(16, 0x00ABCDEFu);
        s.Copy(src.data(), 4, false);
        // Allocating after wrapping must not free the foreign block.
        s.Allocate(2, 2);
        EXPECT_TRUE(s.OwnsPixels);
        s.WrapForeign(foreign.data(), 6, 4, 6);
    }  // destructor must not free the foreign block either (ASan would report it)
    for (int y = 0; y < 4; ++y)
        for (int x = 0; x < 6; ++x) {
            uint32_t expect = (x >= 1 && x <= 4) ? 0x00ABCDEFu : 0x01020304u;
            EXPECT_EQ(foreign[y * 6 + x], expect) << x << "," << y;
        }
}

TEST(Sprite, AlphaChannels) {
    Sprite_c s;
    s.Allocate(3, 1);
    const uint32_t colours[3] = {0x12345678u, 0xFF9ABCDEu, 0x00000000u};
    const uint32_t src[3] = {0x00AB0000u, 0x11223344u, 0x00000000u};
    const uint32_t expect[4][3] = {
        {0xAB345678u, 0x229ABCDEu, 0x00000000u},  // red
        {0x00345678u, 0x339ABCDEu, 0x00000000u},  // green
        {0x00345678u, 0x449ABCDEu, 0x00000000u},  // blue
        {0xFF345678u, 0xFF9ABCDEu, 0x00000000u},  // non-zero
    };
    for (uint32_t channel = 0; channel < 4; ++channel) {
        for (int i = 0; i < 3; ++i) s.Pixels[i] = colours[i];
        s.CopyAlpha(src, 3, channel);
        for (int i = 0; i < 3; ++i) EXPECT_EQ(s.Pixels[i], expect[channel][i]) << channel << " " << i;
    }
    EXPECT_TRUE(throws_native<IllegalArgumentException>([&] { s.CopyAlpha(src, 3, 4); }));
    EXPECT_EQ(s.Pixels[0], expect[3][0]);
}

TEST(Sprite, CopyRectIsClippedToTheSprite) {
    // 12 x 9 source with distinct words; rectangles at every kind of overhang
    std::vector<uint32_t> src(12 * 9);
    for (size_t i = 0; i < src.size(); ++i) src[i] = 0x01000000u * uint32_t(i % 3) + uint32_t(i * 7 + 1);
    struct Case {
        int x, y, w, h;
    } cases[] = {{1, 1, 3, 3}, {-2, -1, 6, 4}, {4, 3, 5, 5}, {-10, 0, 3, 3}, {0, 6, 4, 2}, {-1, -1, 12, 9}, {2, 2, 0, 3}};
    int caseNo = 0;
    for (const Case& c : cases) {
        for (int key = 0; key < 2; ++key) {
            FramedSprite f(6, 5);
            f.sprite.CopyRect(c.x, c.y, uint32_t(c.w), uint32_t(c.h), src.data(), 12, key != 0);
            EXPECT_EQ(f.frame_damage(), 0) << "case " << caseNo;
            for (int y = 0; y < 5; ++y)
                for (int x = 0; x < 6; ++x) {
                    int i = x - c.x, j = y - c.y;
                    uint32_t expect = 0x11111111u;
                    if (i >= 0 && j >= 0 && i < c.w && j < c.h) {
                        uint32_t s = src[size_t(j) * 12 + i];
                        expect = key ? (s ? s | 0xFF000000u : 0u) : s;
                    }
                    EXPECT_EQ(f.at(x, y), expect) << "case " << caseNo << " at " << x << "," << y;
                }
        }
        ++caseNo;
    }
}

// SSE2 row routines against their scalar references: random words (with
// many zeros), every length 0..40 and every destination misalignment; words
// past the end must keep the sentinel.
TEST(SpriteRows, MatchScalarReference) {
    for (int seed = 0; seed < 200; ++seed) {
        std::mt19937 rng(seed);
        int n = seed % 41;
        int shift = (seed / 41) % 4;
        std::vector<uint32_t> src(n + 8), a(n + 8 + 4, kSentinel), b(n + 8 + 4, kSentinel), dst0(n + 8);
        for (auto& v : src) v = (rng() % 4 == 0) ? 0u : uint32_t(rng());
        for (auto& v : dst0) v = uint32_t(rng());
        uint32_t* pa = a.data() + shift;
        uint32_t* pb = b.data() + shift;
        spriterows::copy_key(pa, src.data() + 1, n);
        spriterows::copy_key_scalar(pb, src.data() + 1, n);
        ASSERT_EQ(a, b) << "copy_key seed " << seed;
        for (size_t i = shift + n; i < a.size(); ++i) ASSERT_EQ(a[i], kSentinel) << "seed " << seed;
        for (uint32_t channel = 0; channel < 4; ++channel) {
            std::copy(dst0.begin(), dst0.begin() + n, pa);
            std::copy(dst0.begin(), dst0.begin() + n, pb);
            spriterows::copy_alpha(pa, src.data() + 2, n, channel);
            spriterows::copy_alpha_scalar(pb, src.data() + 2, n, channel);
            ASSERT_EQ(a, b) << "copy_alpha channel " << channel << " seed " << seed;
            for (size_t i = shift + n; i < a.size(); ++i) ASSERT_EQ(a[i], kSentinel) << "seed " << seed;
        }
    }
}

}  // namespace
