// Particles: projected with the view-projection matrix, culled with the
// rasteriser's culler, sized along the camera's right axis, and drawn as
// scaled sprite blits of their texture or as depth-tested discs.
#include <emmintrin.h>

#include <cmath>

#include "render/RasterizerState.h"
#include "render/threadresource.h"
#include "render/toolkit.h"
#include "sprite/Sprite.h"
#include "texture/texturecache.h"

namespace {

inline __m128 project(const Matrix_c& vp, float x, float y, float z) {
    return Rasterizer_n::ToScreen(vp.TransformPoint(x, y, z));
}

// Particles wider than this on screen are not drawn (their size would leave
// the range of the blitters' destination sizes).
const float kMaxParticleSize = float(1 << 24);

}  // namespace

template <bool First, bool Second>
void threadresource::render_particles(const int* positions, const int* colours, const int* sizes,
                                      const short* textures, int count) {
    toolkit& tk = *m_Toolkit;
    const Matrix_c& vp = tk.m_ViewProjection;
    // the camera's right axis in world space: the first column of its rotation
    const float rx = tk.m_Camera.At(0, 0), ry = tk.m_Camera.At(1, 0), rz = tk.m_Camera.At(2, 0);
    for (int i = 0; i < count; ++i) {
        const float px = float(positions[3 * i] >> 12), py = float(positions[3 * i + 1] >> 12),
                    pz = float(positions[3 * i + 2] >> 12);
        const __m128 screen = project(vp, px, py, pz);
        if (!Rasterizer_n::CullerAccepts(Rasterizer_n::CullerVertexMask<true>(screen))) continue;
        const float s = float(sizes[i]) * 0.00048828125f;
        const __m128 offset = project(vp, px + s * rx, py + s * ry, pz + s * rz);
        alignas(16) float sp[4], op[4];
        _mm_store_ps(sp, screen);
        _mm_store_ps(op, offset);
        const float diff = op[0] - sp[0];
        if (!(std::fabs(diff) < kMaxParticleSize)) continue;
        const int D = std::abs(_mm_cvtss_si32(_mm_set_ss(diff)));  // rounded to nearest
        if (D == 0) continue;
        const int x0 = _mm_cvttss_si32(_mm_set_ss(sp[0])), y0 = _mm_cvttss_si32(_mm_set_ss(sp[1]));
        const int r = D >> 1;
        const unsigned short id = (unsigned short)textures[i];
        if (id != 65535) {
            textureslot* slot = tk.gettex(id);
            if (!slot) continue;
            Sprite_c texture;
            texture.WrapForeign(slot->texels, texturecache::kSize, texturecache::kSize, texturecache::kStride);
            Sprite_c::RenderParams_s p = {};
            p.x = x0 - r;
            p.y = y0 - r;
            p.depth = sp[2];
            p.colour = (unsigned int)colours[i];
            p.width = D + 1;
            p.height = D + 1;
            texture.Render<0, 1, true, false, First, Second>(tk, p);
            texture.Release();  // forget the slot's texels
        } else {
            tk.circle_fill(x0, y0, sp[2], r, (unsigned int)colours[i], 1);
        }
    }
}

template void threadresource::render_particles<false, true>(const int*, const int*, const int*, const short*, int);
template void threadresource::render_particles<true, true>(const int*, const int*, const int*, const short*, int);
template void threadresource::render_particles<true, false>(const int*, const int*, const int*, const short*, int);
