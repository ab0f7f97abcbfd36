#include "render/OffscreenSurface.h"

#include <cstdint>
#include <cstring>

#include "render/DepthBuffer.h"
#include "render/RasterizerState.h"
#include "render/blitclip.h"
#include "render/toolkit.h"
#include "sprite/Sprite.h"

// Copies a clipped w x h block of 32-bit values between two row-strided surfaces.
template <class T>
static void copy_block(T* src, long long srcStride, long long srcW, long long srcH, T* dst, long long dstStride,
                       long long dstW, long long dstH, int srcX, int srcY, int w, int h, int dstX, int dstY) {
    BlitRect_s r = {srcX, srcY, dstX, dstY, w, h};
    if (!ClipBlit(r, srcW, srcH, dstW, dstH)) return;
    const T* s = src + r.sy * srcStride + r.sx;
    T* d = dst + r.dy * dstStride + r.dx;
    for (int j = 0; j < r.h; ++j, s += srcStride, d += dstStride) std::memmove(d, s, size_t(r.w) * sizeof(T));
}

void OffscreenSurface_c::BlitToFramebuffer(toolkit& tk, Sprite_c* sprite, DepthBuffer_c* depthbuffer, int srcX,
                                           int srcY, int w, int h, int dstX, int dstY, bool colour, bool depth) {
    if (colour && tk.m_ColourBuffer && sprite && sprite->Pixels)
        copy_block(sprite->Pixels, sprite->Pitch, sprite->Width, sprite->Height, tk.m_ColourBuffer, tk.m_Width,
                   tk.m_Width, tk.m_Height, srcX, srcY, w, h, dstX, dstY);
    if (depth && tk.m_DepthBuffer && depthbuffer && depthbuffer->Data)
        copy_block(depthbuffer->Data, depthbuffer->Width, depthbuffer->Width, depthbuffer->Height, tk.m_DepthBuffer,
                   tk.m_Width, tk.m_Width, tk.m_Height, srcX, srcY, w, h, dstX, dstY);
}

void OffscreenSurface_c::BlitFromFramebuffer(toolkit& tk, Sprite_c* sprite, DepthBuffer_c* depthbuffer, int srcX,
                                             int srcY, int w, int h, int dstX, int dstY, bool colour, bool depth) {
    if (colour && tk.m_ColourBuffer && sprite && sprite->Pixels)
        copy_block(tk.m_ColourBuffer, tk.m_Width, tk.m_Width, tk.m_Height, sprite->Pixels, sprite->Pitch,
                   sprite->Width, sprite->Height, srcX, srcY, w, h, dstX, dstY);
    if (depth && tk.m_DepthBuffer && depthbuffer && depthbuffer->Data)
        copy_block(tk.m_DepthBuffer, tk.m_Width, tk.m_Width, tk.m_Height, depthbuffer->Data, depthbuffer->Width,
                   depthbuffer->Width, depthbuffer->Height, srcX, srcY, w, h, dstX, dstY);
}

void OffscreenSurface_c::Forget(toolkit& tk, const Sprite_c* sprite, const DepthBuffer_c* depthbuffer) {
    if (sprite && tk.m_OffscreenSprite == sprite) {
        tk.m_OffscreenSprite = nullptr;
        tk.m_ColourBuffer = nullptr;
        Rasterizer_n::m_pColourBuffer = nullptr;
    }
    if (depthbuffer && tk.m_OffscreenDepth == depthbuffer) {
        tk.m_OffscreenDepth = nullptr;
        tk.m_DepthBuffer = nullptr;
        Rasterizer_n::m_pDepthBuffer = nullptr;
    }
}
