#include "text/font_mono.h"

using namespace glyphrows;

void font_mono::plotletter(short glyph, int x, int y, unsigned int colour, bool flag) {
    plotletter(glyph, x, y, colour, flag, nullptr, 0, 0);
}

void font_mono::plotletter(short glyph, int x, int y, unsigned int colour, bool, clippingmask* mask, int maskX,
                           int maskY) {
    glyph_view g;
    if (!find_glyph(glyph, g)) return;
    const unsigned int a = colour >> 24;
    if (a == 255)
        plot(g, x, y, mask, maskX, maskY, set_colour{colour});
    else if (a != 0 || mask)
        plot(g, x, y, mask, maskX, maskY, blend_colour{colour, 255 - a, a});
}

void font_mono::plotletter_upwards(short glyph, int x, int y, unsigned int colour, bool) {
    glyph_view g;
    if (find_glyph(glyph, g)) plot_upwards(g, x, y, set_colour{colour});
}
