#include "texture/texturecache.h"

#include <cmath>
#include <cstring>
#include <new>

#include "jni/Exception.h"
#include "render/toolkit.h"
#include "util/memorymanager/aligned.h"

// --- texturemetrics ----------------------------------------------------------

void texturemetrics::set(int v0, int v1, int v2, int v3, int v4, int v5, int v6, int v7, int v8, int v9, int v10,
                         int v11, int v12, int v13, int v14, int v15, int v16, int v17, int v18) {
    averagehsl = (unsigned short)v0;
    transparency = (unsigned int)v1;
    materialkind = (unsigned char)v2;
    field4 = (unsigned char)v3;
    field5 = (unsigned int)v4;
    field6 = v5 != 0;
    greyblend = (unsigned char)v6;
    brightness = (unsigned char)v7;
    scrollu = (signed char)v8;
    scrollv = (signed char)v9;
    omitted = v10 != 0;
    dropfaces = v11 != 0;
    field13 = v12 != 0;
    wrapu = v13 != 0;
    wrapv = v14 != 0;
    field16 = (unsigned char)v15;
    field17 = v16 != 0;
    field18 = v17 != 0;
    field19 = (unsigned int)v18;
}

void texturemetrics::set(const int* v) {
    set(v[0], v[1], v[2], v[3], v[4], v[5], v[6], v[7], v[8], v[9], v[10], v[11], v[12], v[13], v[14], v[15], v[16],
        v[17], v[18]);
}

// --- construction --------------------------------------------------------------

texturecache* texturecache::create(toolkit* owner, int idcount) {
    void* mem = _aligned_malloc(sizeof(texturecache), 16);
    try {
        return new (mem) texturecache(owner, idcount);
    } catch (...) {
        _aligned_free(mem);
        throw;
    }
}

void texturecache::destroy(texturecache* cache) {
    if (!cache) return;
    cache->~texturecache();
    _aligned_free(cache);
}

texturecache::texturecache(toolkit* owner, int idcount)
    : m_Toolkit(owner), m_Texels(nullptr), m_Metrics(nullptr), m_IdCount(0) {
    if (idcount < 0) throw new IllegalArgumentException("negative texture count");
    m_Texels = static_cast<unsigned int*>(_aligned_malloc(kStoreBytes, 64));
    try {
        m_Metrics = new texturemetrics[size_t(idcount)]();
    } catch (...) {
        _aligned_free(m_Texels);
        throw;
    }
    m_IdCount = idcount;
    for (int s = 0; s < kSlots; ++s) {
        textureslot& t = m_Slots[s];
        std::memset(&t.metrics, 0, sizeof t.metrics);
        t.scrolloffsetu = _mm_setzero_ps();
        t.scrolloffsetv = _mm_setzero_ps();
        t.queued = 0;
        t.texels = m_Texels + (s / 2) * (kSize * kStride) + (s % 2) * kSize;
        m_SlotToId[s] = -1;
    }
    std::memset(m_IdToSlot, kNone, sizeof m_IdToSlot);
    std::memset(m_Next, kNone, sizeof m_Next);
    std::memset(m_Prev, kNone, sizeof m_Prev);
    for (int s = 0; s < kSlots; ++s) {
        m_Next[s] = (unsigned char)(s + 1 < kSlots ? s + 1 : kNone);
        m_Prev[s] = (unsigned char)(s > 0 ? s - 1 : kNone);
    }
    m_LruHead = 0;
    m_LruTail = kSlots - 1;
    m_UpdateCount = 0;
    std::memset(m_UpdateList, 0, sizeof m_UpdateList);
}

texturecache::~texturecache() {
    _aligned_free(m_Texels);
    delete[] m_Metrics;
}

// --- LRU chain -----------------------------------------------------------------

void texturecache::unlink_lru(int s) {
    int p = m_Prev[s], n = m_Next[s];
    if (p != kNone)
        m_Next[p] = (unsigned char)n;
    else
        m_LruHead = (unsigned char)n;
    if (n != kNone)
        m_Prev[n] = (unsigned char)p;
    else
        m_LruTail = (unsigned char)p;
    m_Next[s] = m_Prev[s] = kNone;
}

void texturecache::append_lru(int s) {
    m_Prev[s] = m_LruTail;
    m_Next[s] = kNone;
    if (m_LruTail != kNone)
        m_Next[m_LruTail] = (unsigned char)s;
    else
        m_LruHead = (unsigned char)s;
    m_LruTail = (unsigned char)s;
}

// --- fetching ------------------------------------------------------------------

