// Shared helpers of the rasteriser tests: guarded target buffers, a seeded
// generator and random triangles of every awkward kind.
#pragma once

#include <emmintrin.h>

#include <cmath>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <vector>

#include "render/Rasterizer.h"

namespace rasttest {

using namespace Rasterizer_n;

struct Rng {
    uint64_t s;
    explicit Rng(uint64_t seed) : s(seed * 0x9E3779B97F4A7C15ull + 0x1234567ull) {}
    uint64_t next() {
        uint64_t z = (s += 0x9E3779B97F4A7C15ull);
        z = (z ^ (z >> 30)) * 0xBF58476D1CE4E5B9ull;
        z = (z ^ (z >> 27)) * 0x94D049BB133111EBull;
        return z ^ (z >> 31);
    }
    uint32_t u32() { return uint32_t(next() >> 32); }
    int range(int lo, int hi) { return lo + int(next() % uint64_t(hi - lo + 1)); }  // inclusive
    float uni(float lo, float hi) { return lo + (hi - lo) * float(next() >> 40) / float(1 << 24); }
    bool chance(int percent) { return range(0, 99) < percent; }
};

constexpr uint32_t kColourSentinel = 0xDEADBEEFu;
constexpr float kDepthSentinel = -12345.5f;

// Colour and depth targets of width x height with row stride `pitch`,
// surrounded by `guard` sentinel-filled rows on both sides. The first pixel is
// 16-byte aligned.
struct Target {
    int width, height, pitch, guard;
    uint32_t* colourMem = nullptr;
    float* depthMem = nullptr;
    size_t total = 0;
    Target(int w, int h, int p, int g = 4) : width(w), height(h), pitch(p), guard(g) {
        total = size_t(p) * size_t(h + 2 * g) + 16;
        colourMem = static_cast<uint32_t*>(std::aligned_alloc(64, ((total * 4 + 63) / 64) * 64));
        depthMem = static_cast<float*>(std::aligned_alloc(64, ((total * 4 + 63) / 64) * 64));
        for (size_t i = 0; i < total; ++i) {
            colourMem[i] = kColourSentinel;
            depthMem[i] = kDepthSentinel;
        }
    }
    ~Target() {
        std::free(colourMem);
        std::free(depthMem);
    }
    Target(const Target&) = delete;
    Target& operator=(const Target&) = delete;
    size_t origin() const { return (size_t(pitch) * guard + 3) & ~size_t(3); }
    uint32_t* colour() const { return colourMem + origin(); }
    float* depth() const { return depthMem + origin(); }
    uint32_t& at(int x, int y) const { return colour()[size_t(y) * pitch + x]; }
    float& zat(int x, int y) const { return depth()[size_t(y) * pitch + x]; }
    // Random contents inside the target; the guards keep their sentinels.
    void randomise(Rng& r, bool farDepth = false) {
        for (int y = 0; y < height; ++y)
            for (int x = 0; x < pitch; ++x) {
                at(x, y) = r.u32();
                zat(x, y) = farDepth || r.chance(10) ? 3.4e38f : r.uni(0.0f, 1.5f);
            }
    }
    void copyFrom(const Target& o) {
        std::memcpy(colourMem, o.colourMem, total * 4);
        std::memcpy(depthMem, o.depthMem, total * 4);
    }
    // Makes this the rasteriser's target (buffers, pitch, size); the viewport is separate.
    void bind(bool withColour = true, bool withDepth = true) const {
        SetTarget(withColour ? colour() : nullptr, withDepth ? depth() : nullptr, pitch, width, height);
    }
    // Index of the first differing element (colour, then depth), or -1.
    long long diff(const Target& o, bool& inDepth) const {
        for (size_t i = 0; i < total; ++i)
            if (colourMem[i] != o.colourMem[i]) {
                inDepth = false;
                return (long long)i - (long long)origin();
            }
        for (size_t i = 0; i < total; ++i)
            if (std::memcmp(&depthMem[i], &o.depthMem[i], 4) != 0) {
                inDepth = true;
                return (long long)i - (long long)origin();
            }
        return -1;
    }
    bool guardsIntact() const {
        for (size_t i = 0; i < origin(); ++i)
            if (colourMem[i] != kColourSentinel || depthMem[i] != kDepthSentinel) return false;
        for (size_t i = origin() + size_t(pitch) * height; i < total; ++i)
            if (colourMem[i] != kColourSentinel || depthMem[i] != kDepthSentinel) return false;
        return true;
    }
};

inline void SetViewportRect(int x, int y, int w, int h) {
    Viewport_s vp = {x, y, w, h, 0.0f, 1.0f};
    SetViewport(vp);
}

// 128 x 128 texels, row stride 256, with transparent words, alpha-0 texels
// and the nearly transparent 0x01000000.
struct Texture {
    std::vector<uint32_t> texels;
    explicit Texture(Rng& r) : texels(256 * 128) {
        for (uint32_t& t : texels) {
            int k = r.range(0, 99);
            t = k < 8 ? 0u : (k < 16 ? (r.u32() & 0x00FFFFFFu) : (k < 18 ? 0x01000000u : r.u32()));
        }
    }
};

inline float Special(Rng& r) {
    static const float v[] = {1e20f, -1e20f, 3.0e38f, -3.0e38f, 1e7f, -1e7f, 123456.7f, -99999.5f};
    return v[r.range(0, 7)];
}

// A random triangle of one of several kinds inside or around a w x h target.
inline void RandomTriangle(Rng& r, int w, int h, Triangle_s& t, const Texture* tex[3], const unsigned char* map) {
    std::memset(&t, 0, sizeof t);
    float x[3], y[3], z[3];
    int kind = r.range(0, 11);
    float cx = r.uni(-8.0f, w + 8.0f), cy = r.uni(-8.0f, h + 8.0f);
    for (int i = 0; i < 3; ++i) {
        switch (kind) {
            case 0:
            case 1:  // anywhere around the target
                x[i] = r.uni(-0.3f * w, 1.3f * w);
                y[i] = r.uni(-0.3f * h, 1.3f * h);
                break;
            case 2:  // small, a few pixels
                x[i] = cx + r.uni(-3.0f, 3.0f);
                y[i] = cy + r.uni(-3.0f, 3.0f);
                break;
            case 3:  // sliver: nearly collinear
                x[i] = cx + (i - 1) * 20.0f + r.uni(-0.4f, 0.4f);
                y[i] = cy + (i - 1) * r.uni(-15.0f, 15.0f) * 0.5f + r.uni(-0.3f, 0.3f);
                break;
            case 4:  // huge and far outside
                x[i] = r.chance(50) ? Special(r) : r.uni(-2000.0f, 2000.0f);
                y[i] = r.chance(50) ? Special(r) : r.uni(-2000.0f, 2000.0f);
                break;
            case 5:  // whole and half pixel positions (ties of the rounding)
                x[i] = float(r.range(-4, w + 4)) + (r.chance(50) ? 0.5f : 0.0f);
                y[i] = float(r.range(-4, h + 4)) + (r.chance(50) ? 0.5f : 0.0f);
                break;
            case 6:  // flat top or bottom
                x[i] = r.uni(-4.0f, w + 4.0f);
                y[i] = i < 2 ? cy : cy + r.uni(-30.0f, 30.0f);
                break;
            case 7:  // degenerate: one row, or one point
                x[i] = r.chance(50) ? cx : r.uni(-4.0f, w + 4.0f);
                y[i] = cy + r.uni(0.0f, 0.9f) * (r.chance(50) ? 1.0f : 0.0f);
                break;
            case 8:  // entirely off one side
                x[i] = r.chance(50) ? r.uni(-60.0f, -1.0f) : r.uni(w + 1.0f, w + 60.0f);
                y[i] = r.uni(-10.0f, h + 10.0f);
                break;
            case 9:  // tall and thin
                x[i] = cx + r.uni(-1.5f, 1.5f);
                y[i] = r.uni(-10.0f, h + 10.0f);
                break;
            default:  // straddling the edges
                x[i] = (r.chance(50) ? 0.0f : float(w)) + r.uni(-12.0f, 12.0f);
                y[i] = (r.chance(50) ? 0.0f : float(h)) + r.uni(-12.0f, 12.0f);
                break;
        }
        z[i] = r.chance(15) ? 0.5f : r.uni(0.05f, 1.4f);
    }
    if (r.chance(3)) {  // non-finite coordinate somewhere
        float bad = r.chance(50) ? INFINITY : NAN;
        int which = r.range(0, 2);
        (r.range(0, 2) == 0 ? x : r.chance(50) ? y : z)[which] = bad;
    }
    for (int i = 0; i < 3; ++i) {
        t.m_Positions[i] = _mm_setr_ps(x[i], y[i], z[i], 1.0f);
        t.m_Colours[i] = _mm_setr_epi16(short(r.u32()), short(r.u32()), short(r.u32()), short(r.u32()), 0, 0, 0, 0);
        float range = r.chance(20) ? 4000.0f : 300.0f;
        t.m_TexCoords[i] = _mm_setr_ps(r.uni(-range, range), r.uni(-range, range), 0.0f, 0.0f);
    }
    t.m_TexScale = _mm_setr_ps(r.uni(0.25f, 3.0f), r.uni(0.25f, 3.0f), 1.0f, 1.0f);
    float ou = r.uni(-200.0f, 200.0f), ov = r.uni(-200.0f, 200.0f);
    t.m_TexOffset = _mm_setr_ps(ou, ov, ou, ov);
    t.m_MapShift = _mm_cvtsi32_si128(r.chance(5) ? 40 : r.range(0, 9));
    t.m_HeightFog = _mm_setr_ps(r.uni(0.0f, 1.0f), r.uni(0.0f, 1.0f), r.uni(0.0f, 1.0f), 0.0f);
    t.m_HeightFogColour = _mm_setr_ps(float(r.range(0, 255) * 256), float(r.range(0, 255) * 256),
                                      float(r.range(0, 255) * 256), float(r.range(0, 255) * 256));
    t.m_FlatColour = r.u32();
    t.m_Alpha = uint32_t(r.range(0, 255)) * 0x10001u;
    t.m_pTexture = tex[0]->texels.data();
    t.m_pTexture2 = tex[1]->texels.data();
    t.m_pTexture3 = tex[2]->texels.data();
    t.m_pMap = map;
}

}  // namespace rasttest
