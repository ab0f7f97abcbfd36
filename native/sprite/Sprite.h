// Sprite_c: a 32-bit ARGB image with a row pitch and four trim offsets that
// record how much transparent border was cut away around the stored pixels.
// Sprites are built from Java arrays or from the current colour buffer, drawn
// by the blitters (SpriteRender.h) and used as offscreen colour targets.
#pragma once

#include <cstdint>

class toolkit;
class clippingmask;

class Sprite_c {
public:
    // What is done to each source pixel with the parameter colour col.
    enum ColourOp_e {
        ColourOp_Modulate = 0,  // src x col >> 8 per channel
        ColourOp_None = 1,
        ColourOp_Tint = 2,      // (src x a >> 8) + (col x (255 - a) >> 8), a = alpha of col
        ColourOp_Add = 3,       // min(src + col, 255)
        ColourOp_Subtract = 4,  // max(src - col, 0)
    };
    // How the (operated) source pixel meets the destination.
    enum BlendMode_e {
        SpriteBlend_Replace = 0,
        SpriteBlend_Alpha = 1,  // (src x A + dst x (256 - A)) >> 8 per channel, A = source alpha
        SpriteBlend_Add = 2,    // min(src + dst, 255) per channel
    };

    struct RenderParams_s {
        int32_t x;  // destination of the full (untrimmed) box
        int32_t y;
        float depth;      // depth-tested variants
        uint32_t colour;  // col of the colour operation
        int32_t width;    // destination size (scaled and tiled variants)
        int32_t height;
        const clippingmask* mask;  // masked variants
        int32_t maskx;
        int32_t masky;
    };

    // Corners P0 = (x0, y0) (top-left of the full box), P1 = (x1, y1)
    // (top-right) and P2 = (x2, y2) (bottom-left).
    struct ParallelogramRenderParams_s {
        float x0, x1, x2;
        float y0, y1, y2;
        int32_t unused;
        uint32_t colour;
        const clippingmask* mask;
        int32_t maskx;
        int32_t masky;
    };

    // Axis-aligned drawing into the toolkit's current colour buffer, clipped
    // to its clipping rectangle. Switches: Scaled (the full box drawn at
    // width x height, nearest sampling), Masked (confined to the clipping mask
    // placed at (maskx, masky)), ColourWrite (false: nothing is written),
    // DepthTest (drawn only where depth <= the depth buffer value; the depth
    // buffer is not written).
    template <int Op, int Blend, bool Scaled, bool Masked, bool ColourWrite, bool DepthTest>
    void Render(toolkit& tk, const RenderParams_s& p) const;
    // Repeats the sprite from (x, y) over width x height.
    template <int Op, int Blend>
    void RenderTiled(toolkit& tk, const RenderParams_s& p) const;
    // Maps the sprite onto a parallelogram (rotation, shear, scale).
    template <int Op, int Blend, bool Masked>
    void RenderParallelogram(toolkit& tk, const ParallelogramRenderParams_s& p) const;

    // Entry-level dispatch: the instantiation for (op, blend) is chosen once;
    // an op outside 0-4 or a blend outside 0-2 draws nothing.
    void Draw(toolkit& tk, int op, int blend, const RenderParams_s& p) const;
    void DrawScaled(toolkit& tk, int op, int blend, const RenderParams_s& p) const;
    // Scaled and depth-tested when the target has a depth buffer (without a
    // colour buffer nothing is written); plain scaled without one.
    void DrawScaledDepth(toolkit& tk, int op, int blend, const RenderParams_s& p) const;
    void DrawTiled(toolkit& tk, int op, int blend, const RenderParams_s& p) const;
    void DrawParallelogram(toolkit& tk, int op, int blend, const ParallelogramRenderParams_s& p) const;
    // Unscaled, colour unchanged, alpha-blended, confined to p.mask (a null
    // mask confines nothing).
    void DrawMasked(toolkit& tk, const RenderParams_s& p) const;
    // Colour unchanged, replaced or alpha-blended, confined to p.mask.
    void DrawParallelogramMasked(toolkit& tk, bool replace, const ParallelogramRenderParams_s& p) const;

    Sprite_c();
    ~Sprite_c();

    // Releases any previous block, then allocates width x height pixels
    // (16-byte aligned, contents undefined) and sets Pitch = width. Sizes whose
    // byte count does not fit in 32 bits, or a dimension above 2^31 - 1, throw
    // IllegalArgumentException; allocation failure throws RuntimeException
    // with the system's text. After any failure the sprite holds no pixels and
    // has size 0 x 0.
    void Allocate(uint32_t width, uint32_t height);

    // Makes the sprite show pixels it does not own (a texture slot, a caller's
    // buffer). They are never freed by the sprite; Release() or the destructor
    // only forgets them.
    void WrapForeign(uint32_t* pixels, uint32_t width, uint32_t height, uint32_t pitch);

    // Frees owned pixels (or forgets foreign ones); size becomes 0 x 0.
    void Release();

    // Conversions (row strides in pixels; rows of the sprite advance by Pitch):
    //   key false: words copied unchanged
    //   key true:  0 stays 0, any other word gets alpha 0xFF
    // Copy fills the whole sprite; the source must hold Width x Height pixels.
    void Copy(const uint32_t* source, int stride, bool key);
    // Fills the w x h rectangle at (x, y). The rectangle is clipped to the
    // sprite; source pixels of the clipped-away part are not read.
    void CopyRect(int x, int y, uint32_t w, uint32_t h, const uint32_t* source, int stride, bool key);
    // Replaces the alpha byte of each pixel: channel 0, 1, 2 take the source's
    // red, green, blue byte; channel 3 gives 0xFF for a non-zero source word and
    // 0 otherwise. Other channel values throw IllegalArgumentException.
    void CopyAlpha(const uint32_t* source, int stride, uint32_t channel);
    void CopyRectAlpha(int x, int y, uint32_t w, uint32_t h, const uint32_t* source, int stride, uint32_t channel);
    // Palettised fill of the whole sprite. Without alpha: index 0 is
    // transparent (0), index i is palette[i] with alpha 0xFF. With alpha:
    // (palette[index] & 0xFFFFFF) | alpha << 24 for every index.
    void CopyFrom8Bit(const uint8_t* indices, const uint32_t* palette, const uint8_t* alpha, int stride);

    // Untrimmed size; computed in 64 bits so that odd offsets cannot overflow.
    long long FullWidth() const { return (long long)OffsetLeft + Width + OffsetRight; }
    long long FullHeight() const { return (long long)OffsetTop + Height + OffsetBottom; }

    int32_t OffsetLeft;
    int32_t OffsetTop;
    int32_t OffsetRight;
    int32_t OffsetBottom;
    uint32_t Width;
    uint32_t Height;
    uint32_t Pitch;
    uint32_t* Pixels;
    bool OwnsPixels;

private:
    Sprite_c(const Sprite_c&) = delete;
    Sprite_c& operator=(const Sprite_c&) = delete;
};

// Row routines behind the copies: SSE2 (scalar head to align the destination,
// four pixels per step, scalar tail) and a plain scalar reference of each.
namespace spriterows {
void copy_key(uint32_t* dst, const uint32_t* src, int n);
void copy_key_scalar(uint32_t* dst, const uint32_t* src, int n);
void copy_alpha(uint32_t* dst, const uint32_t* src, int n, uint32_t channel);
void copy_alpha_scalar(uint32_t* dst, const uint32_t* src, int n, uint32_t channel);
}  // namespace spriterows