textureslot* texturecache::gettex(unsigned short id) {
    if (id == 65535) return nullptr;
    std::unique_lock<std::mutex> lock(m_Lock);
    int s = m_IdToSlot[id];
    if (s == kNone) {
        if (int(id) >= m_IdCount) return nullptr;
        // Java uploads the texture during the call (re-entering upload_texture
        // on this thread), so the lock is not held across it.
        lock.unlock();
        bool provided = m_Toolkit && m_Toolkit->request_texture(id);
        lock.lock();
        if (!provided) return nullptr;
        s = m_IdToSlot[id];
        if (s == kNone) return nullptr;  // Java said yes without uploading
    }
    if (s != m_LruTail) {
        unlink_lru(s);
        append_lru(s);
    }
    textureslot& t = m_Slots[s];
    if (!t.queued && (t.metrics.scrollu != 0 || t.metrics.scrollv != 0)) {
        m_UpdateList[m_UpdateCount++] = (unsigned char)s;
        t.queued = 1;
    }
    return &t;
}

texturemetrics* texturecache::getmetrics(unsigned short id) {
    if (id == 65535 || int(id) >= m_IdCount) return nullptr;
    return &m_Metrics[id];
}

void texturecache::upload_texturemetrics(unsigned short id, const texturemetrics& m) {
    if (int(id) >= m_IdCount) throw new ArrayIndexOutOfBoundsException(id, m_IdCount);
    std::lock_guard<std::mutex> lock(m_Lock);
    m_Metrics[id] = m;
}

void texturecache::upload_texture(unsigned short id, const int* pixels, const texturemetrics& m) {
    std::lock_guard<std::mutex> lock(m_Lock);
    // A second upload of a resident id replaces it in place; otherwise the
    // least recently used slot is the victim. The slot becomes the most
    // recently used, so that textures uploaded one after another (preloading,
    // or requests on several threads) do not evict each other.
    int target = m_IdToSlot[id] != kNone ? m_IdToSlot[id] : m_LruHead;
    if (target != m_LruTail) {
        unlink_lru(target);
        append_lru(target);
    }
    if (m_SlotToId[target] >= 0) m_IdToSlot[m_SlotToId[target]] = kNone;
    m_SlotToId[target] = id;
    m_IdToSlot[id] = (unsigned char)target;
    textureslot& t = m_Slots[target];
    t.metrics = m;
    t.scrolloffsetu = _mm_setzero_ps();
    t.scrolloffsetv = _mm_setzero_ps();
    copy_and_blur_texture(reinterpret_cast<const unsigned int*>(pixels), t.texels, m.wrapu, m.wrapv,
                          m.transparency != 1);
}

void texturecache::service(int ms) {
    std::lock_guard<std::mutex> lock(m_Lock);
    if (m_UpdateCount == 0) return;
    double t = double(ms % 128000) / 1000.0;
    for (int i = 0; i < m_UpdateCount; ++i) {
        textureslot& s = m_Slots[m_UpdateList[i]];
        // Speeds are 1/64 of the 128-texel width per second; fmod keeps the
        // sign of the dividend, so negative speeds give offsets in (-128, 0].
        float u = float(std::fmod(double(s.metrics.scrollu) * t * 0.015625 * 128.0, 128.0));
        float v = float(std::fmod(double(s.metrics.scrollv) * t * 0.015625 * 128.0, 128.0));
        s.scrolloffsetu = _mm_set1_ps(u);
        s.scrolloffsetv = _mm_set1_ps(v);
        s.queued = 0;
    }
    m_UpdateCount = 0;
}

// --- copies and the blur ---------------------------------------------------------

void texturecache::copy_texture(const unsigned int* src, unsigned int* dst) {
    for (int v = 0; v < kSize; ++v) std::memcpy(dst + v * kStride, src + v * kSize, kSize * 4);
}

