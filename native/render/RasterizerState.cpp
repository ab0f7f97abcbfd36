#include "render/RasterizerState.h"

namespace Rasterizer_n {

unsigned int* m_pColourBuffer = nullptr;
float* m_pDepthBuffer = nullptr;
int m_ScreenPitch = 0;
int m_TargetWidth = 0;
int m_TargetHeight = 0;
float m_ZNear = 0.0f;
float m_ZFar = 0.0f;
int m_ZWriteEnabled = 1;
float m_DistanceFogStart = 1.0f;
float m_InvDistanceFogRange = 0.0f;
alignas(16) __m128 m_DistanceFogColour = {0, 0, 0, 0};
alignas(16) __m128 m_HeightFogColour = {0, 0, 0, 0};
alignas(16) __m128i m_TriangleCuller = {0, 0};
Viewport_s m_Viewport = {0, 0, 0, 0, 0.0f, 0.0f};
alignas(16) __m128 m_ViewportMul = {0, 0, 0, 0};
alignas(16) __m128 m_ViewportAdd = {0, 0, 0, 0};

void SetTarget(unsigned int* colour, float* depth, int pitch, int width, int height) {
    m_pColourBuffer = colour;
    m_pDepthBuffer = depth;
    m_ScreenPitch = pitch;
    m_TargetWidth = width;
    m_TargetHeight = height;
}

void SetZWrite(bool enabled) { m_ZWriteEnabled = enabled ? 1 : 0; }

Viewport_s* GetViewport() { return &m_Viewport; }

void SetViewport(const Viewport_s& vp) {
    m_Viewport = vp;
    float hw = float(vp.Width) * 0.5f;
    float hh = float(vp.Height) * 0.5f;
    float hz = (vp.MaxZ - vp.MinZ) * 0.5f;
    m_ViewportMul = _mm_setr_ps(hw, hh, hz, 1.0f);
    m_ViewportAdd = _mm_setr_ps(hw + float(vp.X), hh + float(vp.Y), hz + vp.MinZ, 0.0f);
    RecomputeCuller();
}

void RecomputeCuller() {
    const Viewport_s& vp = m_Viewport;
    short lanes[8];
    lanes[0] = short(unsigned(vp.X + vp.Width) & 0xFFFF);
    lanes[1] = short(unsigned(vp.Y + vp.Height) & 0xFFFF);
    // cvttss gives 0x80000000 for values out of range instead of undefined behaviour
    lanes[2] = short(unsigned(_mm_cvttss_si32(_mm_set_ss(vp.MaxZ * 32767.0f))) & 0xFFFF);
    lanes[3] = short(unsigned(_mm_cvttss_si32(_mm_set_ss(vp.MinZ * 32767.0f))) & 0xFFFF);
    lanes[4] = short(unsigned(vp.X) & 0xFFFF);
    lanes[5] = short(unsigned(vp.Y) & 0xFFFF);
    lanes[6] = 0;
    lanes[7] = 0;
    m_TriangleCuller = _mm_loadu_si128(reinterpret_cast<const __m128i*>(lanes));
}

__m128 ColourToFogVector(unsigned int colour) {
    return _mm_setr_ps(float(int((colour & 0xFF) * 256)), float(int(((colour >> 8) & 0xFF) * 256)),
                       float(int(((colour >> 16) & 0xFF) * 256)), float(int(((colour >> 24) & 0xFF) * 256)));
}

void RecomputeDistanceFogParams(float start, unsigned int colour) {
    m_DistanceFogStart = start;
    m_InvDistanceFogRange = float(1.0L / (1.0L - (long double)start));
    m_DistanceFogColour = ColourToFogVector(colour);
}

}  // namespace Rasterizer_n
