// Fixed-point angles: 16384 units per turn, with sine and cosine tables.
#pragma once

namespace mymath {
extern float sintabf[16384];
extern float costabf[16384];
extern const double TRIG_ANGLEREVERSEFACTOR;  // radians to angle units

void init();
inline float sin(unsigned int a) { return sintabf[a & 0x3FFF]; }
inline float cos(unsigned int a) { return costabf[a & 0x3FFF]; }
}  // namespace mymath
