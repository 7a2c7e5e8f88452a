// Vec, 128-bit form.
#include <immintrin.h>

#include "Algorithms/simd/VecKernels.h"

namespace ora::numeric::kernels {

namespace {

void Add(const float* a, const float* b, float* out, std::size_t n) {
    std::size_t i = 0;
    for (; i + 4 <= n; i += 4) _mm_storeu_ps(out + i, _mm_add_ps(_mm_loadu_ps(a + i), _mm_loadu_ps(b + i)));
    for (; i < n; ++i) out[i] = a[i] + b[i];
}

void Subtract(const float* a, const float* b, float* out, std::size_t n) {
    std::size_t i = 0;
    for (; i + 4 <= n; i += 4) _mm_storeu_ps(out + i, _mm_sub_ps(_mm_loadu_ps(a + i), _mm_loadu_ps(b + i)));
    for (; i < n; ++i) out[i] = a[i] - b[i];
}

void Multiply(const float* a, const float* b, float* out, std::size_t n) {
    std::size_t i = 0;
    for (; i + 4 <= n; i += 4) _mm_storeu_ps(out + i, _mm_mul_ps(_mm_loadu_ps(a + i), _mm_loadu_ps(b + i)));
    for (; i < n; ++i) out[i] = a[i] * b[i];
}

void Scale(const float* a, float s, float* out, std::size_t n) {
    const __m128 factor = _mm_set1_ps(s);
    std::size_t i = 0;
    for (; i + 4 <= n; i += 4) _mm_storeu_ps(out + i, _mm_mul_ps(_mm_loadu_ps(a + i), factor));
    for (; i < n; ++i) out[i] = a[i] * s;
}

void Abs(const float* a, float* out, std::size_t n) {
    const __m128 sign = _mm_set1_ps(-0.0f);
    std::size_t i = 0;
    for (; i + 4 <= n; i += 4) _mm_storeu_ps(out + i, _mm_andnot_ps(sign, _mm_loadu_ps(a + i)));
    for (; i < n; ++i) out[i] = __builtin_fabsf(a[i]);
}

// max(v, lo) is v > lo ? v : lo, which sends NaN to lo as the reference does.
void Clamp(const float* a, float lo, float hi, float* out, std::size_t n) {
    const __m128 low = _mm_set1_ps(lo);
    const __m128 high = _mm_set1_ps(hi);
    std::size_t i = 0;
    for (; i + 4 <= n; i += 4) _mm_storeu_ps(out + i, _mm_min_ps(_mm_max_ps(_mm_loadu_ps(a + i), low), high));
    for (; i < n; ++i) {
        float v = a[i] > lo ? a[i] : lo;
        out[i] = v < hi ? v : hi;
    }
}

// The ordered comparisons are false for NaN, as in the reference form.
void Sanitize(const float* a, float limit, float* out, std::size_t n) {
    const __m128 sign = _mm_set1_ps(-0.0f);
    const __m128 bound = _mm_set1_ps(limit);
    const __m128 largest = _mm_set1_ps(__FLT_MAX__);
    std::size_t i = 0;
    for (; i + 4 <= n; i += 4) {
        const __m128 x = _mm_loadu_ps(a + i);
        const __m128 magnitude = _mm_andnot_ps(sign, x);
        const __m128 within = _mm_cmple_ps(magnitude, bound);
        const __m128 finite = _mm_cmple_ps(magnitude, largest);
        const __m128 held = _mm_and_ps(finite, _mm_or_ps(_mm_and_ps(sign, x), bound));
        _mm_storeu_ps(out + i, _mm_or_ps(_mm_and_ps(within, x), _mm_andnot_ps(within, held)));
    }
    for (; i < n; ++i) {
        const float magnitude = __builtin_fabsf(a[i]);
        if (magnitude <= limit) out[i] = a[i];
        else out[i] = magnitude <= __FLT_MAX__ ? __builtin_copysignf(limit, a[i]) : 0.0f;
    }
}

}  // namespace

const VecKernels kVec_m128 = {Add, Subtract, Multiply, Scale, Abs, Clamp, Sanitize};

}  // namespace ora::numeric::kernels