namespace {

// The standard normal density at -2..2.
const float kBlurWeights[5] = {0.053990968f, 0.24197072f, 0.3989423f, 0.24197072f, 0.053990968f};

// Neighbour indices and weights of one pass for every position: a neighbour
// outside 0..127 wraps or gets weight 0 (its index then points at the centre
// so the load stays inside the image).
struct blur_taps {
    int index[128][5];
    float weight[128][5];
    bool used[128][5];
    explicit blur_taps(bool wrap) {
        for (int x = 0; x < 128; ++x)
            for (int k = 0; k < 5; ++k) {
                int n = x + k - 2;
                bool inside = n >= 0 && n < 128;
                used[x][k] = inside || wrap;
                index[x][k] = inside ? n : (wrap ? (n & 127) : x);
                weight[x][k] = used[x][k] ? kBlurWeights[k] : 0.0f;
            }
    }
};

const blur_taps& taps(bool wrap) {
    static const blur_taps clamped(false), wrapped(true);
    return wrap ? wrapped : clamped;
}

// Scalar reference of one pass over one line: `count` texels `srcStep` apart
// into texels `dstStep` apart. KeepTransparent: word-0 texels stay 0 and are
// not neighbours.
template <bool KeepTransparent>
void blur_line_scalar(const unsigned int* src, int srcStep, unsigned int* dst, int dstStep, const blur_taps& t) {
    for (int x = 0; x < 128; ++x) {
        if (KeepTransparent && src[x * srcStep] == 0) {
            dst[x * dstStep] = 0;
            continue;
        }
        float sum[4] = {0, 0, 0, 0};
        float wsum = 0;
        for (int k = 0; k < 5; ++k) {
            if (!t.used[x][k]) continue;
            unsigned int n = src[t.index[x][k] * srcStep];
            if (KeepTransparent && n == 0) continue;
            float w = kBlurWeights[k];
            for (int c = 0; c < 4; ++c) sum[c] += w * float((n >> (8 * c)) & 0xFF);
            wsum += w;
        }
        unsigned int out = 0;
        for (int c = 0; c < 4; ++c) out |= (unsigned int)int(sum[c] / wsum) << (8 * c);
        dst[x * dstStep] = out;
    }
}

// The same with the four channels of a texel in one vector. Left-out
// neighbours contribute weight 0, which leaves both sums unchanged, so the
// results equal the scalar ones bit for bit.
template <bool KeepTransparent>
void blur_line_sse(const unsigned int* src, int srcStep, unsigned int* dst, int dstStep, const blur_taps& t) {
    const __m128i zero = _mm_setzero_si128();
    for (int x = 0; x < 128; ++x) {
        if (KeepTransparent && src[x * srcStep] == 0) {
            dst[x * dstStep] = 0;
            continue;
        }
        __m128 sum = _mm_setzero_ps();
        __m128 wsum = _mm_setzero_ps();
        for (int k = 0; k < 5; ++k) {
            unsigned int n = src[t.index[x][k] * srcStep];
            __m128 w = _mm_set1_ps(t.weight[x][k]);
            if (KeepTransparent) {
                __m128i nz = _mm_cmpeq_epi32(_mm_cvtsi32_si128(int(n)), zero);
                nz = _mm_shuffle_epi32(nz, 0);
                w = _mm_andnot_ps(_mm_castsi128_ps(nz), w);
            }
            __m128i px = _mm_unpacklo_epi16(_mm_unpacklo_epi8(_mm_cvtsi32_si128(int(n)), zero), zero);
            sum = _mm_add_ps(sum, _mm_mul_ps(w, _mm_cvtepi32_ps(px)));
            wsum = _mm_add_ps(wsum, w);
        }
        __m128i q = _mm_cvttps_epi32(_mm_div_ps(sum, wsum));
        q = _mm_packs_epi32(q, q);
        q = _mm_packus_epi16(q, q);
        dst[x * dstStep] = (unsigned int)_mm_cvtsi128_si32(q);
    }
}

typedef void (*blur_line_fn)(const unsigned int*, int, unsigned int*, int, const blur_taps&);

// Rows from the source into a work image, then columns from it into the slot.
void blur(const unsigned int* src, unsigned int* slot, bool wrapu, bool wrapv, blur_line_fn line) {
    alignas(16) static thread_local unsigned int work[128 * 128];
    const blur_taps& tu = taps(wrapu);
    const blur_taps& tv = taps(wrapv);
    for (int v = 0; v < 128; ++v) line(src + v * 128, 1, work + v * 128, 1, tu);
    for (int u = 0; u < 128; ++u) line(work + u, 128, slot + u, texturecache::kStride, tv);
}

}  // namespace

void texturecache::copy_and_blur_texture(const unsigned int* src, unsigned int* slot, bool wrapu, bool wrapv,
                                         bool transparentTexelsBlur) {
    blur(src, slot, wrapu, wrapv, transparentTexelsBlur ? blur_line_sse<false> : blur_line_sse<true>);
}

void texturecache::copy_and_blur_texture_scalar(const unsigned int* src, unsigned int* slot, bool wrapu, bool wrapv,
                                                bool transparentTexelsBlur) {
    blur(src, slot, wrapu, wrapv, transparentTexelsBlur ? blur_line_scalar<false> : blur_line_scalar<true>);
}
