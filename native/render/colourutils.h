// The 65536-entry palette from 16-bit HSL (hue 15..10, saturation 9..7,
// lightness 6..0) to 0x00RRGGBB.
#pragma once

namespace colourutils {
extern unsigned int coltab[65536];
void init();
inline unsigned int hsl_2_rgb(unsigned short hsl) { return coltab[hsl]; }
}  // namespace colourutils
