// Anti-aliased font: a glyph byte is the coverage 0..255 of the call's colour.
#pragma once

#include "text/font_base.h"

class font_alpha : public font_base {
public:
    font_alpha(memorymanager* pool, unsigned int glyphcount) : font_base(pool, glyphcount) {}

    // Each covered pixel becomes blend(D, C, 256 - c, c) for coverage c; the
    // colour's alpha byte is not used. The flag is not read.
    void plotletter(short glyph, int x, int y, unsigned int colour, bool flag);
    void plotletter(short glyph, int x, int y, unsigned int colour, bool flag, clippingmask* mask, int maskX, int maskY);
    void plotletter_upwards(short glyph, int x, int y, unsigned int colour, bool flag);
};
