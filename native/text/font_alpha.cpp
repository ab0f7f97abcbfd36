#include "text/font_alpha.h"

using namespace glyphrows;

void font_alpha::plotletter(short glyph, int x, int y, unsigned int colour, bool flag) {
    plotletter(glyph, x, y, colour, flag, nullptr, 0, 0);
}

void font_alpha::plotletter(short glyph, int x, int y, unsigned int colour, bool, clippingmask* mask, int maskX,
                            int maskY) {
    glyph_view g;
    if (find_glyph(glyph, g)) plot(g, x, y, mask, maskX, maskY, coverage{colour});
}

void font_alpha::plotletter_upwards(short glyph, int x, int y, unsigned int colour, bool) {
    glyph_view g;
    if (find_glyph(glyph, g)) plot_upwards(g, x, y, coverage{colour});
}
