// CastFloatInt32, 128-bit form.
#include <immintrin.h>

#include "Algorithms/simd/CastFloatInt32Kernels.h"

namespace ora::numeric::kernels {

void FloatToInt32_m128(const float* in, std::int32_t* out, std::size_t n, float scale) {
    const __m128 factor = _mm_set1_ps(scale);
    const __m128 low = _mm_set1_ps(kInt32Low);
    const __m128 high = _mm_set1_ps(kInt32High);
    std::size_t i = 0;
    for (; i + 4 <= n; i += 4) {
        __m128 v = _mm_mul_ps(_mm_loadu_ps(in + i), factor);
        v = _mm_and_ps(v, _mm_cmpord_ps(v, v));  // NaN to 0
        v = _mm_min_ps(_mm_max_ps(v, low), high);
        _mm_storeu_si128(reinterpret_cast<__m128i*>(out + i), _mm_cvtps_epi32(v));
    }
    for (; i < n; ++i) {
        float v = in[i] * scale;
        if (!(v == v)) v = 0.0f;
        v = v > kInt32Low ? v : kInt32Low;
        v = v < kInt32High ? v : kInt32High;
        out[i] = _mm_cvtss_si32(_mm_set_ss(v));
    }
}

void Int32ToFloat_m128(const std::int32_t* in, float* out, std::size_t n, float scale) {
    const __m128 factor = _mm_set1_ps(scale);
    std::size_t i = 0;
    for (; i + 4 <= n; i += 4)
        _mm_storeu_ps(out + i,
                      _mm_mul_ps(_mm_cvtepi32_ps(_mm_loadu_si128(reinterpret_cast<const __m128i*>(in + i))), factor));
    for (; i < n; ++i) out[i] = static_cast<float>(in[i]) * scale;
}

}  // namespace ora::numeric::kernels
