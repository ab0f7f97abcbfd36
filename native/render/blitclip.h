// Clipping of rectangle copies between two surfaces, and the checks that Java
// sizes and arrays get before pixels are copied.
#pragma once

#include "jni/Exception.h"

// A copy of w x h pixels from (sx, sy) of one surface to (dx, dy) of another.
struct BlitRect_s {
    int sx, sy;
    int dx, dy;
    int w, h;
};

// Cuts the copy down to the part that lies inside both a srcW x srcH source
// and a dstW x dstH destination; both corners move together. Returns false
// (and leaves r unspecified) when nothing remains. Arithmetic is 64-bit, so
// any int inputs are safe.
inline bool ClipBlit(BlitRect_s& r, long long srcW, long long srcH, long long dstW, long long dstH) {
    long long sx = r.sx, sy = r.sy, dx = r.dx, dy = r.dy, w = r.w, h = r.h;
    if (w <= 0 || h <= 0) return false;
    long long cut;
    cut = sx < 0 ? -sx : 0;
    if (dx + cut < 0) cut = -dx;
    sx += cut, dx += cut, w -= cut;
    cut = sy < 0 ? -sy : 0;
    if (dy + cut < 0) cut = -dy;
    sy += cut, dy += cut, h -= cut;
    if (sx + w > srcW) w = srcW - sx;
    if (dx + w > dstW) w = dstW - dx;
    if (sy + h > srcH) h = srcH - sy;
    if (dy + h > dstH) h = dstH - dy;
    if (w <= 0 || h <= 0) return false;
    r.sx = int(sx), r.sy = int(sy), r.dx = int(dx), r.dy = int(dy), r.w = int(w), r.h = int(h);
    return true;
}

// Sizes of images and result arrays coming from Java: negative sizes, or a
// byte count (w x h x 4) that does not fit in 32 bits, throw
// IllegalArgumentException.
inline void CheckImageSize(long long w, long long h) {
    if (w < 0 || h < 0) throw new IllegalArgumentException("negative size");
    // w x h x 4 > 0xFFFFFFFF, compared without overflowing
    if (w * h > 0x3FFFFFFFLL) throw new IllegalArgumentException("size too large");
}

// A w x h rectangle read from (or written to) a Java array at
// offset + row * stride + column must lie inside an array of `length`
// elements; otherwise ArrayIndexOutOfBoundsException with the first index
// outside it. Empty rectangles need nothing.
inline void CheckRectElements(long long w, long long h, long long offset, long long stride, long long length) {
    if (w <= 0 || h <= 0) return;
    long long lastRow = (h - 1) * stride;
    long long lo = offset + (lastRow < 0 ? lastRow : 0);
    long long hi = offset + (lastRow > 0 ? lastRow : 0) + w - 1;
    if (lo < 0) throw new ArrayIndexOutOfBoundsException(int(lo < -0x7FFFFFFFLL ? -0x7FFFFFFFLL : lo), int(length));
    if (hi >= length) throw new ArrayIndexOutOfBoundsException(int(hi > 0x7FFFFFFFLL ? 0x7FFFFFFFLL : hi), int(length));
}
