// Texture cache: store layout, LRU eviction and requests, scroll offsets,
// metrics, and the blur against an independent computation.
#include <gtest/gtest.h>

#include <xmmintrin.h>

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

TEST_F(TextureCache, StoreLayout) {
    ASSERT_TRUE(cache);
    const unsigned char* base = reinterpret_cast<const unsigned char*>(cache->slot(0)->texels);
    EXPECT_EQ(reinterpret_cast<uintptr_t>(base) % 64, 0u);
    for (int s = 0; s < texturecache::kSlots; ++s) {
        const unsigned char* p = reinterpret_cast<const unsigned char*>(cache->slot(s)->texels);
        EXPECT_EQ(p - base, (s / 2) * 131072 + (s % 2) * 512) << s;
        EXPECT_EQ(reinterpret_cast<uintptr_t>(cache->slot(s)) % 16, 0u);
    }
    // Texel (u, v) of slot 3 lands at u + 256 v; the neighbouring slot 2 is untouched.
    std::vector<int> px(128 * 128);
    for (int v = 0; v < 128; ++v)
        for (int u = 0; u < 128; ++u) px[v * 128 + u] = int(0xFF000000u | (v << 8) | u);
    for (int i = 0; i < 128 * 256; ++i) cache->slot(2)->texels[i] = 0xDEADBEEF;  // the whole band
    texturecache::copy_texture(reinterpret_cast<const unsigned int*>(px.data()), cache->slot(3)->texels);
    for (int v = 0; v < 128; ++v)
        for (int u = 0; u < 128; ++u) {
            ASSERT_EQ(cache->slot(3)->texels[u + 256 * v], unsigned(px[v * 128 + u]));
            ASSERT_EQ(cache->slot(2)->texels[u + 256 * v], 0xDEADBEEFu);
        }
}

TEST_F(TextureCache, EvictsLeastRecentlyUsedAndRequestsAgain) {
    EXPECT_EQ(cache->lru_head(), 0);
    EXPECT_EQ(cache->lru_tail(), 199);
    for (int id = 0; id < 200; ++id) {
        textureslot* t = cache->gettex((unsigned short)id);
        ASSERT_TRUE(t) << id;
        EXPECT_EQ(t->metrics.averagehsl, id);
    }
    EXPECT_EQ(cb->requests.size(), 200u);
    // Fetching 0 again makes 1 the least recently used.
    EXPECT_TRUE(cache->gettex(0));
    EXPECT_EQ(cb->requests.size(), 200u);
    int slotOf1 = cache->slot_of(1);
    textureslot* t200 = cache->gettex(200);
    ASSERT_TRUE(t200);
    EXPECT_EQ(cache->slot_of(1), -1);
    EXPECT_EQ(cache->slot_of(200), slotOf1);
    EXPECT_EQ(t200->metrics.averagehsl, 200);
    EXPECT_EQ(cache->lru_tail(), slotOf1);
    // Id 1 is requested again and takes the slot of 2, now the oldest.
    int slotOf2 = cache->slot_of(2);
    ASSERT_TRUE(cache->gettex(1));
    EXPECT_EQ(cb->requests.back(), 1);
    EXPECT_EQ(cache->slot_of(1), slotOf2);
    EXPECT_EQ(cache->slot_of(2), -1);
    EXPECT_EQ(cache->gettex(0)->metrics.averagehsl, 0);

    // Uploading a resident id again replaces it in place.
    int slotOf0 = cache->slot_of(0);
    std::vector<int> px(128 * 128, int(0xFF123456u));
    cache->upload_texture(0, px.data(), metrics());
    EXPECT_EQ(cache->slot_of(0), slotOf0);
    EXPECT_EQ(cache->slot_of(3), 3);  // the oldest slot was not taken
    // Uploads outside requests do not evict each other.
    cache->upload_texture(500, px.data(), metrics());
    cache->upload_texture(501, px.data(), metrics());
    EXPECT_EQ(cache->slot_of(500), 3);
    EXPECT_EQ(cache->slot_of(501), 4);
    EXPECT_EQ(cache->lru_tail(), 4);
    EXPECT_EQ(cache->lru_head(), 5);
}

TEST_F(TextureCache, ConcurrentFetchesKeepTheChainConsistent) {
    std::vector<std::thread> threads;
    for (int t = 0; t < 4; ++t)
        threads.emplace_back([this, t] {
            std::mt19937 rng(77 + t);
            for (int i = 0; i < 300; ++i) {
                unsigned short id = (unsigned short)(rng() % 260);
                // A texture uploaded for this thread may already have been
                // evicted again by the others when the request returns (a
                // descheduled thread under load), so a null here is allowed;
                // what must hold is the consistency checked below.
                textureslot* s = cache->gettex(id);
                (void)s;
            }
        });
    for (auto& th : threads) th.join();
    // The chain runs through every slot once, from head to tail.
    std::vector<int> seen(texturecache::kSlots, 0);
    int s = cache->lru_head(), last = -1, n = 0;
    for (; s != -1 && n <= texturecache::kSlots; s = cache->lru_next(s), ++n) {
        ASSERT_EQ(seen[s]++, 0);
        last = s;
    }
    EXPECT_EQ(n, texturecache::kSlots);
    EXPECT_EQ(last, cache->lru_tail());
    // Resident ids map to distinct slots whose record names them.
    std::vector<int> owner(texturecache::kSlots, -1);
    int resident = 0;
    for (int id = 0; id < 260; ++id) {
        int slot = cache->slot_of((unsigned short)id);
        if (slot < 0) continue;
        ++resident;
        EXPECT_EQ(owner[slot], -1);
        owner[slot] = id;
        EXPECT_EQ(cache->slot(slot)->metrics.averagehsl, id);
    }
    EXPECT_EQ(resident, texturecache::kSlots);
}

