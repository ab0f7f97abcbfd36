// Paletted font: a glyph byte is 0 (empty) or an index into the palette.
#pragma once

#include "text/font_base.h"

class font_paletted : public font_base {
public:
    font_paletted(memorymanager* pool, unsigned int glyphcount) : font_base(pool, glyphcount) {}

    // flag false: each pixel with index i != 0 becomes palette[i] (indices the
    // palette does not hold draw nothing); flag true: it becomes the colour.
    void plotletter(short glyph, int x, int y, unsigned int colour, bool flag);
    void plotletter(short glyph, int x, int y, unsigned int colour, bool flag, clippingmask* mask, int maskX, int maskY);
    void plotletter_upwards(short glyph, int x, int y, unsigned int colour, bool flag);

    sharedarray<unsigned int> m_Palette;  // ARGB per index; index 0 is never drawn
};
