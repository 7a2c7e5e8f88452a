// Vec, 256-bit form.
#include <immintrin.h>

#include "Algorithms/simd/VecKernels.h"

namespace ora::numeric::kernels {

namespace {

void Add(const float* a, const float* b, float* out, std::size_t n) {
    std::size_t i = 0;
    for (; i + 8 <= n; i += 8) _mm256_storeu_ps(out + i, _mm256_add_ps(_mm256_loadu_ps(a + i), _mm256_loadu_ps(b + i)));
    for (; i < n; ++i) out[i] = a[i] + b[i];
}

void Subtract(const float* a, const float* b, float* out, std::size_t n) {
    std::size_t i = 0;
    for (; i + 8 <= n; i += 8) _mm256_storeu_ps(out + i, _mm256_sub_ps(_mm256_loadu_ps(a + i), _mm256_loadu_ps(b + i)));
    for (; i < n; ++i) out[i] = a[i] - b[i];
}

void Multiply(const float* a, const float* b, float* out, std::size_t n) {
    std::size_t i = 0;
    for (; i + 8 <= n; i += 8) _mm256_storeu_ps(out + i, _mm256_mul_ps(_mm256_loadu_ps(a + i), _mm256_loadu_ps(b + i)));
    for (; i < n; ++i) out[i] = a[i] * b[i];
}

void Scale(const float* a, float s, float* out, std::size_t n) {
    const __m256 factor = _mm256_set1_ps(s);
    std::size_t i = 0;
    for (; i + 8 <= n; i += 8) _mm256_storeu_ps(out + i, _mm256_mul_ps(_mm256_loadu_ps(a + i), factor));
    for (; i < n; ++i) out[i] = a[i] * s;
}

void Abs(const float* a, float* out, std::size_t n) {
    const __m256 sign = _mm256_set1_ps(-0.0f);
    std::size_t i = 0;
    for (; i + 8 <= n; i += 8) _mm256_storeu_ps(out + i, _mm256_andnot_ps(sign, _mm256_loadu_ps(a + i)));
    for (; i < n; ++i) out[i] = __builtin_fabsf(a[i]);
}

// max(v, lo) is v > lo ? v : lo, which sends NaN to lo as the reference does.
void Clamp(const float* a, float lo, float hi, float* out, std::size_t n) {
    const __m256 low = _mm256_set1_ps(lo);
    const __m256 high = _mm256_set1_ps(hi);
    std::size_t i = 0;
    for (; i + 8 <= n; i += 8)
        _mm256_storeu_ps(out + i, _mm256_min_ps(_mm256_max_ps(_mm256_loadu_ps(a + i), low), high));
    for (; i < n; ++i) {
        float v = a[i] > lo ? a[i] : lo;
        out[i] = v < hi ? v : hi;
    }
}

// The ordered comparisons are false for NaN, as in the reference form.
void Sanitize(const float* a, float limit, float* out, std::size_t n) {
    const __m256 sign = _mm256_set1_ps(-0.0f);
    const __m256 bound = _mm256_set1_ps(limit);
    const __m256 largest = _mm256_set1_ps(__FLT_MAX__);
    std::size_t i = 0;
    for (; i + 8 <= n; i += 8) {
        const __m256 x = _mm256_loadu_ps(a + i);
        const __m256 magnitude = _mm256_andnot_ps(sign, x);
        const __m256 within = _mm256_cmp_ps(magnitude, bound, _CMP_LE_OQ);
        const __m256 finite = _mm256_cmp_ps(magnitude, largest, _CMP_LE_OQ);
        const __m256 held = _mm256_and_ps(finite, _mm256_or_ps(_mm256_and_ps(sign, x), bound));
        _mm256_storeu_ps(out + i, _mm256_or_ps(_mm256_and_ps(within, x), _mm256_andnot_ps(within, held)));
    }
    for (; i < n; ++i) {
        const float magnitude = __builtin_fabsf(a[i]);
        if (magnitude <= limit) out[i] = a[i];
        else out[i] = magnitude <= __FLT_MAX__ ? __builtin_copysignf(limit, a[i]) : 0.0f;
    }
}

}  // namespace

const VecKernels kVec_m256 = {Add, Subtract, Multiply, Scale, Abs, Clamp, Sanitize};

}  // namespace ora::numeric::kernels