TEST_F(TextureCache, RefusedAndInvalidRequests) {
    EXPECT_EQ(cache->gettex(65535), nullptr);
    EXPECT_EQ(cache->getmetrics(65535), nullptr);
    // Beyond the id count: no metrics, and a missing texture is not requested.
    EXPECT_EQ(cache->getmetrics(1000), nullptr);
    EXPECT_EQ(cache->gettex(1000), nullptr);
    EXPECT_EQ(cache->gettex(40000), nullptr);
    EXPECT_TRUE(cb->requests.empty());
    EXPECT_NE(cache->getmetrics(999), nullptr);

    cb->answer = [](unsigned short) { return false; };
    EXPECT_EQ(cache->gettex(5), nullptr);
    cb->answer = [](unsigned short) { return true; };  // claims success without an upload
    EXPECT_EQ(cache->gettex(6), nullptr);
    EXPECT_EQ(cb->requests, (std::vector<int>{5, 6}));
    // An upload made during the request is found.
    cb->answer = [this](unsigned short id) {
        std::vector<int> px(128 * 128, 0x11223344);
        tk->upload_texture(id, px.data(), metrics());
        return true;
    };
    textureslot* t = tk->gettex(7);
    ASSERT_TRUE(t);
    EXPECT_EQ(t->texels[0], 0x11223344u);

    std::unique_ptr<Exception> e;
    try {
        texturecache::create(tk, -1);
    } catch (Exception* x) {
        e.reset(x);
    }
    EXPECT_TRUE(dynamic_cast<IllegalArgumentException*>(e.get()));
}

TEST_F(TextureCache, MetricsStoreNarrowedValues) {
    texturemetrics m;
    const int v[19] = {0x12345, 1, 0x104, 7, -1, 2, 300, 17, 200, -3, 1, 0, 5, 1, 0, 0x1FF, 1, 0, 0x7FFFFFFF};
    m.set(v);
    EXPECT_EQ(m.averagehsl, 0x2345);
    EXPECT_EQ(m.transparency, 1u);
    EXPECT_EQ(m.materialkind, 4);
    EXPECT_EQ(m.field5, 0xFFFFFFFFu);
    EXPECT_TRUE(m.field6);
    EXPECT_EQ(m.greyblend, 44);
    EXPECT_EQ(m.brightness, 17);
    EXPECT_EQ(m.scrollu, -56);
    EXPECT_EQ(m.scrollv, -3);
    EXPECT_TRUE(m.omitted);
    EXPECT_FALSE(m.dropfaces);
    EXPECT_TRUE(m.field13);
    EXPECT_TRUE(m.wrapu);
    EXPECT_FALSE(m.wrapv);
    EXPECT_EQ(m.field16, 0xFF);
    EXPECT_EQ(m.field19, 0x7FFFFFFFu);

    tk->upload_texturemetrics(999, m);
    EXPECT_EQ(tk->getmetrics(999)->averagehsl, 0x2345);
    EXPECT_EQ(cache->getmetrics(3)->averagehsl, 0);  // never written: zero
    std::unique_ptr<Exception> e;
    try {
        tk->upload_texturemetrics(1000, m);
    } catch (Exception* x) {
        e.reset(x);
    }
    auto* oob = dynamic_cast<ArrayIndexOutOfBoundsException*>(e.get());
    ASSERT_TRUE(oob);
    EXPECT_EQ(oob->index, 1000);
    EXPECT_EQ(oob->length, 1000);
}

