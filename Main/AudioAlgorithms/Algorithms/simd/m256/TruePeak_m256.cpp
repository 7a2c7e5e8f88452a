// TruePeak's scan of the oversampled points, 256-bit form (the fused forms
// differ only in the oversampling sums and use it too).
#include <immintrin.h>

#include "Algorithms/simd/TruePeakKernels.h"

namespace ora::numeric::kernels {

// Largest magnitude of points[1..middles], each local maximum refined by the
// vertex of the parabola through it and its neighbours; `peak` is merged.
float TruePeakScan_m256(const float* points, std::size_t middles, float peak) {
    const __m256 sign = _mm256_set1_ps(-0.0f);
    const __m256 zero = _mm256_setzero_ps();
    const __m256 eight = _mm256_set1_ps(8.0f);
    __m256 best = _mm256_set1_ps(peak);
    std::size_t i = 1;
    for (; i + 8 <= middles + 1; i += 8) {
        const __m256 a = _mm256_andnot_ps(sign, _mm256_loadu_ps(points + i - 1));
        const __m256 b = _mm256_andnot_ps(sign, _mm256_loadu_ps(points + i));
        const __m256 c = _mm256_andnot_ps(sign, _mm256_loadu_ps(points + i + 1));
        const __m256 d = _mm256_add_ps(_mm256_sub_ps(b, a), _mm256_sub_ps(b, c));
        const __m256 t = _mm256_sub_ps(c, a);
        const __m256 vertex = _mm256_add_ps(b, _mm256_div_ps(_mm256_mul_ps(t, t), _mm256_mul_ps(eight, d)));
        const __m256 isPeak =
            _mm256_and_ps(_mm256_and_ps(_mm256_cmp_ps(b, a, _CMP_GE_OQ), _mm256_cmp_ps(b, c, _CMP_GE_OQ)),
                          _mm256_cmp_ps(d, zero, _CMP_GT_OQ));
        // A select by masks, not blendv: GCC lowers that blend of combined
        // compares to one branch per lane when compiling for AVX without AVX2.
        const __m256 v = _mm256_or_ps(_mm256_and_ps(isPeak, vertex), _mm256_andnot_ps(isPeak, b));
        best = _mm256_max_ps(v, best);
    }
    __m128 half = _mm_max_ps(_mm256_castps256_ps128(best), _mm256_extractf128_ps(best, 1));
    half = _mm_max_ps(half, _mm_movehl_ps(half, half));
    half = _mm_max_ss(half, _mm_shuffle_ps(half, half, 1));
    peak = _mm_cvtss_f32(half);
    for (; i <= middles; ++i) {
        const float a = __builtin_fabsf(points[i - 1]);
        const float b = __builtin_fabsf(points[i]);
        const float c = __builtin_fabsf(points[i + 1]);
        const float d = (b - a) + (b - c);
        float v = b;
        if (b >= a && b >= c && d > 0.0f) v = b + (c - a) * (c - a) / (8.0f * d);
        if (v > peak) peak = v;
    }
    return peak;
}

}  // namespace ora::numeric::kernels
