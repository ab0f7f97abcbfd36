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
// so the load stays inside the image). `wsum` is the sum of the weights used,
// added in neighbour order; the vector forms are the same values in all lanes.
struct blur_taps {
    int index[128][5];
    float weight[128][5];
    bool used[128][5];
    __m128 vweight[128][5];
    __m128 vwsum[128];
    explicit blur_taps(bool wrap) {
        for (int x = 0; x < 128; ++x) {
            float wsum = 0.0f;
            for (int k = 0; k < 5; ++k) {
                int n = x + k - 2;
                bool inside = n >= 0 && n < 128;
                used[x][k] = inside || wrap;
                index[x][k] = inside ? n : (wrap ? (n & 127) : x);
                weight[x][k] = used[x][k] ? kBlurWeights[k] : 0.0f;
                vweight[x][k] = _mm_set1_ps(weight[x][k]);
                if (used[x][k]) wsum += weight[x][k];
            }
            vwsum[x] = _mm_set1_ps(wsum);
        }
    }
};

const blur_taps& taps(bool wrap) {
    static const blur_taps clamped(false), wrapped(true);
    return wrap ? wrapped : clamped;
}

inline __m128 texel_to_floats(unsigned int p) {
    const __m128i zero = _mm_setzero_si128();
    return _mm_cvtepi32_ps(_mm_unpacklo_epi16(_mm_unpacklo_epi8(_mm_cvtsi32_si128(int(p)), zero), zero));
}

inline unsigned int floats_to_texel(__m128 channels) {
    __m128i q = _mm_cvttps_epi32(channels);
    q = _mm_packs_epi32(q, q);
    q = _mm_packus_epi16(q, q);
    return (unsigned int)_mm_cvtsi128_si32(q);
}

// ---- scalar reference ----

// One pass over one line: 128 texels `srcStep` apart into texels `dstStep`
// apart. KeepTransparent: word-0 texels stay 0 and are not neighbours.
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

template <bool KeepTransparent>
void blur_scalar(const unsigned int* src, unsigned int* slot, const blur_taps& tu, const blur_taps& tv) {
    alignas(16) static thread_local unsigned int work[128 * 128];
    for (int v = 0; v < 128; ++v) blur_line_scalar<KeepTransparent>(src + v * 128, 1, work + v * 128, 1, tu);
    for (int u = 0; u < 128; ++u)
        blur_line_scalar<KeepTransparent>(work + u, 128, slot + u, texturecache::kStride, tv);
}

// ---- SSE ----
//
// The four channels of a texel are one vector; every product and sum is the
// scalar one lane by lane, in the same order. A left-out neighbour contributes
// weight 0, which leaves both sums unchanged, so results equal the scalar
// reference bit for bit.

// Opaque blur (every texel counts): the horizontal pass works on a row
// converted to floats once, the vertical pass on whole rows of the work image
// (kept as floats of the truncated values), so the inner loops have no table
// look-ups per texel.
void blur_sse_opaque(const unsigned int* src, unsigned int* slot, const blur_taps& tu, const blur_taps& tv) {
    alignas(16) static thread_local __m128 work[128 * 128];
    alignas(16) __m128 line[128];
    for (int v = 0; v < 128; ++v) {
        const unsigned int* row = src + v * 128;
        for (int x = 0; x < 128; ++x) line[x] = texel_to_floats(row[x]);
        __m128* out = work + v * 128;
        for (int x = 0; x < 128; ++x) {
            const int* ix = tu.index[x];
            const __m128* w = tu.vweight[x];
            __m128 sum = _mm_mul_ps(w[0], line[ix[0]]);
            sum = _mm_add_ps(sum, _mm_mul_ps(w[1], line[ix[1]]));
            sum = _mm_add_ps(sum, _mm_mul_ps(w[2], line[ix[2]]));
            sum = _mm_add_ps(sum, _mm_mul_ps(w[3], line[ix[3]]));
            sum = _mm_add_ps(sum, _mm_mul_ps(w[4], line[ix[4]]));
            out[x] = _mm_cvtepi32_ps(_mm_cvttps_epi32(_mm_div_ps(sum, tu.vwsum[x])));
        }
    }
    for (int v = 0; v < 128; ++v) {
        const int* iv = tv.index[v];
        const __m128* r0 = work + iv[0] * 128;
        const __m128* r1 = work + iv[1] * 128;
        const __m128* r2 = work + iv[2] * 128;
        const __m128* r3 = work + iv[3] * 128;
        const __m128* r4 = work + iv[4] * 128;
        const __m128 w0 = tv.vweight[v][0], w1 = tv.vweight[v][1], w2 = tv.vweight[v][2], w3 = tv.vweight[v][3],
                     w4 = tv.vweight[v][4], ws = tv.vwsum[v];
        unsigned int* out = slot + v * texturecache::kStride;
        for (int x = 0; x < 128; ++x) {
            __m128 sum = _mm_mul_ps(w0, r0[x]);
            sum = _mm_add_ps(sum, _mm_mul_ps(w1, r1[x]));
            sum = _mm_add_ps(sum, _mm_mul_ps(w2, r2[x]));
            sum = _mm_add_ps(sum, _mm_mul_ps(w3, r3[x]));
            sum = _mm_add_ps(sum, _mm_mul_ps(w4, r4[x]));
            out[x] = floats_to_texel(_mm_div_ps(sum, ws));
        }
    }
}

