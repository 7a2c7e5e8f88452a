// TruePeak's scan of the oversampled points, 128-bit form (the fused forms
// differ only in the oversampling sums and use it too).
#include <immintrin.h>

#include "Algorithms/simd/TruePeakKernels.h"

namespace ora::numeric::kernels {

// Largest magnitude of points[1..middles], each local maximum refined by the
// vertex of the parabola through it and its neighbours; `peak` is merged.
float TruePeakScan_m128(const float* points, std::size_t middles, float peak) {
    const __m128 sign = _mm_set1_ps(-0.0f);
    const __m128 zero = _mm_setzero_ps();
    const __m128 eight = _mm_set1_ps(8.0f);
    __m128 best = _mm_set1_ps(peak);
    std::size_t i = 1;
    for (; i + 4 <= middles + 1; i += 4) {
        const __m128 a = _mm_andnot_ps(sign, _mm_loadu_ps(points + i - 1));
        const __m128 b = _mm_andnot_ps(sign, _mm_loadu_ps(points + i));
        const __m128 c = _mm_andnot_ps(sign, _mm_loadu_ps(points + i + 1));
        const __m128 d = _mm_add_ps(_mm_sub_ps(b, a), _mm_sub_ps(b, c));
        const __m128 t = _mm_sub_ps(c, a);
        const __m128 vertex = _mm_add_ps(b, _mm_div_ps(_mm_mul_ps(t, t), _mm_mul_ps(eight, d)));
        const __m128 isPeak = _mm_and_ps(_mm_and_ps(_mm_cmpge_ps(b, a), _mm_cmpge_ps(b, c)), _mm_cmpgt_ps(d, zero));
        const __m128 v = _mm_or_ps(_mm_and_ps(isPeak, vertex), _mm_andnot_ps(isPeak, b));
        best = _mm_max_ps(v, best);
    }
    best = _mm_max_ps(best, _mm_movehl_ps(best, best));
    best = _mm_max_ss(best, _mm_shuffle_ps(best, best, 1));
    peak = _mm_cvtss_f32(best);
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
