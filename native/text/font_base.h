// What the three font kinds share: the glyph table and per-glyph metrics in
// pool memory, and letter placement with clipping (normal, masked, upwards).
//
// A glyph is width x height bytes, row-major. Normal plotting puts glyph pixel
// (row r, column c) at (x + xoffset + c, y + yoffset + r). Upwards plotting
// turns the letter a quarter turn counter-clockwise and ignores the offsets:
// the letter covers `width` rows and `height` columns from (x, y), and
// destination row i, column j shows glyph pixel (row j, column width - 1 - i).
// Everything is clipped to the toolkit's clip rectangle; masked plotting
// further confines the rows and spans through mask_placement.
#pragma once

#include <cstdint>

#include "render/toolkit.h"
#include "text/clippingmask.h"
#include "text/glyphrows.h"
#include "util/memorymanager/sharedarray.h"
#include "util/memorymanager/simplearray.h"


class font_base {
public:
    // An empty font of `glyphcount` glyphs (no bitmaps, no metrics yet).
    font_base(memorymanager* pool, unsigned int glyphcount);

    // Copies glyph `index`'s bitmap into the pool; a null `bytes` leaves the
    // glyph empty.
    void set_glyph(int index, const unsigned char* bytes, int length);

    // Throws IllegalArgumentException when a glyph that has metrics holds
    // fewer bytes than its width x height.
    void validate() const;

    // A glyph ready to draw: false for an index outside any of the arrays, or
    // a bitmap that does not hold width x height bytes (an array emptied by a
    // released pool counts as outside).
    struct glyph_view {
        const uint8_t* bits;
        int width, height, xoffset, yoffset;
    };
    bool find_glyph(short index, glyph_view& v) const;

    int glyph_count() const { return m_Glyphs.size(); }

    memorymanager* m_Pool;
    simplearray<sharedarray<unsigned char> > m_Glyphs;
    sharedarray<int> m_Widths;
    sharedarray<int> m_Heights;
    sharedarray<int> m_YOffsets;
    sharedarray<int> m_XOffsets;

protected:
    // Draws with `rule` into the current toolkit's colour buffer.
    template <class P>
    static void plot(const glyph_view& g, int x, int y, const clippingmask* mask, int maskX, int maskY, const P& rule);
    template <class P>
    static void plot_upwards(const glyph_view& g, int x, int y, const P& rule);

private:
    font_base(const font_base&) = delete;
    font_base& operator=(const font_base&) = delete;
};

// Destination rectangle [x0, x1) x [y0, y1) of a letter cut to the clip
// rectangle (and to the buffer, should the clip ever reach beyond it).
struct letter_box {
    long long x0, y0, x1, y1;
    bool empty() const { return x0 >= x1 || y0 >= y1; }
};

inline letter_box clip_letter(const toolkit& tk, long long x, long long y, long long w, long long h) {
    letter_box b{x, y, x + w, y + h};
    const long long L = tk.m_ClipLeft > 0 ? tk.m_ClipLeft : 0, T = tk.m_ClipTop > 0 ? tk.m_ClipTop : 0;
    const long long R = tk.m_ClipRight < tk.m_Width ? tk.m_ClipRight : tk.m_Width;
    const long long B = tk.m_ClipBottom < tk.m_Height ? tk.m_ClipBottom : tk.m_Height;
    if (b.x0 < L) b.x0 = L;
    if (b.y0 < T) b.y0 = T;
    if (b.x1 > R) b.x1 = R;
    if (b.y1 > B) b.y1 = B;
    return b;
}

// The current toolkit when it has a colour buffer to draw into, else null.
inline toolkit* drawing_toolkit() {
    toolkit* tk = toolkit::m_pInstance;
    return tk && tk->m_ColourBuffer ? tk : nullptr;
}

template <class P>
void font_base::plot(const glyph_view& g, int x, int y, const clippingmask* mask, int maskX, int maskY, const P& rule) {
    toolkit* tk = drawing_toolkit();
    if (!tk) return;
    const long long gx = (long long)x + g.xoffset, gy = (long long)y + g.yoffset;
    const letter_box b = clip_letter(*tk, gx, gy, g.width, g.height);
    if (b.empty()) return;
    const mask_placement mp(mask, maskX, maskY, int(b.x0), int(b.y0), int(b.x1), int(b.y1));
    uint32_t* buf = tk->m_ColourBuffer;
    const long long W = tk->m_Width;
    for (int yy = mp.first_row(); yy < mp.end_row(); ++yy) {
        int x0, x1;
        if (!mp.span(yy, x0, x1)) continue;
        const uint8_t* src = g.bits + (yy - gy) * g.width + (x0 - gx);
        glyphrows::glyph_row(buf + yy * W + x0, src, 1, x1 - x0, rule);
    }
}

template <class P>
void font_base::plot_upwards(const glyph_view& g, int x, int y, const P& rule) {
    toolkit* tk = drawing_toolkit();
    if (!tk) return;
    // width rows, height columns
    const letter_box b = clip_letter(*tk, x, y, g.height, g.width);
    if (b.empty()) return;
    uint32_t* buf = tk->m_ColourBuffer;
    const long long W = tk->m_Width;
    for (long long yy = b.y0; yy < b.y1; ++yy) {
        // row i = yy - y shows glyph column width - 1 - i, walked down the glyph rows
        const long long i = yy - y, j0 = b.x0 - x;
        const uint8_t* src = g.bits + j0 * g.width + (g.width - 1 - i);
        glyphrows::glyph_row(buf + yy * W + b.x0, src, g.width, b.x1 - b.x0, rule);
    }
}
