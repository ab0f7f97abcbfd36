#include "render/toolkit.h"

#include <pmmintrin.h>
#include <xmmintrin.h>

#include <cmath>
#include <cstdint>
#include <cstring>
#include <new>

#include "jni/Exception.h"
#include "render/canvas.h"
#include "render/colourutils.h"
#include "render/mymath.h"
#include "texture/texturecache.h"
#include "util/memorymanager/aligned.h"

toolkit* toolkit::m_pInstance = nullptr;

toolkit* toolkit::create(toolkit_callbacks* callbacks, bool withTextures, int texturearg) {
    void* mem = _aligned_malloc(sizeof(toolkit), 16);
    try {
        return new (mem) toolkit(callbacks, withTextures, texturearg);
    } catch (...) {
        _aligned_free(mem);
        throw;
    }
}

void toolkit::destroy(toolkit* tk) {
    if (!tk) return;
    tk->~toolkit();
    _aligned_free(tk);
}

toolkit::toolkit(toolkit_callbacks* callbacks, bool withTextures, int texturearg) : m_Callbacks(callbacks) {
    m_Threads.init_head();
    for (int i = 0; i < 6; ++i) m_Frustum[i] = _mm_setzero_ps();
    for (int i = 0; i < 4; ++i) m_PointLightPositions[i] = _mm_setzero_ps();
    mymath::init();
    colourutils::init();
    if (withTextures) m_Textures = texturecache::create(this, texturearg);
    // flush-to-zero and denormals-are-zero on the constructing thread
    _mm_setcsr(_mm_getcsr() | 0x8040);
}

toolkit::~toolkit() {
    if (m_Textures) {
        texturecache::destroy(m_Textures);
        m_Textures = nullptr;
    }
    delete m_Callbacks;
    m_Callbacks = nullptr;
}

bool toolkit::request_texture(unsigned short id) { return m_Callbacks && m_Callbacks->request_texture(id); }

void toolkit::garbagecollect() {
    if (m_Callbacks) m_Callbacks->garbagecollect();
}

void* toolkit::createshadow() { return m_Callbacks ? m_Callbacks->createshadow() : nullptr; }

// --- targets and viewport -------------------------------------------------

void toolkit::apply_viewport_rect(int width, int height) {
    Rasterizer_n::Viewport_s vp = *Rasterizer_n::GetViewport();
    vp.X = 0;
    vp.Y = 0;
    vp.Width = width;
    vp.Height = height;
    Rasterizer_n::SetViewport(vp);
}

void toolkit::setup_backbuffer(unsigned int* colour, float* depth, int, int, int pitch) {
    Rasterizer_n::SetTarget(colour, depth, pitch, m_Width, m_Height);
    apply_viewport_rect(m_Width, m_Height);
}

static void stream_fill(void* dst, unsigned int value, long long count) {
    unsigned int* p = static_cast<unsigned int*>(dst);
    while (count > 0 && (reinterpret_cast<uintptr_t>(p) & 15)) {
        *p++ = value;
        --count;
    }
    __m128i v = _mm_set1_epi32(int(value));
    for (; count >= 4; count -= 4, p += 4) _mm_stream_si128(reinterpret_cast<__m128i*>(p), v);
    while (count-- > 0) *p++ = value;
    _mm_sfence();
}

void toolkit::set_active_canvas(canvas* c) {
    m_OffscreenSprite = nullptr;
    m_OffscreenDepth = nullptr;
    if (!c) {
        // No target: a zero-sized one with an empty clip, so that drawing
        // before the next activation writes nothing through the null buffers.
        Rasterizer_n::SetTarget(nullptr, nullptr, 0, 0, 0);
        m_ColourBuffer = nullptr;
        m_DepthBuffer = nullptr;
        m_Width = 0;
        m_Height = 0;
        resetclipping();
        apply_viewport_rect(m_Width, m_Height);
        return;
    }
    m_ColourBuffer = c->colourbuffer();
    m_DepthBuffer = c->depthbuffer();
    m_Width = c->width();
    m_Height = c->height();
    resetclipping();
    setup_backbuffer(m_ColourBuffer, m_DepthBuffer, m_Width, m_Height, m_Width);
    // The clip is the whole buffer here, so both clears are one linear pass.
    long long n = (long long)m_Width * m_Height;
    if (m_ColourBuffer) stream_fill(m_ColourBuffer, 0u, n);
    if (m_DepthBuffer) {
        const float far = 3.4e38f;
        unsigned int bits;
        __builtin_memcpy(&bits, &far, 4);
        stream_fill(m_DepthBuffer, bits, n);
    }
}

