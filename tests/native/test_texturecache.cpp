// Texture cache: store layout, LRU eviction and requests, scroll offsets,
// metrics, and the blur against an independent computation.
#include <gtest/gtest.h>

#include <xmmintrin.h>

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <functional>
#include <memory>
#include <mutex>
#include <random>
#include <thread>
#include <vector>

#include "jni/Exception.h"
#include "render/callbacks.h"
#include "render/toolkit.h"
#include "texture/texturecache.h"

namespace {

// Requests are answered by `answer` (by default: upload a texture whose
// texels all hold the id, and say yes).
class texture_callbacks : public toolkit_callbacks {
public:
    bool request_texture(unsigned short id) override {
        {
            std::lock_guard<std::mutex> lock(m);
            requests.push_back(id);
        }
        return answer ? answer(id) : false;
    }
    void garbagecollect() override {}
    void* createshadow() override { return nullptr; }
    std::vector<int> requests;
    std::function<bool(unsigned short)> answer;
    std::mutex m;
};

texturemetrics metrics(int scrollu = 0, int scrollv = 0, bool wrapu = false, bool wrapv = false,
                       int transparency = 0) {
    texturemetrics m;
    m.set(0, transparency, 0, 0, 0, 0, 0, 0, scrollu, scrollv, 0, 0, 0, wrapu, wrapv, 0, 0, 0, 0);
    return m;
}

// A toolkit with a texture cache of `ids` ids whose requests upload a flat
// texture of colour 0xFF000000 | id.
class TextureCache : public ::testing::Test {
protected:
    void SetUp() override {
        mxcsr = _mm_getcsr();
        cb = new texture_callbacks();
        tk = toolkit::create(cb, true, 1000);
        cache = tk->m_Textures;
        cb->answer = [this](unsigned short id) {
            std::vector<int> px(128 * 128, int(0xFF000000u | id));
            texturemetrics m = metrics();
            m.averagehsl = id;  // identifies the upload
            cache->upload_texture(id, px.data(), m);
            return true;
        };
    }
    void TearDown() override {
        toolkit::destroy(tk);
        _mm_setcsr(mxcsr);
    }
    unsigned int mxcsr = 0;
    texture_callbacks* cb = nullptr;
    toolkit* tk = nullptr;
    texturecache* cache = nullptr;
};

TEST_F(TextureCache, StoreLayoutAndLeastRecentlyUsedEviction) {
    const unsigned char* base = reinterpret_cast<const unsigned char*>(cache->slot(0)->texels);
    EXPECT_EQ(reinterpret_cast<uintptr_t>(base) % 64, 0u);
    for (int s = 0; s < texturecache::kSlots; ++s)  // two 128-texel slots side by side per 256-texel row band
        EXPECT_EQ(reinterpret_cast<const unsigned char*>(cache->slot(s)->texels) - base,
                  (s / 2) * 131072 + (s % 2) * 512) << s;
    std::vector<int> px(128 * 128);
    for (int i = 0; i < 128 * 128; ++i) px[i] = int(0xFF000000u | unsigned(i));
    texturecache::copy_texture(reinterpret_cast<const unsigned int*>(px.data()), cache->slot(3)->texels);
    EXPECT_EQ(cache->slot(3)->texels[5 + 256 * 7], unsigned(px[5 + 128 * 7]));

    for (int id = 0; id < 200; ++id) ASSERT_EQ(cache->gettex((unsigned short)id)->metrics.averagehsl, id);
    EXPECT_EQ(cb->requests.size(), 200u);
    EXPECT_TRUE(cache->gettex(0));  // resident: not requested, and 1 becomes the oldest
    EXPECT_EQ(cb->requests.size(), 200u);
    int slotOf1 = cache->slot_of(1);
    EXPECT_EQ(cache->gettex(200)->metrics.averagehsl, 200);
    EXPECT_EQ(cache->slot_of(1), -1);
    EXPECT_EQ(cache->slot_of(200), slotOf1);
    int slotOf2 = cache->slot_of(2);
    ASSERT_TRUE(cache->gettex(1));  // requested again, takes the slot of 2
    EXPECT_EQ(cb->requests.back(), 1);
    EXPECT_EQ(cache->slot_of(1), slotOf2);
    // Uploading a resident id replaces it in place; uploads outside requests do not evict each other.
    int slotOf0 = cache->slot_of(0);
    cache->upload_texture(0, px.data(), metrics());
    EXPECT_EQ(cache->slot_of(0), slotOf0);
    cache->upload_texture(500, px.data(), metrics());
    cache->upload_texture(501, px.data(), metrics());
    EXPECT_EQ(cache->slot_of(500), 3);
    EXPECT_EQ(cache->slot_of(501), 4);
}

TEST_F(TextureCache, ConcurrentFetchesKeepTheChainConsistent) {
    std::vector<std::thread> threads;
    for (int t = 0; t < 4; ++t)
        threads.emplace_back([this, t] {
            // A fetched texture may be evicted again by the others before the
            // request returns, so a null is allowed; the chain must stay sound.
            std::mt19937 rng(77 + t);
            for (int i = 0; i < 300; ++i) cache->gettex((unsigned short)(rng() % 260));
        });
    for (auto& th : threads) th.join();
    std::vector<int> seen(texturecache::kSlots, 0);  // head to tail through every slot once
    int s = cache->lru_head(), last = -1, n = 0;
    for (; s != -1 && n <= texturecache::kSlots; s = cache->lru_next(s), ++n) {
        ASSERT_EQ(seen[s]++, 0);
        last = s;
    }
    EXPECT_EQ(n, texturecache::kSlots);
    EXPECT_EQ(last, cache->lru_tail());
    std::vector<int> owner(texturecache::kSlots, -1);  // resident ids own distinct slots naming them
    for (int id = 0; id < 260; ++id) {
        int slot = cache->slot_of((unsigned short)id);
        if (slot < 0) continue;
        EXPECT_EQ(owner[slot], -1);
        owner[slot] = id;
        EXPECT_EQ(cache->slot(slot)->metrics.averagehsl, id);
    }
    EXPECT_EQ(std::count(owner.begin(), owner.end(), -1), 0);
}

TEST_F(TextureCache, RefusedRequestsBadIdsAndMetrics) {
    EXPECT_EQ(cache->gettex(65535), nullptr);
    EXPECT_EQ(cache->gettex(1000), nullptr);  // beyond the id count: never requested
    EXPECT_EQ(cache->getmetrics(1000), nullptr);
    EXPECT_TRUE(cb->requests.empty());
    cb->answer = [](unsigned short) { return false; };
    EXPECT_EQ(cache->gettex(5), nullptr);
    cb->answer = [](unsigned short) { return true; };  // claims success without an upload
    EXPECT_EQ(cache->gettex(6), nullptr);
    EXPECT_EQ(cb->requests, (std::vector<int>{5, 6}));

    texturemetrics m;
    const int v[19] = {0x12345, 1, 0x104, 7, -1, 2, 300, 17, 200, -3, 1, 0, 5, 1, 0, 0x1FF, 1, 0, 0x7FFFFFFF};
    m.set(v);
    EXPECT_EQ(m.averagehsl, 0x2345);
    EXPECT_EQ(m.materialkind, 4);
    EXPECT_EQ(m.greyblend, 44);
    EXPECT_EQ(m.scrollu, -56);
    EXPECT_TRUE(m.field13);
    EXPECT_EQ(m.field16, 0xFF);
    tk->upload_texturemetrics(999, m);
    EXPECT_EQ(tk->getmetrics(999)->averagehsl, 0x2345);
    std::unique_ptr<Exception> e;
    try {
        tk->upload_texturemetrics(1000, m);
    } catch (Exception* x) {
        e.reset(x);
    }
    EXPECT_TRUE(dynamic_cast<ArrayIndexOutOfBoundsException*>(e.get()));

}

TEST(TextureCacheToolkit, WithoutACacheUploadsAreRefused) {
    unsigned int mxcsr = _mm_getcsr();
    toolkit* tk = toolkit::create(nullptr, false, 0);
    EXPECT_EQ(tk->gettex(1), nullptr);
    std::vector<int> px(128 * 128);
    std::unique_ptr<Exception> e;
    try {
        tk->upload_texture(1, px.data(), metrics());
    } catch (Exception* x) {
        e.reset(x);
    }
    EXPECT_TRUE(dynamic_cast<IllegalStateException*>(e.get()));
    toolkit::destroy(tk);
    _mm_setcsr(mxcsr);
}

float lane0(__m128 v) { return _mm_cvtss_f32(v); }

TEST_F(TextureCache, ScrollOffsets) {
    std::vector<int> px(128 * 128, 0x10203040);
    cb->answer = [&](unsigned short id) {
        cache->upload_texture(id, px.data(), id == 10 ? metrics(64, -32) : id == 12 ? metrics(-64, 3) : metrics());
        return true;
    };
    textureslot* a = cache->gettex(10);
    textureslot* still = cache->gettex(11);
    textureslot* c = cache->gettex(12);
    ASSERT_TRUE(a && still && c);
    cache->gettex(10);
    EXPECT_EQ(cache->queued_count(), 2);  // queued once; speeds 0 never
    EXPECT_EQ(still->queued, 0);
    // Speed 64 moves 128 texels per second; negative offsets keep their sign.
    cache->service(3000);
    EXPECT_EQ(lane0(a->scrolloffsetu), 0.0f);
    EXPECT_EQ(lane0(a->scrolloffsetv), -64.0f);
    EXPECT_EQ(cache->queued_count(), 0);
    cache->gettex(12);  // only slots fetched since the last update move
    cache->service(1250);
    EXPECT_EQ(lane0(a->scrolloffsetu), 0.0f);
    EXPECT_EQ(lane0(c->scrolloffsetu), -32.0f);
    EXPECT_EQ(lane0(c->scrolloffsetv), 7.5f);
    // Time wraps every 128 s and keeps its sign.
    cache->gettex(10);
    cache->service(128000 + 250);
    EXPECT_EQ(lane0(a->scrolloffsetu), 32.0f);
    cache->gettex(10);
    cache->service(-250);
    EXPECT_EQ(lane0(a->scrolloffsetu), -32.0f);
    EXPECT_EQ(lane0(a->scrolloffsetv), 16.0f);
    cache->upload_texture(10, px.data(), metrics(64, -32));  // a new upload clears the offsets
    EXPECT_EQ(lane0(a->scrolloffsetu), 0.0f);
}

// --- the blur ------------------------------------------------------------------

// Written from the description: per output texel, the weighted sum of the five
// neighbours per channel in single precision (taken in order -2..2) divided by
// the sum of the weights used, truncated; rows first, then columns.
std::vector<unsigned int> independent_blur(const std::vector<unsigned int>& src, bool wrapu, bool wrapv,
                                           bool keepTransparent) {
    const float w[5] = {0.053990968f, 0.24197072f, 0.3989423f, 0.24197072f, 0.053990968f};
    auto pass = [&](const std::vector<unsigned int>& in, bool horizontal, bool wrap) {
        std::vector<unsigned int> out(128 * 128);
        for (int y = 0; y < 128; ++y)
            for (int x = 0; x < 128; ++x) {
                auto at = [&](int i) { return horizontal ? in[y * 128 + i] : in[i * 128 + x]; };
                int pos = horizontal ? x : y;
                unsigned int centre = at(pos);
                if (keepTransparent && centre == 0) {
                    out[y * 128 + x] = 0;
                    continue;
                }
                float a = 0, r = 0, g = 0, b = 0, ws = 0;
                for (int d = -2; d <= 2; ++d) {
                    int n = pos + d;
                    if (n < 0 || n > 127) {
                        if (!wrap) continue;
                        n = (n + 128) % 128;
                    }
                    unsigned int p = at(n);
                    if (keepTransparent && p == 0) continue;
                    float wt = w[d + 2];
                    a += wt * float(p >> 24);
                    r += wt * float((p >> 16) & 255);
                    g += wt * float((p >> 8) & 255);
                    b += wt * float(p & 255);
                    ws += wt;
                }
                out[y * 128 + x] = (unsigned(int(a / ws)) << 24) | (unsigned(int(r / ws)) << 16) |
                                   (unsigned(int(g / ws)) << 8) | unsigned(int(b / ws));
            }
        return out;
    };
    return pass(pass(src, true, wrapu), false, wrapv);
}

std::vector<unsigned int> random_texture(unsigned int seed, int transparentPercent) {
    std::mt19937 rng(seed);
    std::vector<unsigned int> t(128 * 128);
    for (auto& p : t) {
        p = rng();
        if (int(rng() % 100) < transparentPercent) p = 0;
    }
    return t;
}

// Blurs into a band of the store filled with a sentinel and returns the slot's
// texels; fails if anything outside the 128 x 128 window was written.
std::vector<unsigned int> blur_into_band(const std::vector<unsigned int>& src, bool wrapu, bool wrapv, bool blurAll,
                                         bool scalar, bool oddSlot) {
    const unsigned int sentinel = 0xA5C3E1F7u;
    std::vector<unsigned int> band(128 * 256 + 64, sentinel);
    unsigned int* slot = band.data() + (oddSlot ? 128 : 0);
    if (scalar)
        texturecache::copy_and_blur_texture_scalar(src.data(), slot, wrapu, wrapv, blurAll);
    else
        texturecache::copy_and_blur_texture(src.data(), slot, wrapu, wrapv, blurAll);
    std::vector<unsigned int> out(128 * 128);
    for (size_t i = 0; i < band.size(); ++i) {
        long long rel = (long long)i - (oddSlot ? 128 : 0);
        bool inside = rel >= 0 && rel < 128 * 256 && rel % 256 < 128;
        if (inside)
            out[size_t(rel / 256 * 128 + rel % 256)] = band[i];
        else
            EXPECT_EQ(band[i], sentinel) << "written outside the slot at " << i;
    }
    return out;
}

TEST(TextureBlur, MatchesIndependentComputationAndScalarReference) {
    for (unsigned int c = 0; c < 16; ++c) {
        SCOPED_TRACE("case " + std::to_string(c));
        bool wrapu = c & 1, wrapv = (c >> 1) & 1, blurAll = (c >> 2) & 1;
        std::vector<unsigned int> src = random_texture(1000 + c, (c & 8) ? 40 : 5);
        std::vector<unsigned int> want = independent_blur(src, wrapu, wrapv, !blurAll);
        std::vector<unsigned int> sse = blur_into_band(src, wrapu, wrapv, blurAll, false, c & 1);
        std::vector<unsigned int> ref = blur_into_band(src, wrapu, wrapv, blurAll, true, !(c & 1));
        int diffs = 0;
        for (int i = 0; i < 128 * 128; ++i) {
            if (sse[i] != ref[i] && ++diffs < 4) ADD_FAILURE() << "sse vs scalar at " << i;
            if (sse[i] != want[i] && ++diffs < 4)
                ADD_FAILURE() << "at " << i << " got " << std::hex << sse[i] << " want " << want[i];
        }
        EXPECT_EQ(diffs, 0);
    }
}

TEST(TextureBlur, UploadTransparencyModeChoosesWhetherHolesAreKept) {
    std::vector<int> px(128 * 128, int(0xFF808080u));
    px[64 * 128 + 64] = 0;
    unsigned int mxcsr = _mm_getcsr();
    toolkit* tk = toolkit::create(nullptr, true, 10);
    tk->upload_texture(4, px.data(), metrics(0, 0, true, true, 1));
    textureslot* t = tk->m_Textures->slot(tk->m_Textures->slot_of(4));
    EXPECT_EQ(t->texels[64 * 256 + 64], 0u);
    EXPECT_EQ(t->texels[64 * 256 + 65], 0xFF808080u);  // neighbours not darkened
    tk->upload_texture(4, px.data(), metrics(0, 0, true, true, 2));
    EXPECT_NE(t->texels[64 * 256 + 64], 0u);
    toolkit::destroy(tk);
    _mm_setcsr(mxcsr);
}

}  // namespace
