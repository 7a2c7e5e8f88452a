// Interleave and Deinterleave of two channels, 128-bit form.
#include <immintrin.h>

#include "Algorithms/simd/InterleaveKernels.h"

namespace ora::numeric::kernels {

void Interleave_c2_m128(const float* a, const float* b, float* interleaved, std::size_t frames) {
    std::size_t n = 0;
    for (; n + 4 <= frames; n += 4) {
        const __m128 x = _mm_loadu_ps(a + n);
        const __m128 y = _mm_loadu_ps(b + n);
        _mm_storeu_ps(interleaved + 2 * n, _mm_unpacklo_ps(x, y));
        _mm_storeu_ps(interleaved + 2 * n + 4, _mm_unpackhi_ps(x, y));
    }
    for (; n < frames; ++n) {
        interleaved[2 * n] = a[n];
        interleaved[2 * n + 1] = b[n];
    }
}

void Deinterleave_c2_m128(const float* interleaved, float* a, float* b, std::size_t frames) {
    std::size_t n = 0;
    for (; n + 4 <= frames; n += 4) {
        const __m128 v0 = _mm_loadu_ps(interleaved + 2 * n);
        const __m128 v1 = _mm_loadu_ps(interleaved + 2 * n + 4);
        _mm_storeu_ps(a + n, _mm_shuffle_ps(v0, v1, _MM_SHUFFLE(2, 0, 2, 0)));
        _mm_storeu_ps(b + n, _mm_shuffle_ps(v0, v1, _MM_SHUFFLE(3, 1, 3, 1)));
    }
    for (; n < frames; ++n) {
        a[n] = interleaved[2 * n];
        b[n] = interleaved[2 * n + 1];
    }
}

}  // namespace ora::numeric::kernels
