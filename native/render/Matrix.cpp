#include "render/Matrix.h"

const __m128 Matrix_c::IdentityRows[4] = {
    _mm_setr_ps(1, 0, 0, 0), _mm_setr_ps(0, 1, 0, 0), _mm_setr_ps(0, 0, 1, 0), _mm_setr_ps(0, 0, 0, 1)};

const __m128 Matrix_c::ZSignMask = _mm_castsi128_ps(_mm_setr_epi32(0, 0, int(0x80000000u), 0));

void Matrix_c::ExtractFrustumPlanes(__m128 planes[6]) const {
    // Columns c0..c3 of the matrix: transpose the rows.
    __m128 r0 = m_Rows[0], r1 = m_Rows[1], r2 = m_Rows[2], r3 = m_Rows[3];
    _MM_TRANSPOSE4_PS(r0, r1, r2, r3);
    const __m128 c0 = r0, c1 = r1, c2 = r2, c3 = r3;
    planes[0] = _mm_add_ps(c3, c0);
    planes[1] = _mm_sub_ps(c3, c0);
    planes[2] = _mm_add_ps(c3, c1);
    planes[3] = _mm_sub_ps(c3, c1);
    planes[4] = _mm_add_ps(c3, c2);
    planes[5] = _mm_sub_ps(c3, c2);
    for (int i = 0; i < 6; ++i) {
        __m128 p = planes[i];
        __m128 sq = _mm_mul_ps(p, p);
        // a^2 + b^2 + c^2 in lane 0
        __m128 s = _mm_add_ss(_mm_add_ss(sq, _mm_shuffle_ps(sq, sq, _MM_SHUFFLE(1, 1, 1, 1))),
                              _mm_shuffle_ps(sq, sq, _MM_SHUFFLE(2, 2, 2, 2)));
        __m128 r = _mm_rsqrt_ss(s);
        planes[i] = _mm_mul_ps(p, _mm_shuffle_ps(r, r, 0));
    }
}
