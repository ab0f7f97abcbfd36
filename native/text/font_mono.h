// Monochrome bitmap font: a glyph byte is 0 (empty) or set.
#pragma once

#include "text/font_base.h"

class font_mono : public font_base {
public:
    font_mono(memorymanager* pool, unsigned int glyphcount) : font_base(pool, glyphcount) {}

    // Set pixels become the colour when its alpha byte is 255, blend it in
    // by that alpha when it is 1..254, and nothing is drawn at alpha 0.
    void plotletter(short glyph, int x, int y, unsigned int colour, bool flag);
    // With a mask, every alpha other than 255 blends (alpha 0 scales the
    // covered pixels by 255/256 and clears their alpha byte). A null mask
    // draws exactly like the plain form.
    void plotletter(short glyph, int x, int y, unsigned int colour, bool flag, clippingmask* mask, int maskX, int maskY);
    // Turned upwards; set pixels become the colour whatever its alpha.
    void plotletter_upwards(short glyph, int x, int y, unsigned int colour, bool flag);
};
