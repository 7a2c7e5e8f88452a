// Interleave and Deinterleave of two channels, 256-bit form.
#include <immintrin.h>

#include "Algorithms/simd/InterleaveKernels.h"

namespace ora::numeric::kernels {

void Interleave_c2_m256(const float* a, const float* b, float* interleaved, std::size_t frames) {
    std::size_t n = 0;
    for (; n + 8 <= frames; n += 8) {
        const __m256 x = _mm256_loadu_ps(a + n);
        const __m256 y = _mm256_loadu_ps(b + n);
        const __m256 low = _mm256_unpacklo_ps(x, y);   // a0 b0 a1 b1 | a4 b4 a5 b5
        const __m256 high = _mm256_unpackhi_ps(x, y);  // a2 b2 a3 b3 | a6 b6 a7 b7
        _mm256_storeu_ps(interleaved + 2 * n, _mm256_permute2f128_ps(low, high, 0x20));
        _mm256_storeu_ps(interleaved + 2 * n + 8, _mm256_permute2f128_ps(low, high, 0x31));
    }
    for (; n < frames; ++n) {
        interleaved[2 * n] = a[n];
        interleaved[2 * n + 1] = b[n];
    }
}

void Deinterleave_c2_m256(const float* interleaved, float* a, float* b, std::size_t frames) {
    std::size_t n = 0;
    for (; n + 8 <= frames; n += 8) {
        const __m256 v0 = _mm256_loadu_ps(interleaved + 2 * n);
        const __m256 v1 = _mm256_loadu_ps(interleaved + 2 * n + 8);
        const __m256 t0 = _mm256_permute2f128_ps(v0, v1, 0x20);  // a0 b0 a1 b1 | a4 b4 a5 b5
        const __m256 t1 = _mm256_permute2f128_ps(v0, v1, 0x31);  // a2 b2 a3 b3 | a6 b6 a7 b7
        _mm256_storeu_ps(a + n, _mm256_shuffle_ps(t0, t1, _MM_SHUFFLE(2, 0, 2, 0)));
        _mm256_storeu_ps(b + n, _mm256_shuffle_ps(t0, t1, _MM_SHUFFLE(3, 1, 3, 1)));
    }
    for (; n < frames; ++n) {
        a[n] = interleaved[2 * n];
        b[n] = interleaved[2 * n + 1];
    }
}

}  // namespace ora::numeric::kernels
