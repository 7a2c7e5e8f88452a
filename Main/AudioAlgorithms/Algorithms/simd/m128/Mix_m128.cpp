// Mix, 128-bit form.
#include <immintrin.h>

#include "Algorithms/simd/MixKernels.h"

namespace ora::numeric::kernels {

void Mix_m128(const float* const* sources, const float* weights, std::size_t count, float* out, std::size_t frames) {
    std::size_t n = 0;
    if (count == 0) {
        for (; n < frames; ++n) out[n] = 0.0f;
        return;
    }
    for (; n + 4 <= frames; n += 4) {
        __m128 acc = _mm_mul_ps(_mm_set1_ps(weights[0]), _mm_loadu_ps(sources[0] + n));
        for (std::size_t i = 1; i < count; ++i)
            acc = _mm_add_ps(acc, _mm_mul_ps(_mm_set1_ps(weights[i]), _mm_loadu_ps(sources[i] + n)));
        _mm_storeu_ps(out + n, acc);
    }
    for (; n < frames; ++n) {
        float acc = weights[0] * sources[0][n];
        for (std::size_t i = 1; i < count; ++i) acc += weights[i] * sources[i][n];
        out[n] = acc;
    }
}

}  // namespace ora::numeric::kernels
