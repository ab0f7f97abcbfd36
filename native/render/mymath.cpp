#include "render/mymath.h"

#include <cmath>

namespace mymath {
alignas(16) float sintabf[16384];
alignas(16) float costabf[16384];
const double TRIG_ANGLEREVERSEFACTOR = double(16384.0f / 6.2831855f);

void init() {
    sintabf[0] = 0.0f;
    costabf[0] = 1.0f;
    const float step = 0.0003834952f;  // 2*pi / 16384 as a float
    for (int i = 1; i < 16384; ++i) {
        float a = float(i) * step;
        sintabf[i] = sinf(a);
        costabf[i] = cosf(a);
    }
}
}  // namespace mymath
