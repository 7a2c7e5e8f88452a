// CastFloatInt32, 256-bit form.
#include <immintrin.h>

#include "Algorithms/simd/CastFloatInt32Kernels.h"

namespace ora::numeric::kernels {

void FloatToInt32_m256(const float* in, std::int32_t* out, std::size_t n, float scale) {
    const __m256 factor = _mm256_set1_ps(scale);
    const __m256 low = _mm256_set1_ps(kInt32Low);
    const __m256 high = _mm256_set1_ps(kInt32High);
    std::size_t i = 0;
    for (; i + 8 <= n; i += 8) {
        __m256 v = _mm256_mul_ps(_mm256_loadu_ps(in + i), factor);
        v = _mm256_and_ps(v, _mm256_cmp_ps(v, v, _CMP_ORD_Q));  // NaN to 0
        v = _mm256_min_ps(_mm256_max_ps(v, low), high);
        _mm256_storeu_si256(reinterpret_cast<__m256i*>(out + i), _mm256_cvtps_epi32(v));
    }
    for (; i < n; ++i) {
        float v = in[i] * scale;
        if (!(v == v)) v = 0.0f;
        v = v > kInt32Low ? v : kInt32Low;
        v = v < kInt32High ? v : kInt32High;
        out[i] = _mm_cvtss_si32(_mm_set_ss(v));
    }
}

void Int32ToFloat_m256(const std::int32_t* in, float* out, std::size_t n, float scale) {
    const __m256 factor = _mm256_set1_ps(scale);
    std::size_t i = 0;
    for (; i + 8 <= n; i += 8)
        _mm256_storeu_ps(
            out + i,
            _mm256_mul_ps(_mm256_cvtepi32_ps(_mm256_loadu_si256(reinterpret_cast<const __m256i*>(in + i))), factor));
    for (; i < n; ++i) out[i] = static_cast<float>(in[i]) * scale;
}

}  // namespace ora::numeric::kernels
