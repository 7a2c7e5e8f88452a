// LR2MS and MS2LR, 128-bit form.
#include <immintrin.h>

#include "Algorithms/simd/MidSideKernels.h"

namespace ora::numeric::kernels {

void LR2MS_m128(const float* l, const float* r, float* m, float* s, std::size_t frames) {
    const __m128 half = _mm_set1_ps(0.5f);
    std::size_t n = 0;
    for (; n + 4 <= frames; n += 4) {
        const __m128 a = _mm_loadu_ps(l + n);
        const __m128 b = _mm_loadu_ps(r + n);
        _mm_storeu_ps(m + n, _mm_mul_ps(_mm_add_ps(a, b), half));
        _mm_storeu_ps(s + n, _mm_mul_ps(_mm_sub_ps(a, b), half));
    }
    for (; n < frames; ++n) {
        const float a = l[n];
        const float b = r[n];
        m[n] = (a + b) * 0.5f;
        s[n] = (a - b) * 0.5f;
    }
}

void MS2LR_m128(const float* m, const float* s, float* l, float* r, std::size_t frames) {
    std::size_t n = 0;
    for (; n + 4 <= frames; n += 4) {
        const __m128 a = _mm_loadu_ps(m + n);
        const __m128 b = _mm_loadu_ps(s + n);
        _mm_storeu_ps(l + n, _mm_add_ps(a, b));
        _mm_storeu_ps(r + n, _mm_sub_ps(a, b));
    }
    for (; n < frames; ++n) {
        const float a = m[n];
        const float b = s[n];
        l[n] = a + b;
        r[n] = a - b;
    }
}

}  // namespace ora::numeric::kernels
