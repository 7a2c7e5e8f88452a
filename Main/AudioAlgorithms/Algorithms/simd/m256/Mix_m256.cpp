// Mix, 256-bit form.
#include <immintrin.h>

#include "Algorithms/simd/MixKernels.h"

namespace ora::numeric::kernels {

void Mix_m256(const float* const* sources, const float* weights, std::size_t count, float* out, std::size_t frames) {
    std::size_t n = 0;
    if (count == 0) {
        for (; n < frames; ++n) out[n] = 0.0f;
        return;
    }
    for (; n + 8 <= frames; n += 8) {
        __m256 acc = _mm256_mul_ps(_mm256_set1_ps(weights[0]), _mm256_loadu_ps(sources[0] + n));
        for (std::size_t i = 1; i < count; ++i)
            acc = _mm256_add_ps(acc, _mm256_mul_ps(_mm256_set1_ps(weights[i]), _mm256_loadu_ps(sources[i] + n)));
        _mm256_storeu_ps(out + n, acc);
    }
    for (; n < frames; ++n) {
        float acc = weights[0] * sources[0][n];
        for (std::size_t i = 1; i < count; ++i) acc += weights[i] * sources[i][n];
        out[n] = acc;
    }
}

}  // namespace ora::numeric::kernels
