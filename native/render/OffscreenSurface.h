// Copies between an offscreen pair (a sprite and a depth buffer) and the
// toolkit's current target, used by Java to save and restore rectangles of
// colour and depth.
#pragma once

class toolkit;
class Sprite_c;
class DepthBuffer_c;

class OffscreenSurface_c {
public:
    // Copies the w x h rectangle at (srcX, srcY) of the pair to (dstX, dstY) of
    // the current target: colour from the sprite when `colour`, depth from the
    // depth buffer when `depth`. A part that is missing on either side (no
    // sprite, no depth buffer, a target without colour or depth) is skipped.
    // Each surface is addressed with its own row stride (sprite pitch, depth
    // buffer width, target width), and each copy is clipped to both of its
    // surfaces.
    static void BlitToFramebuffer(toolkit& tk, Sprite_c* sprite, DepthBuffer_c* depthbuffer, int srcX, int srcY,
                                  int w, int h, int dstX, int dstY, bool colour, bool depth);
    // The same from the current target at (srcX, srcY) into the pair at (dstX, dstY).
    static void BlitFromFramebuffer(toolkit& tk, Sprite_c* sprite, DepthBuffer_c* depthbuffer, int srcX, int srcY,
                                    int w, int h, int dstX, int dstY, bool colour, bool depth);

    // Called before a sprite or depth buffer is destroyed: if it is part of the
    // current target, the toolkit and the rasteriser stop pointing at it (the
    // target then has no colour, or no depth, buffer).
    static void Forget(toolkit& tk, const Sprite_c* sprite, const DepthBuffer_c* depthbuffer);
};