// Blur keeping transparent texels: a neighbour's weight is masked to 0 when
// the neighbour is word 0, and transparent centres give 0.
void blur_line_sse_transparent(const unsigned int* src, int srcStep, unsigned int* dst, int dstStep,
                               const blur_taps& t) {
    alignas(16) __m128 line[128];
    alignas(16) __m128 opaque[128];
    const __m128i zero = _mm_setzero_si128();
    for (int x = 0; x < 128; ++x) {
        unsigned int p = src[x * srcStep];
        line[x] = texel_to_floats(p);
        opaque[x] = _mm_castsi128_ps(_mm_xor_si128(_mm_cmpeq_epi32(_mm_set1_epi32(int(p)), zero),
                                                   _mm_set1_epi32(-1)));
    }
    for (int x = 0; x < 128; ++x) {
        if (src[x * srcStep] == 0) {
            dst[x * dstStep] = 0;
            continue;
        }
        const int* ix = t.index[x];
        __m128 sum = _mm_setzero_ps();
        __m128 wsum = _mm_setzero_ps();
        for (int k = 0; k < 5; ++k) {
            __m128 w = _mm_and_ps(t.vweight[x][k], opaque[ix[k]]);
            sum = _mm_add_ps(sum, _mm_mul_ps(w, line[ix[k]]));
            wsum = _mm_add_ps(wsum, w);
        }
        dst[x * dstStep] = floats_to_texel(_mm_div_ps(sum, wsum));
    }
}

void blur_sse_transparent(const unsigned int* src, unsigned int* slot, const blur_taps& tu, const blur_taps& tv) {
    alignas(16) static thread_local unsigned int work[128 * 128];
    for (int v = 0; v < 128; ++v) blur_line_sse_transparent(src + v * 128, 1, work + v * 128, 1, tu);
    for (int u = 0; u < 128; ++u) blur_line_sse_transparent(work + u, 128, slot + u, texturecache::kStride, tv);
}

}  // namespace

void texturecache::copy_and_blur_texture(const unsigned int* src, unsigned int* slot, bool wrapu, bool wrapv,
                                         bool transparentTexelsBlur) {
    if (transparentTexelsBlur)
        blur_sse_opaque(src, slot, taps(wrapu), taps(wrapv));
    else
        blur_sse_transparent(src, slot, taps(wrapu), taps(wrapv));
}

void texturecache::copy_and_blur_texture_scalar(const unsigned int* src, unsigned int* slot, bool wrapu, bool wrapv,
                                                bool transparentTexelsBlur) {
    if (transparentTexelsBlur)
        blur_scalar<false>(src, slot, taps(wrapu), taps(wrapv));
    else
        blur_scalar<true>(src, slot, taps(wrapu), taps(wrapv));
}