void toolkit::resetviewport() { apply_viewport_rect(m_Width, m_Height); }

// --- camera, projection, fog ----------------------------------------------

void toolkit::set_camera(const Matrix_c& m) {
    m_Camera = m;
    m_ViewProjection = m_Camera.Multiply(m_Projection);
    m_ViewProjection.ExtractFrustumPlanes(m_Frustum);
}

void toolkit::set_projection(const Matrix_c& m) {
    m_Projection = m;
    m_ViewProjection = m_Camera.Multiply(m_Projection);
    m_ViewProjection.ExtractFrustumPlanes(m_Frustum);
    __m128 planes[6];
    m_Projection.ExtractFrustumPlanes(planes);
    alignas(16) float farPlane[4], nearPlane[4];
    _mm_store_ps(farPlane, planes[5]);
    _mm_store_ps(nearPlane, planes[4]);
    Rasterizer_n::m_ZFar = farPlane[3];
    Rasterizer_n::m_ZNear = -nearPlane[3];
    set_fog(m_FogColour, int(m_FogDistance));
}

void toolkit::set_fog(unsigned int colour, int distance) {
    m_FogColour = colour;
    m_FogDistance = distance < 0 ? 0.0f : float(distance);
    __m128 clip = m_Projection.TransformPoint(0.0f, 0.0f, Rasterizer_n::m_ZFar - m_FogDistance);
    __m128 screen = Rasterizer_n::ToScreen(clip);
    alignas(16) float s[4];
    _mm_store_ps(s, screen);
    Rasterizer_n::RecomputeDistanceFogParams(s[2], colour);
}

void toolkit::underwatermode_adjust(int start, unsigned int colour, int depth, int) {
    m_UnderwaterStart = start;
    m_UnderwaterDepth = depth;
    m_FogColour = colour;
    m_HeightFogStart = float(start);
    m_HeightFogScale = -1.0f / float(depth);
    Rasterizer_n::m_HeightFogColour = Rasterizer_n::ColourToFogVector(colour);
}

void toolkit::underwatermode_enable(int start, unsigned int colour, int depth, int fourth) {
    m_SavedFogColour = m_FogColour;
    m_Underwater = true;
    underwatermode_adjust(start, colour, depth, fourth);
}

void toolkit::underwatermode_disable() {
    m_Underwater = false;
    m_FogColour = m_SavedFogColour;
}

void toolkit::set_zwrite(bool on) {
    m_ZWrite = on;
    Rasterizer_n::SetZWrite(on);
}

// --- lights and shadows ---------------------------------------------------

void toolkit::set_globalsun(int colour, float front, float back, float x, float y, float z) {
    m_SunColour[0] = (unsigned char)((colour >> 16) & 0xFF);
    m_SunColour[1] = (unsigned char)((colour >> 8) & 0xFF);
    m_SunColour[2] = (unsigned char)(colour & 0xFF);
    m_SunFrontScale = front;
    m_SunBackScale = back;
    float inv = 1.0f / sqrtf(x * x + y * y + z * z);
    m_SunDirection[0] = x * inv;
    m_SunDirection[1] = y * inv;
    m_SunDirection[2] = z * inv;
    // Truncating conversions; out-of-range values (a sun on the horizon) give
    // the integer indefinite value instead of undefined behaviour.
    m_ShadowStepX = _mm_cvttss_si32(_mm_set_ss(256.0f * m_SunDirection[0] / m_SunDirection[1]));
    m_ShadowStepZ = _mm_cvttss_si32(_mm_set_ss(256.0f * m_SunDirection[2] / m_SunDirection[1]));
}

