// Plain scalar reference of the triangle rasteriser, one pixel at a time,
// with the modes as run-time values. It follows the rasteriser's arithmetic
// step by step: approximate reciprocals through the scalar SSE intrinsic,
// float edge stepping per row, 16-bit wrapping colour stepping, float
// attribute stepping per group of four pixels. On one machine its results
// therefore match the vector code bit for bit.
#pragma once

#include <xmmintrin.h>

#include <cstdint>
#include <cstring>

#include "render/Rasterizer.h"

namespace rastref {

using namespace Rasterizer_n;

struct Modes {
    int shade, addrU, addrV;
    bool texTransform;
    int fog, blend;
    bool transparent, map, depthWrite, colourWrite, depthTest;
};

inline Modes ModesOf(const RasterVariant_s& v) {
    return {v.m_Shade,       v.m_AddrU,  v.m_AddrV,      v.m_TexTransform, v.m_Fog,         v.m_Blend,
            v.m_Transparent, v.m_MapMod, v.m_DepthWrite, v.m_ColourWrite,  v.m_DepthTest};
}

inline float rcp(float x) { return _mm_cvtss_f32(_mm_rcp_ss(_mm_set_ss(x))); }
inline int trunc_i(float x) { return _mm_cvttss_si32(_mm_set_ss(x)); }
inline int round_i(float x) { return _mm_cvtss_si32(_mm_set_ss(x)); }
// the vector max/min: the second operand wins when either is NaN
inline float vmax(float a, float b) { return a > b ? a : b; }
inline float vmin(float a, float b) { return a < b ? a : b; }
inline float clamp_coord(float x) { return vmin(vmax(x, -1.0e9f), 1.0e9f); }
inline int sat16(int v) { return v < -32768 ? -32768 : (v > 32767 ? 32767 : v); }
inline uint16_t to_u16(float f) { return uint16_t(sat16(int(uint32_t(trunc_i(f)) - 32768u)) + 0x8000); }
inline int16_t to_i16(float f) { return int16_t(sat16(trunc_i(f))); }
// unsigned saturating pack of a 16-bit lane read as signed
inline uint32_t pack_u8(uint16_t v) {
    int s = int16_t(v);
    return uint32_t(s < 0 ? 0 : (s > 255 ? 255 : s));
}
inline bool finite_bits(float f) {
    uint32_t b;
    std::memcpy(&b, &f, 4);
    return (b & 0x7F800000u) != 0x7F800000u;
}
inline float lane(const __m128& v, int i) {
    float f[4];
    std::memcpy(f, &v, 16);
    return f[i];
}
inline uint16_t lane16(const __m128i& v, int i) {
    uint16_t s[8];
    std::memcpy(s, &v, 16);
    return s[i];
}

struct Vtx {
    float p[4], c[4], f[4], t[4], w[4];
};

struct Half {
    int row, count;
    float e[4], es[4];           // xL, zL, xR, zR
    uint16_t c[8], f[8], w[8];   // left 0..3, right 4..7
    int16_t cs[8], fs[8], ws[8];
    float t[4], ts[4];           // uL, vL, uR, vR
};

inline void LoadVertex(const Modes& m, const Triangle_s& t, int i, Vtx& v) {
    for (int k = 0; k < 4; ++k) v.p[k] = lane(t.m_Positions[i], k);
    if (m.shade >= 1) {
        for (int k = 0; k < 4; ++k) v.c[k] = float(int(lane16(t.m_Colours[i], k)));
        if (m.fog == 1 || m.fog == 3) {
            float h = lane(t.m_HeightFog, i);
            for (int k = 0; k < 4; ++k) {
                v.c[k] = v.c[k] * (1.0f - h);
                v.f[k] = lane(t.m_HeightFogColour, k) * h;
            }
        }
        if (m.fog == 2 || m.fog == 3) {
            float d = (v.p[2] - m_DistanceFogStart) * m_InvDistanceFogRange;
            d = vmin(vmax(d, 0.0f), 1.0f);
            for (int k = 0; k < 4; ++k) {
                v.c[k] = v.c[k] * (1.0f - d);
                float fc = lane(m_DistanceFogColour, k);
                v.f[k] = m.fog == 3 ? v.f[k] * (1.0f - d) + fc * d : fc * d;
            }
        }
    }
    if (m.shade >= 2) {
        float r = rcp(v.p[2]);
        for (int k = 0; k < 2; ++k) {
            float tc = lane(t.m_TexCoords[i], k);
            if (m.texTransform) tc = tc * lane(t.m_TexScale, k);
            v.t[k] = tc * r;
        }
    }
    if (m.shade == 3) {
        static const float IJ[3][4] = {{65535, 0, 65535, 0}, {0, 65535, 0, 65535}, {0, 0, 0, 0}};
        for (int k = 0; k < 4; ++k) v.w[k] = IJ[i][k];
    }
}

struct Clip {
    int x0, x1, y0, y1;
};

inline bool CurrentClip(bool mask, Clip& c) {
    const Viewport_s& vp = m_Viewport;
    long long x0 = vp.X, x1 = (long long)vp.X + vp.Width, y0 = vp.Y, y1 = (long long)vp.Y + vp.Height;
    if (mask) {
        x0 = 0;
        x1 = vp.Width;
    } else {
        if (x1 > m_TargetWidth) x1 = m_TargetWidth;
        if (y1 > m_TargetHeight) y1 = m_TargetHeight;
    }
    auto cl = [](long long v) { return v < 0 ? 0 : (v > (1 << 30) ? (1 << 30) : v); };
    x0 = cl(x0);
    x1 = cl(x1);
    y0 = cl(y0);
    y1 = cl(y1);
    if (x1 <= x0 || y1 <= y0) return false;
    c = {int(x0), int(x1), int(y0), int(y1)};
    return true;
}

// The per-pixel colour and write decision for pixel `o` (offset from the
// span's left edge) with depth z and texture coordinates (u/d, v/d).
struct PixelIn {
    int off;
    float z, u, v;
};

inline void Pixel(const Modes& m, const Triangle_s& t, const Half& h, const int16_t* gc, const int16_t* gf,
                  const int16_t* gw, const PixelIn& in, uint32_t* cp, float* dp) {
    if (m.depthTest && !(in.z <= *dp)) return;
    auto interp = [&](const uint16_t* e, const int16_t* g, int k) {
        return uint16_t(uint32_t(e[k]) + uint32_t(uint16_t(g[k])) * uint32_t(uint16_t(in.off)));
    };
    uint32_t src = 0;
    uint32_t texel = 0;
    if (m.shade == 0) {
        src = t.m_FlatColour;
    } else {
        uint16_t s[4];
        uint16_t c[4];
        for (int k = 0; k < 4; ++k) c[k] = interp(h.c, gc, k);
        if (m.shade == 1) {
            for (int k = 0; k < 4; ++k) s[k] = uint16_t(c[k] >> 8);
        } else {
            float u = in.u * in.z, v = in.v * in.z;
            if (m.texTransform) {
                u = u + lane(t.m_TexOffset, 0);
                v = v + lane(t.m_TexOffset, 1);
            }
            int ui, vi, uraw, vraw;
            if (m.addrU == 2) uraw = ui = trunc_i(vmin(vmax(u, 0.0f), 127.0f));
            else ui = (uraw = trunc_i(u)) & 127;
            if (m.addrV == 2) vraw = vi = trunc_i(vmin(vmax(v, 0.0f), 127.0f));
            else vi = (vraw = trunc_i(v)) & 127;
            int idx = ui + vi * 256;
            if (m.map) {
                uint64_t cnt;
                std::memcpy(&cnt, &t.m_MapShift, 8);
                int sh = cnt > 31 ? 31 : int(cnt);
                auto b = [](int x) { return x < 0 ? 0 : (x > 255 ? 255 : x); };
                int mu = b(uraw >> sh), mv = b(vraw >> sh);
                uint16_t mm = uint16_t(t.m_pMap[mu + mv * 256] << 8);
                for (int k = 0; k < 4; ++k) c[k] = uint16_t((uint32_t(c[k]) * mm) >> 16);
            }
            texel = t.m_pTexture[idx];
            uint16_t tx[4];
            for (int k = 0; k < 4; ++k) tx[k] = uint16_t((texel >> (8 * k)) & 0xFF);
            if (m.shade == 3) {
                uint32_t t2 = t.m_pTexture2[idx], t3 = t.m_pTexture3[idx];
                uint16_t I = interp(h.w, gw, 0), J = interp(h.w, gw, 1);
                uint16_t K = uint16_t(0xFFFF - I - J);
                for (int k = 0; k < 4; ++k)
                    tx[k] = uint16_t(((tx[k] * uint32_t(I)) >> 16) + ((((t2 >> (8 * k)) & 0xFF) * uint32_t(J)) >> 16) +
                                     ((((t3 >> (8 * k)) & 0xFF) * uint32_t(K)) >> 16));
            }
            for (int k = 0; k < 4; ++k) s[k] = uint16_t((uint32_t(tx[k]) * c[k]) >> 16);
        }
        if (m.fog) {
            for (int k = 0; k < 4; ++k) {
                uint32_t sum = uint32_t(s[k]) + (interp(h.f, gf, k) >> 8);
                s[k] = uint16_t(sum > 65535 ? 65535 : sum);
            }
        }
        for (int k = 0; k < 4; ++k) src |= pack_u8(s[k]) << (8 * k);
    }
    if (m.transparent && texel == 0) return;
    if (m.blend == 2 && (src >> 24) == 0) return;
    if (m.colourWrite) {
        uint32_t out = src;
        uint32_t dst = *cp;
        if (m.blend == 2) {
            uint32_t A = src >> 24;
            out = 0;
            for (int k = 0; k < 4; ++k) {
                uint32_t sc = (src >> (8 * k)) & 0xFF, dc = (dst >> (8 * k)) & 0xFF;
                uint16_t o = uint16_t((uint16_t(dc * (256 - A)) + uint16_t(sc * A)) & 0xFFFF) >> 8;
                out |= pack_u8(o) << (8 * k);
            }
        } else if (m.blend == 3) {
            out = 0;
            for (int k = 0; k < 4; ++k) {
                uint16_t a = uint16_t((k & 1) ? (t.m_Alpha >> 16) : (t.m_Alpha & 0xFFFF));
                uint16_t a256 = uint16_t(a << 8), ia = uint16_t(256 - a);
                uint32_t sc = (src >> (8 * k)) & 0xFF, dc = (dst >> (8 * k)) & 0xFF;
                uint32_t o = ((sc * a256) >> 16) + ((uint32_t(uint16_t(dc << 8)) * ia) >> 16);
                out |= pack_u8(uint16_t(o > 65535 ? 65535 : o)) << (8 * k);
            }
        }
        *cp = out;
    }
    if (m.depthWrite && m.depthTest) *dp = in.z;
}

inline void Span(const Modes& m, const Triangle_s& t, const Half& h, int row, const Clip& clip) {
    const intptr_t pitch = m_ScreenPitch;
    int xL = round_i(clamp_coord(h.e[0])), xR = round_i(clamp_coord(h.e[2]));
    int xStart = xL > clip.x0 ? xL : clip.x0;
    int xEnd = xR < clip.x1 ? xR : clip.x1;
    if (xEnd <= xStart) return;
    float inv = rcp(float(xR - xL));
    int s = xStart - xL;
    float sf = float(s);
    uint32_t* p = m_pColourBuffer + intptr_t(row) * pitch + xStart;
    float* dpix = m_pDepthBuffer ? m_pDepthBuffer + intptr_t(row) * pitch + xStart : nullptr;
    int lead = int((reinterpret_cast<uintptr_t>(p) >> 2) & 3);
    float lanes[4];
    for (int i = 0; i < 4; ++i) lanes[i] = float(i) + float(-lead);
    float dz = (h.e[3] - h.e[1]) * inv;
    float z0 = h.e[1] + dz * sf;
    float du = (h.t[2] - h.t[0]) * inv, dv = (h.t[3] - h.t[1]) * inv;
    float u0 = h.t[0] + du * sf, v0 = h.t[1] + dv * sf;
    float z[4], u[4], v[4];
    for (int i = 0; i < 4; ++i) {
        z[i] = z0 + dz * lanes[i];
        u[i] = u0 + du * lanes[i];
        v[i] = v0 + dv * lanes[i];
    }
    float dz4 = dz * 4.0f, du4 = du * 4.0f, dv4 = dv * 4.0f;
    int16_t gc[4], gf[4], gw[4];
    for (int k = 0; k < 4; ++k) {
        gc[k] = to_i16(float(int(h.c[4 + k]) - int(h.c[k])) * inv);
        gf[k] = to_i16(float(int(h.f[4 + k]) - int(h.f[k])) * inv);
        gw[k] = to_i16(float(int(h.w[4 + k]) - int(h.w[k])) * inv);
    }
    // groups of four from the aligned pixel at or before the first one
    int n = xEnd - xStart;
    for (int first = -lead; first < n; first += 4) {
        for (int i = 0; i < 4; ++i) {
            int q = first + i;  // offset from xStart
            if (q >= 0 && q < n) {
                PixelIn in = {s + q, z[i], u[i], v[i]};
                Pixel(m, t, h, gc, gf, gw, in, p + q, dpix ? dpix + q : nullptr);
            }
        }
        for (int i = 0; i < 4; ++i) {
            z[i] = z[i] + dz4;
            u[i] = u[i] + du4;
            v[i] = v[i] + dv4;
        }
    }
}

inline void Rows(const Modes& m, const Triangle_s& t, Half& h, const Clip& clip) {
    for (; h.count > 0; --h.count, ++h.row) {
        if (m.shade == -1) {
            int xl = trunc_i(clamp_coord(h.e[0])), xr = trunc_i(clamp_coord(h.e[2]));
            if (xl < clip.x0) xl = clip.x0;
            if (xr > clip.x1) xr = clip.x1;
            unsigned char* b = reinterpret_cast<unsigned char*>(m_pColourBuffer) + intptr_t(h.row) * m_ScreenPitch;
            for (int x = xl; x < xr; ++x) b[x] = 1;
        } else {
            Span(m, t, h, h.row, clip);
        }
        for (int k = 0; k < 4; ++k) h.e[k] = h.e[k] + h.es[k];
        for (int k = 0; k < 8; ++k) {
            h.c[k] = uint16_t(h.c[k] + h.cs[k]);
            h.f[k] = uint16_t(h.f[k] + h.fs[k]);
            h.w[k] = uint16_t(h.w[k] + h.ws[k]);
        }
        for (int k = 0; k < 4; ++k) h.t[k] = h.t[k] + h.ts[k];
    }
}

// Sets one side (0 left, 1 right) of `h` from an edge value and gradient.
inline void SetSide(Half& h, int side, const Vtx& s, const Vtx& g) {
    h.e[2 * side] = s.p[0];
    h.e[2 * side + 1] = s.p[2];
    h.es[2 * side] = g.p[0];
    h.es[2 * side + 1] = g.p[2];
    for (int k = 0; k < 4; ++k) {
        h.c[4 * side + k] = to_u16(s.c[k]);
        h.cs[4 * side + k] = to_i16(g.c[k]);
        h.f[4 * side + k] = to_u16(s.f[k]);
        h.fs[4 * side + k] = to_i16(g.f[k]);
        h.w[4 * side + k] = to_u16(s.w[k]);
        h.ws[4 * side + k] = to_i16(g.w[k]);
    }
    for (int k = 0; k < 2; ++k) {
        h.t[2 * side + k] = s.t[k];
        h.ts[2 * side + k] = g.t[k];
    }
}

inline void RenderTriangle(const Modes& m, const Triangle_s& t) {
    if (m.colourWrite && !m_pColourBuffer) return;
    if (m.depthTest && !m_pDepthBuffer) return;
    for (int i = 0; i < 3; ++i)
        for (int k = 0; k < 3; ++k)
            if (!finite_bits(lane(t.m_Positions[i], k))) return;
    Clip clip;
    if (!CurrentClip(m.shade == -1, clip)) return;
    float y[3] = {lane(t.m_Positions[0], 1), lane(t.m_Positions[1], 1), lane(t.m_Positions[2], 1)};
    int iT = 0, iM = 1, iB = 2;
    if (y[1] < y[0]) {
        iT = 1;
        iM = 0;
    }
    if (y[2] < y[iT]) {
        iB = iM;
        iM = iT;
        iT = 2;
    } else if (y[2] < y[iM]) {
        iB = iM;
        iM = 2;
    }
    int yT = trunc_i(clamp_coord(y[iT])), yM = trunc_i(clamp_coord(y[iM])), yB = trunc_i(clamp_coord(y[iB]));
    if (yB <= clip.y0 || yT >= clip.y1 || yT == yB) return;
    float rL = rcp(vmax(float(yB - yT), 1e-6f)), rU = rcp(vmax(float(yM - yT), 1e-6f)),
          rD = rcp(vmax(float(yB - yM), 1e-6f));
    Vtx T = {}, M = {}, B = {};
    LoadVertex(m, t, iT, T);
    LoadVertex(m, t, iM, M);
    LoadVertex(m, t, iB, B);
    Vtx gL = {}, gU = {}, gD = {};
    auto grad = [](const float* a, const float* b, float r, float* out) {
        for (int k = 0; k < 4; ++k) out[k] = (b[k] - a[k]) * r;
    };
    grad(T.p, B.p, rL, gL.p);
    grad(T.p, M.p, rU, gU.p);
    grad(M.p, B.p, rD, gD.p);
    grad(T.c, B.c, rL, gL.c);
    grad(T.c, M.c, rU, gU.c);
    grad(M.c, B.c, rD, gD.c);
    grad(T.f, B.f, rL, gL.f);
    grad(T.f, M.f, rU, gU.f);
    grad(M.f, B.f, rD, gD.f);
    grad(T.t, B.t, rL, gL.t);
    grad(T.t, M.t, rU, gU.t);
    grad(M.t, B.t, rD, gD.t);
    grad(T.w, B.w, rL, gL.w);
    grad(T.w, M.w, rU, gU.w);
    grad(M.w, B.w, rD, gD.w);
    bool longLeft = gU.p[0] > gL.p[0];

    int start = yT > clip.y0 ? yT : clip.y0;
    int end = yM < clip.y1 ? yM : clip.y1;
    int count = end - start;
    float skip = float(start - yT);
    auto advance = [](const Vtx& a, const Vtx& g, float k) {
        Vtx r = {};
        for (int i = 0; i < 4; ++i) {
            r.p[i] = a.p[i] + g.p[i] * k;
            r.c[i] = a.c[i] + g.c[i] * k;
            r.f[i] = a.f[i] + g.f[i] * k;
            r.t[i] = a.t[i] + g.t[i] * k;
            r.w[i] = a.w[i] + g.w[i] * k;
        }
        return r;
    };
    Vtx sL = advance(T, gL, skip), sU = advance(T, gU, skip);
    Half h;
    std::memset(&h, 0, sizeof h);
    h.row = start;
    h.count = count;
    SetSide(h, longLeft ? 0 : 1, sL, gL);
    SetSide(h, longLeft ? 1 : 0, sU, gU);
    int row = start, carried = 0;
    if (count >= 1) {
        Rows(m, t, h, clip);
        row = end;
    } else {
        carried = -count;
    }
    int end2 = yB < clip.y1 ? yB : clip.y1;
    int count2 = end2 - row;
    if (count2 <= 0) return;
    Vtx s = advance(M, gD, float(carried));
    SetSide(h, longLeft ? 1 : 0, s, gD);
    h.row = row;
    h.count = count2;
    Rows(m, t, h, clip);
}

}  // namespace rastref
