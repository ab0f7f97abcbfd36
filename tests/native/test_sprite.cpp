// Sprite images: allocation, wrapping, conversions and clipped copies.
#include <gtest/gtest.h>

#include <cstdint>
#include <random>
#include <vector>

#include "jni/Exception.h"
#include "sprite/Sprite.h"

namespace {

template <class E, class F>
bool throws_native(F&& f) {
    try {
        f();
    } catch (Exception* e) {
        bool ok = dynamic_cast<E*>(e) != nullptr;
        delete e;
        return ok;
    }
    return false;
}

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
    EXPECT_EQ(s.Width, 7u);
    EXPECT_EQ(s.Height, 5u);
    EXPECT_EQ(s.Pitch, 7u);
    ASSERT_NE(s.Pixels, nullptr);
    EXPECT_EQ(reinterpret_cast<uintptr_t>(s.Pixels) & 15, 0u);
    EXPECT_TRUE(s.OwnsPixels);

    // 65536 x 16384 x 4 bytes does not fit in 32 bits: rejected, sprite empty.
    EXPECT_TRUE(throws_native<IllegalArgumentException>([&] { s.Allocate(65536, 16384); }));
    EXPECT_EQ(s.Pixels, nullptr);
    EXPECT_EQ(s.Width, 0u);
    EXPECT_EQ(s.Height, 0u);
    EXPECT_TRUE(throws_native<IllegalArgumentException>([&] { s.Allocate(0x80000000u, 0); }));
    // The largest size that still fits is accepted by the check (0 x huge).
    s.Allocate(0, 1000000);
    EXPECT_EQ(s.Height, 1000000u);
    // A sprite of width 0 copies nothing.
    uint32_t src = 0x12345678;
    s.Copy(&src, 1, true);
}

TEST(Sprite, TrimmedFullSize) {
    Sprite_c s;
    s.Allocate(10, 4);
    s.OffsetLeft = 2, s.OffsetTop = 1, s.OffsetRight = 3, s.OffsetBottom = 5;
    EXPECT_EQ(s.FullWidth(), 15);
    EXPECT_EQ(s.FullHeight(), 10);
    s.OffsetLeft = 0x7FFFFFFF, s.OffsetRight = 0x7FFFFFFF;
    EXPECT_EQ(s.FullWidth(), 2LL * 0x7FFFFFFF + 10);
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

TEST(Sprite, CopyConversions) {
    Sprite_c s;
    s.Allocate(4, 2);
    // source rows 5 apart; the fifth word of each row must not be read into the sprite
    const uint32_t src[10] = {0x00000000u, 0x00123456u, 0x80FFFFFFu, 0x01000000u, 0xAAAAAAAAu,
                              0xFF000001u, 0x7F00FF00u, 0x00000001u, 0x00000000u, 0xBBBBBBBBu};
    s.Copy(src, 5, false);
    for (int y = 0; y < 2; ++y)
        for (int x = 0; x < 4; ++x) EXPECT_EQ(s.Pixels[y * 4 + x], src[y * 5 + x]);
    s.Copy(src, 5, true);
    const uint32_t keyed[8] = {0x00000000u, 0xFF123456u, 0xFFFFFFFFu, 0xFF000000u,
                               0xFF000001u, 0xFF00FF00u, 0xFF000001u, 0x00000000u};
    for (int i = 0; i < 8; ++i) EXPECT_EQ(s.Pixels[i], keyed[i]) << i;
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

TEST(Sprite, Palettised) {
    Sprite_c s;
    s.Allocate(3, 2);
    const uint32_t palette[4] = {0x00C0FFEEu, 0x00112233u, 0x80445566u, 0xFF778899u};
    const uint8_t indices[8] = {0, 1, 2, 9, 3, 0, 1, 9};  // rows 4 apart
    s.CopyFrom8Bit(indices, palette, nullptr, 4);
    const uint32_t noAlpha[6] = {0u, 0xFF112233u, 0xFF445566u, 0xFF778899u, 0u, 0xFF112233u};
    for (int i = 0; i < 6; ++i) EXPECT_EQ(s.Pixels[i], noAlpha[i]) << i;

    const uint8_t alpha[8] = {0x10, 0x20, 0x30, 0, 0x40, 0x00, 0xFF, 0};
    s.CopyFrom8Bit(indices, palette, alpha, 4);
    const uint32_t withAlpha[6] = {0x10C0FFEEu, 0x20112233u, 0x30445566u, 0x40778899u, 0x00C0FFEEu, 0xFF112233u};
    for (int i = 0; i < 6; ++i) EXPECT_EQ(s.Pixels[i], withAlpha[i]) << i;
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

TEST(Sprite, CopyRectAlphaIsClippedToTheSprite) {
    std::vector<uint32_t> src(8 * 8);
    for (size_t i = 0; i < src.size(); ++i) src[i] = uint32_t(i) << 16;
    FramedSprite f(5, 4, 0x00ABCDEFu);
    f.sprite.CopyRectAlpha(-2, 2, 4, 5, src.data(), 8, 0);
    EXPECT_EQ(f.frame_damage(), 0);
    for (int y = 0; y < 4; ++y)
        for (int x = 0; x < 5; ++x) {
            int i = x + 2, j = y - 2;
            uint32_t a = (x < 2 && y >= 2) ? uint32_t(j * 8 + i) : 0;
            EXPECT_EQ(f.at(x, y), (a << 24) | 0x00ABCDEFu) << x << "," << y;
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
