// 4 x 4 single-precision matrix in SSE rows, row-vector convention:
// (x, y, z, 1) x M = x*row0 + y*row1 + z*row2 + row3 (row 3 is the translation).
#pragma once

#include <emmintrin.h>
#include <xmmintrin.h>

class alignas(16) Matrix_c {
public:
    __m128 m_Rows[4];

    static const __m128 IdentityRows[4];
    static const __m128 ZSignMask;  // sign bit of lane 2 only

    Matrix_c() { SetIdentity(); }
    explicit Matrix_c(const float* m16) { Set(m16); }

    void SetIdentity() {
        for (int i = 0; i < 4; ++i) m_Rows[i] = IdentityRows[i];
    }
    void Set(const float* m16) {
        for (int i = 0; i < 4; ++i) m_Rows[i] = _mm_loadu_ps(m16 + 4 * i);
    }
    void Get(float* m16) const {
        for (int i = 0; i < 4; ++i) _mm_storeu_ps(m16 + 4 * i, m_Rows[i]);
    }
    float At(int row, int col) const {
        alignas(16) float r[4];
        _mm_store_ps(r, m_Rows[row]);
        return r[col];
    }

    // r.x*row0 + r.y*row1 + r.z*row2 + r.w*row3
    __m128 Transform(__m128 r) const {
        __m128 x = _mm_shuffle_ps(r, r, _MM_SHUFFLE(0, 0, 0, 0));
        __m128 y = _mm_shuffle_ps(r, r, _MM_SHUFFLE(1, 1, 1, 1));
        __m128 z = _mm_shuffle_ps(r, r, _MM_SHUFFLE(2, 2, 2, 2));
        __m128 w = _mm_shuffle_ps(r, r, _MM_SHUFFLE(3, 3, 3, 3));
        return _mm_add_ps(_mm_add_ps(_mm_mul_ps(x, m_Rows[0]), _mm_mul_ps(y, m_Rows[1])),
                          _mm_add_ps(_mm_mul_ps(z, m_Rows[2]), _mm_mul_ps(w, m_Rows[3])));
    }
    // Point (x, y, z, 1).
    __m128 TransformPoint(float x, float y, float z) const {
        return _mm_add_ps(_mm_add_ps(_mm_mul_ps(_mm_set1_ps(x), m_Rows[0]), _mm_mul_ps(_mm_set1_ps(y), m_Rows[1])),
                          _mm_add_ps(_mm_mul_ps(_mm_set1_ps(z), m_Rows[2]), m_Rows[3]));
    }

    // this x other: every row r of this becomes r.x*O0 + r.y*O1 + r.z*O2 + r.w*O3.
    Matrix_c Multiply(const Matrix_c& other) const {
        Matrix_c out;
        for (int i = 0; i < 4; ++i) out.m_Rows[i] = other.Transform(m_Rows[i]);
        return out;
    }

    // Six planes (a, b, c, d) in the order left, right, top, bottom, near, far,
    // each scaled by the approximate reciprocal square root of a^2 + b^2 + c^2.
    void ExtractFrustumPlanes(__m128 planes[6]) const;
};
