// Blas1 and Blas2, 128-bit form.
#include <immintrin.h>

#include "Algorithms/simd/BlasKernels.h"

namespace ora::numeric::kernels {

float Dot_m128(const float* x, const float* y, std::size_t n) {
    // Two registers carry the eight partial sums of the reference order.
    __m128 low = _mm_setzero_ps();
    __m128 high = _mm_setzero_ps();
    std::size_t i = 0;
    for (; i + 8 <= n; i += 8) {
        low = _mm_add_ps(low, _mm_mul_ps(_mm_loadu_ps(x + i), _mm_loadu_ps(y + i)));
        high = _mm_add_ps(high, _mm_mul_ps(_mm_loadu_ps(x + i + 4), _mm_loadu_ps(y + i + 4)));
    }
    __m128 t = _mm_add_ps(low, high);
    t = _mm_add_ps(t, _mm_movehl_ps(t, t));
    float sum = _mm_cvtss_f32(_mm_add_ss(t, _mm_shuffle_ps(t, t, 1)));
    for (; i < n; ++i) sum += x[i] * y[i];
    return sum;
}

void Axpy_m128(float a, const float* x, float* y, std::size_t n) {
    const __m128 factor = _mm_set1_ps(a);
    std::size_t i = 0;
    for (; i + 4 <= n; i += 4)
        _mm_storeu_ps(y + i, _mm_add_ps(_mm_loadu_ps(y + i), _mm_mul_ps(factor, _mm_loadu_ps(x + i))));
    for (; i < n; ++i) y[i] += a * x[i];
}

void Gemv_m128(const float* a, std::size_t rows, std::size_t cols, std::size_t stride, const float* x, float* y) {
    std::size_t r = 0;
    for (; r + 4 <= rows; r += 4) {
        __m128 acc = _mm_setzero_ps();
        for (std::size_t c = 0; c < cols; ++c)
            acc = _mm_add_ps(acc, _mm_mul_ps(_mm_loadu_ps(a + c * stride + r), _mm_set1_ps(x[c])));
        _mm_storeu_ps(y + r, acc);
    }
    for (; r < rows; ++r) {
        float acc = 0.0f;
        for (std::size_t c = 0; c < cols; ++c) acc += a[c * stride + r] * x[c];
        y[r] = acc;
    }
}

}  // namespace ora::numeric::kernels
