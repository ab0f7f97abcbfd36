#include "render/colourutils.h"

#include <cmath>

namespace colourutils {
unsigned int coltab[65536];

static float channel(float t, float p, float q) {
    if (t > 1.0f) t -= 1.0f;
    if (t < 0.0f) t += 1.0f;
    if (6.0f * t < 1.0f) return p + (q - p) * 6.0f * t;
    if (2.0f * t < 1.0f) return q;
    if (3.0f * t < 2.0f) return p + (q - p) * (0.6666667f - t) * 6.0f;
    return p;
}

static unsigned int to_byte(float c) { return (unsigned int)(int)(powf(c, 0.7f) * 256.0f); }

void init() {
    const float third = 0.33333334f;
    for (unsigned int v = 0; v < 65536; ++v) {
        float h = float(v >> 10) / 64.0f + 1.0f / 128.0f;
        float s = float((v >> 7) & 7) / 8.0f + 1.0f / 16.0f;
        float l = float(v & 127) / 128.0f;
        float q = l < 0.5f ? l * (1.0f + s) : l + s - l * s;
        float p = 2.0f * l - q;
        unsigned int r = to_byte(channel(h + third, p, q));
        unsigned int g = to_byte(channel(h, p, q));
        unsigned int b = to_byte(channel(h - third, p, q));
        coltab[v] = (r << 16) + (g << 8) + b;
    }
}
}  // namespace colourutils