void toolkit::set_globalambient(float ambient) { m_Ambient = ambient; }

void toolkit::set_pointlights(int count, const int* lights, const float* intensities) {
    if (count > 4) count = 4;
    m_PointLightCount = count;
    for (int i = 0; i < count; ++i) {
        const int* l = lights + 5 * i;
        m_PointLightPositions[i] = _mm_setr_ps(float(l[0]), float(l[1]), float(l[2]), 0.0f);
        unsigned int r2 = unsigned(l[3]) * unsigned(l[3]);  // 32-bit product, wraps like the integer square
        float intensity = intensities[i] < 1.0f ? intensities[i] : 1.0f;
        m_PointLightScales[i] = intensity * float(int(r2)) * 256.0f;
        m_PointLightColours[i] = unsigned(l[4]);
    }
}

void toolkit::set_shadow_resolution(int n) {
    int shift = 0;
    while (n > 1) {
        n >>= 1;
        ++shift;
    }
    m_ShadowResolutionShift = shift;
    m_ShadowResolution = 1 << shift;
}

// --- clipping -------------------------------------------------------------

void toolkit::setclipping(int left, int top, int right, int bottom) {
    m_ClipLeft = left < 0 ? 0 : left;
    m_ClipTop = top < 0 ? 0 : top;
    m_ClipRight = right > m_Width ? m_Width : right;
    m_ClipBottom = bottom > m_Height ? m_Height : bottom;
}

void toolkit::setsubclipping(int left, int top, int right, int bottom) {
    if (left > m_ClipLeft) m_ClipLeft = left;
    if (top > m_ClipTop) m_ClipTop = top;
    if (right < m_ClipRight) m_ClipRight = right;
    if (bottom < m_ClipBottom) m_ClipBottom = bottom;
}

void toolkit::resetclipping() {
    m_ClipLeft = 0;
    m_ClipTop = 0;
    m_ClipRight = m_Width;
    m_ClipBottom = m_Height;
}

void toolkit::getclipping(int* out) const {
    out[0] = m_ClipLeft;
    out[1] = m_ClipTop;
    out[2] = m_ClipRight;
    out[3] = m_ClipBottom;
}

// --- other ----------------------------------------------------------------

// Content moves by o elements (towards higher addresses for o > 0); elements
// not overwritten keep their values. memmove gives exactly the element-wise
// copy in the safe direction.
template <class T>
static void scroll_linear(T* p, long long n, long long o) {
    if (!p || o == 0) return;
    if (o >= n || -o >= n) return;  // nothing of the buffer stays inside it
    if (o < 0)
        std::memmove(p, p - o, size_t(n + o) * sizeof(T));
    else
        std::memmove(p + o, p, size_t(n - o) * sizeof(T));
}

void toolkit::scroll(int dx, int dy) {
    long long n = (long long)m_Width * m_Height;
    long long o = (long long)dy * m_Width + dx;
    scroll_linear(m_ColourBuffer, n, o);
    scroll_linear(m_DepthBuffer, n, o);
}

void toolkit::service(int ms) {
    if (m_Textures) m_Textures->service(ms);
}

// --- textures ---------------------------------------------------------------

static texturecache& need_textures(texturecache* t) {
    if (!t) throw new IllegalStateException("toolkit has no texture cache");
    return *t;
}

void toolkit::upload_texture(unsigned short id, const int* pixels, const texturemetrics& m) {
    need_textures(m_Textures).upload_texture(id, pixels, m);
}

void toolkit::upload_texturemetrics(unsigned short id, const texturemetrics& m) {
    need_textures(m_Textures).upload_texturemetrics(id, m);
}

textureslot* toolkit::gettex(unsigned short id) { return m_Textures ? m_Textures->gettex(id) : nullptr; }

texturemetrics* toolkit::getmetrics(unsigned short id) { return m_Textures ? m_Textures->getmetrics(id) : nullptr; }