TEST(TextureCacheToolkit, WithoutACacheUploadsAreRefused) {
    unsigned int mxcsr = _mm_getcsr();
    toolkit* tk = toolkit::create(nullptr, false, 0);
    EXPECT_EQ(tk->gettex(1), nullptr);
    EXPECT_EQ(tk->getmetrics(1), nullptr);
    tk->service(1000);
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
float lane3(__m128 v) { return _mm_cvtss_f32(_mm_shuffle_ps(v, v, _MM_SHUFFLE(3, 3, 3, 3))); }

TEST_F(TextureCache, ScrollOffsets) {
    std::vector<int> px(128 * 128, 0x10203040);
    // Textures arrive through requests, as they do from Java.
    cb->answer = [&](unsigned short id) {
        cache->upload_texture(id, px.data(), id == 10 ? metrics(64, -32) : id == 12 ? metrics(-64, 3) : metrics());
        return true;
    };
    textureslot* a = cache->gettex(10);
    textureslot* still = cache->gettex(11);
    textureslot* c = cache->gettex(12);
    ASSERT_TRUE(a && still && c);
    EXPECT_EQ(cache->queued_count(), 2);  // speeds 0 are never queued
    cache->gettex(10);
    EXPECT_EQ(cache->queued_count(), 2);
    EXPECT_EQ(a->queued, 1);
    EXPECT_EQ(still->queued, 0);

    // Speed 64 moves 128 texels per second: back at 0 on every whole second.
    cache->service(3000);
    EXPECT_EQ(lane0(a->scrolloffsetu), 0.0f);
    EXPECT_EQ(lane0(a->scrolloffsetv), -64.0f);  // -192 keeps its sign: -64
    EXPECT_EQ(a->queued, 0);
    EXPECT_EQ(cache->queued_count(), 0);

    cache->gettex(10);
    cache->gettex(12);
    cache->service(1500);
    EXPECT_EQ(lane0(a->scrolloffsetu), 64.0f);
    EXPECT_EQ(lane3(a->scrolloffsetu), 64.0f);
    EXPECT_EQ(lane0(a->scrolloffsetv), -96.0f);  // -32 x 1.5 s x 2 = -96
    EXPECT_EQ(lane0(c->scrolloffsetu), -64.0f);  // negative speeds stay in (-128, 0]
    EXPECT_EQ(lane0(c->scrolloffsetv), 9.0f);

    // Only slots fetched since the last update move.
    cache->gettex(12);
    cache->service(1250);
    EXPECT_EQ(lane0(a->scrolloffsetu), 64.0f);
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
    tk->service(0);  // nothing queued: nothing changes
    EXPECT_EQ(lane0(a->scrolloffsetu), -32.0f);

    // A new upload into the slot clears its offsets.
    cache->upload_texture(10, px.data(), metrics(64, -32));
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

TEST(TextureBlur, TransparentTexelsStayTransparentWithoutDarkening) {
    std::vector<unsigned int> src(128 * 128, 0xFF808080u);
    src[64 * 128 + 64] = 0;
    std::vector<unsigned int> kept = blur_into_band(src, true, true, false, false, false);
    EXPECT_EQ(kept[64 * 128 + 64], 0u);
    // Neighbours of the hole equal texels far from it.
    unsigned int flat = kept[10 * 128 + 10];
    for (int d = -2; d <= 2; ++d) {
        if (d == 0) continue;
        EXPECT_EQ(kept[64 * 128 + 64 + d], flat);
        EXPECT_EQ(kept[(64 + d) * 128 + 64], flat);
        EXPECT_EQ(kept[(64 + d) * 128 + 64 + d], flat);
    }
    EXPECT_EQ(flat, 0xFF808080u);
    // Blurring everything fills the hole and darkens its surroundings.
    std::vector<unsigned int> all = blur_into_band(src, true, true, true, false, false);
    EXPECT_NE(all[64 * 128 + 64], 0u);
    EXPECT_LT(all[64 * 128 + 65] >> 24, flat >> 24);
    // Through an upload: transparency mode 1 keeps holes.
    unsigned int mxcsr = _mm_getcsr();
    toolkit* tk = toolkit::create(nullptr, true, 10);
    std::vector<int> px(src.begin(), src.end());
    tk->upload_texture(4, px.data(), metrics(0, 0, true, true, 1));
    textureslot* t = tk->m_Textures->slot(tk->m_Textures->slot_of(4));
    EXPECT_EQ(t->texels[64 * 256 + 64], 0u);
    tk->upload_texture(4, px.data(), metrics(0, 0, true, true, 2));
    EXPECT_NE(t->texels[64 * 256 + 64], 0u);
    toolkit::destroy(tk);
    _mm_setcsr(mxcsr);
}

TEST(TextureBlur, WrapAgainstClampAtTheEdges) {
    // Column 0 white, the rest black (opaque).
    std::vector<unsigned int> src(128 * 128, 0xFF000000u);
    for (int v = 0; v < 128; ++v) src[v * 128] = 0xFFFFFFFFu;
    std::vector<unsigned int> wrapped = blur_into_band(src, true, false, true, false, false);
    std::vector<unsigned int> clamped = blur_into_band(src, false, false, true, false, false);
    // With wrapping the right edge sees the white column; clamped it does not.
    EXPECT_GT(wrapped[20 * 128 + 127] & 0xFF, 0u);
    EXPECT_GT(wrapped[20 * 128 + 126] & 0xFF, 0u);
    EXPECT_EQ(wrapped[20 * 128 + 125] & 0xFF, 0u);
    EXPECT_EQ(clamped[20 * 128 + 127] & 0xFF, 0u);
    // Clamped, the edge column is averaged over three texels only, so it stays brighter.
    EXPECT_GT(clamped[20 * 128 + 0] & 0xFF, wrapped[20 * 128 + 0] & 0xFF);
    // Vertical wrapping does nothing to a pattern constant along columns.
    std::vector<unsigned int> both = blur_into_band(src, true, true, true, false, false);
    EXPECT_EQ(both[0 * 128 + 127], wrapped[64 * 128 + 127]);
}

}  // namespace
