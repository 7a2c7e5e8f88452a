// LR2MS and MS2LR, 256-bit form.
#include <immintrin.h>

#include "Algorithms/simd/MidSideKernels.h"

namespace ora::numeric::kernels {

void LR2MS_m256(const float* l, const float* r, float* m, float* s, std::size_t frames) {
    const __m256 half = _mm256_set1_ps(0.5f);
    std::size_t n = 0;
    for (; n + 8 <= frames; n += 8) {
        const __m256 a = _mm256_loadu_ps(l + n);
        const __m256 b = _mm256_loadu_ps(r + n);
        _mm256_storeu_ps(m + n, _mm256_mul_ps(_mm256_add_ps(a, b), half));
        _mm256_storeu_ps(s + n, _mm256_mul_ps(_mm256_sub_ps(a, b), half));
    }
    for (; n < frames; ++n) {
        const float a = l[n];
        const float b = r[n];
        m[n] = (a + b) * 0.5f;
        s[n] = (a - b) * 0.5f;
    }
}

void MS2LR_m256(const float* m, const float* s, float* l, float* r, std::size_t frames) {
    std::size_t n = 0;
    for (; n + 8 <= frames; n += 8) {
        const __m256 a = _mm256_loadu_ps(m + n);
        const __m256 b = _mm256_loadu_ps(s + n);
        _mm256_storeu_ps(l + n, _mm256_add_ps(a, b));
        _mm256_storeu_ps(r + n, _mm256_sub_ps(a, b));
    }
    for (; n < frames; ++n) {
        const float a = m[n];
        const float b = s[n];
        l[n] = a + b;
        r[n] = a - b;
    }
}

}  // namespace ora::numeric::kernels
