#include "text/font_paletted.h"

using namespace glyphrows;

void font_paletted::plotletter(short glyph, int x, int y, unsigned int colour, bool flag) {
    plotletter(glyph, x, y, colour, flag, nullptr, 0, 0);
}

void font_paletted::plotletter(short glyph, int x, int y, unsigned int colour, bool flag, clippingmask* mask,
                               int maskX, int maskY) {
    glyph_view g;
    if (!find_glyph(glyph, g)) return;
    if (flag)
        plot(g, x, y, mask, maskX, maskY, set_colour{colour});
    else
        plot(g, x, y, mask, maskX, maskY, palette_lookup{m_Palette.data(), unsigned(m_Palette.count())});
}

void font_paletted::plotletter_upwards(short glyph, int x, int y, unsigned int colour, bool flag) {
    glyph_view g;
    if (!find_glyph(glyph, g)) return;
    if (flag)
        plot_upwards(g, x, y, set_colour{colour});
    else
        plot_upwards(g, x, y, palette_lookup{m_Palette.data(), unsigned(m_Palette.count())});
}
