// The toolkit's offscreen target: a sprite as colour buffer and a depth buffer.
#include "jni/Exception.h"
#include "render/DepthBuffer.h"
#include "render/RasterizerState.h"
#include "render/toolkit.h"
#include "sprite/Sprite.h"

void toolkit::start_offscreen_render(Sprite_c* sprite, DepthBuffer_c* depth) {
    if (sprite && (sprite->Width > 0x7FFFFFFFu || sprite->Height > 0x7FFFFFFFu || sprite->Pitch < sprite->Width))
        throw new IllegalArgumentException("bad sprite target");
    if (depth && depth->Width > 0x7FFFFFFFu) throw new IllegalArgumentException("bad depth target");
    // The rasteriser addresses the depth buffer with the colour target's row
    // stride, so the depth buffer must hold every pixel of the sprite.
    if (sprite && depth && sprite->Width > 0 && sprite->Height > 0) {
        long long need = (long long)(sprite->Height - 1) * sprite->Pitch + sprite->Width;
        if ((long long)depth->Width * depth->Height < need)
            throw new IllegalArgumentException("depth buffer smaller than the sprite");
    }

    m_OffscreenSprite = sprite;
    m_OffscreenDepth = depth;
    int pitch;
    if (sprite) {
        m_ColourBuffer = sprite->Pixels;
        m_Width = int(sprite->Width);
        m_Height = int(sprite->Height);
        pitch = int(sprite->Pitch);
    } else {
        m_ColourBuffer = nullptr;
        pitch = 0;
    }
    if (depth) {
        m_DepthBuffer = depth->Data;
        if (!sprite) {
            pitch = int(depth->Width);
            m_Width = int(depth->Width);
            m_Height = int(depth->Height);
        }
    } else {
        m_DepthBuffer = nullptr;
    }
    if (!sprite && !depth) m_Width = m_Height = 0;
    Rasterizer_n::SetTarget(m_ColourBuffer, m_DepthBuffer, pitch, m_Width, m_Height);
    resetclipping();
    resetviewport();
}
