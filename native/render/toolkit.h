// The render context: exactly one exists while the Java toolkit peer lives,
// reached through toolkit::m_pInstance.
#pragma once

#include <emmintrin.h>

#include "render/Matrix.h"
#include "render/RasterizerState.h"
#include "render/callbacks.h"
#include "util/memorymanager/linkable.h"

class memorymanager;
class texturecache;
struct texturemetrics;
struct textureslot;
class Sprite_c;
class DepthBuffer_c;
class canvas;
class clippingmask;
class threadresource;

class alignas(16) toolkit {
public:
    // Allocated with _aligned_malloc (16-byte) by create(); destroy() frees it.
    // `callbacks` is owned by the toolkit from here on (may be null in tests
    // that never call back). A texture cache is created when `withTextures`.
    static toolkit* create(toolkit_callbacks* callbacks, bool withTextures, int texturearg);
    static void destroy(toolkit* tk);

    toolkit(toolkit_callbacks* callbacks, bool withTextures, int texturearg);
    ~toolkit();

    static toolkit* m_pInstance;

    // --- callbacks into Java ---
    bool request_texture(unsigned short id);
    void garbagecollect();
    void* createshadow();

    // --- targets and viewport ---
    void setup_backbuffer(unsigned int* colour, float* depth, int width, int height, int pitch);
    void set_active_canvas(canvas* c);
    void start_offscreen_render(Sprite_c* sprite, DepthBuffer_c* depth);
    void resetviewport();

    // --- camera, projection, fog ---
    void set_camera(const Matrix_c& m);
    void set_projection(const Matrix_c& m);
    void set_fog(unsigned int colour, int distance);
    void underwatermode_enable(int start, unsigned int colour, int depth, int fourth);
    void underwatermode_adjust(int start, unsigned int colour, int depth, int fourth);
    void underwatermode_disable();
    void set_zwrite(bool on);

    // --- lights and shadows ---
    void set_globalsun(int colour, float front, float back, float x, float y, float z);
    void set_globalambient(float ambient);
    // lights: 5 ints per light (x, y, z, radius, colour); intensities: one float per light
    void set_pointlights(int count, const int* lights, const float* intensities);
    void set_shadow_resolution(int n);

    // --- clipping ---
    void setclipping(int left, int top, int right, int bottom);
    void setsubclipping(int left, int top, int right, int bottom);
    void resetclipping();
    void getclipping(int* out) const;

    // --- 2D primitives (mode: 0 replace, 1 blend, 2 add) ---
    void rect_fill(int x, int y, int w, int h, unsigned int colour, unsigned int mode);
    void cls(unsigned int colour);
    void zbuffer_clear(int x, int y, int w, int h, float value);
    void line_h(int x, int y, int length, unsigned int colour, unsigned int mode);
    void line_v(int x, int y, int length, unsigned int colour, unsigned int mode);
    void line(int x1, int y1, int x2, int y2, unsigned int colour, unsigned int mode);
    void circle_fill(int cx, int cy, float depth, int radius, unsigned int colour, unsigned int mode);
    void circle_outline(int cx, int cy, int depth, int radius, unsigned int colour, unsigned int mode);
    void cls_masked(unsigned int colour, clippingmask& mask, int maskx, int masky);
    void line(int x1, int y1, int x2, int y2, unsigned int colour, unsigned int mode, clippingmask& mask,
              int maskx, int masky);
    void line_thick(threadresource& tr, int x1, int y1, int x2, int y2, unsigned int colour, int thickness,
                    unsigned int mode);
    // out must hold w*h ints (element j*w + i is pixel (x+i, y+j)). Both copy
    // only the part of the rectangle inside the target; getarea throws
    // Exception "No colour buffer" without a colour buffer.
    void getarea(int x, int y, int w, int h, int* out);
    void setarea(int x, int y, int w, int h, const int* in, int offset, int stride);

    // --- textures ---
    void service(int ms);
    // 128 x 128 ARGB pixels into the texture cache (IllegalStateException
    // when the toolkit was created without one).
    void upload_texture(unsigned short id, const int* pixels, const texturemetrics& m);
    void upload_texturemetrics(unsigned short id, const texturemetrics& m);
    // The cache's gettex / getmetrics; null without a cache.
    textureslot* gettex(unsigned short id);
    texturemetrics* getmetrics(unsigned short id);
    void quit() { m_Quitting = true; }

    // Scroll colour and depth buffers by dy*width + dx pixels (linear offset).
    void scroll(int dx, int dy);

    // --- fields (public: the renderer reads them directly) ---
    bool m_Quitting = false;
    toolkit_callbacks* m_Callbacks = nullptr;
    int m_ThreadMode = 1;
    memorymanager* m_MemoryPool = nullptr;
    texturecache* m_Textures = nullptr;
    linkable m_Threads;

    int m_Width = 0, m_Height = 0;
    unsigned int* m_ColourBuffer = nullptr;
    float* m_DepthBuffer = nullptr;
    Sprite_c* m_OffscreenSprite = nullptr;
    DepthBuffer_c* m_OffscreenDepth = nullptr;
    int m_ClipLeft = 0, m_ClipTop = 0, m_ClipRight = 0, m_ClipBottom = 0;

    float m_SunDirection[3] = {0, 0, 0};
    unsigned char m_SunColour[3] = {0, 0, 0};  // red, green, blue
    float m_SunFrontScale = 0.69921875f;
    float m_SunBackScale = 1.2f;
    float m_Ambient = 1.15234375f;

    Matrix_c m_Camera;
    Matrix_c m_Projection;
    Matrix_c m_ViewProjection;
    __m128 m_Frustum[6];

    float m_FogDistance = 255.0f;
    bool m_ZWrite = true;
    unsigned int m_FogColour = 0;
    unsigned int m_SavedFogColour = 0;
    bool m_Underwater = false;
    int m_UnderwaterStart = 0, m_UnderwaterDepth = 0;
    float m_HeightFogStart = 0.0f;
    float m_HeightFogScale = 0.0f;

    int m_ShadowStepX = 0, m_ShadowStepZ = 0;
    int m_ShadowResolution = 8;
    int m_ShadowResolutionShift = 3;

    int m_PointLightCount = 0;
    __m128 m_PointLightPositions[4];
    float m_PointLightScales[4] = {0, 0, 0, 0};
    unsigned int m_PointLightColours[4] = {0, 0, 0, 0};

private:
    toolkit(const toolkit&) = delete;
    toolkit& operator=(const toolkit&) = delete;
    void apply_viewport_rect(int width, int height);
};
