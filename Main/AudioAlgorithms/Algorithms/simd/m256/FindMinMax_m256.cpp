// FindMinMax, 256-bit form.
#include <immintrin.h>

#include "Algorithms/simd/FindMinMaxKernels.h"

namespace ora::numeric::kernels {

namespace {

void Tail(const float* x, std::size_t count, int channels, float* mn, float* mx) {
    for (std::size_t i = 0; i < count; ++i) {
        const int c = static_cast<int>(i % static_cast<std::size_t>(channels));
        if (x[i] < mn[c]) mn[c] = x[i];
        if (x[i] > mx[c]) mx[c] = x[i];
    }
}

// min/max of a NaN lane keeps the held value, as the reference's comparisons do.
std::size_t Run(const float* x, std::size_t values, __m256* lo, __m256* hi) {
    std::size_t i = 0;
    for (; i + 8 <= values; i += 8) {
        const __m256 v = _mm256_loadu_ps(x + i);
        *lo = _mm256_min_ps(v, *lo);
        *hi = _mm256_max_ps(v, *hi);
    }
    return i;
}

// The two 128-bit halves folded: lane k holds channel k mod (4 / period).
__m128 FoldMin(__m256 v) { return _mm_min_ps(_mm256_castps256_ps128(v), _mm256_extractf128_ps(v, 1)); }
__m128 FoldMax(__m256 v) { return _mm_max_ps(_mm256_castps256_ps128(v), _mm256_extractf128_ps(v, 1)); }

}  // namespace

void FindMinMax_c1_m256(const float* x, std::size_t frames, float* mn, float* mx) {
    __m256 lo = _mm256_set1_ps(mn[0]);
    __m256 hi = _mm256_set1_ps(mx[0]);
    const std::size_t done = Run(x, frames, &lo, &hi);
    __m128 l = FoldMin(lo);
    __m128 h = FoldMax(hi);
    l = _mm_min_ps(l, _mm_movehl_ps(l, l));
    h = _mm_max_ps(h, _mm_movehl_ps(h, h));
    mn[0] = _mm_cvtss_f32(_mm_min_ss(l, _mm_shuffle_ps(l, l, 1)));
    mx[0] = _mm_cvtss_f32(_mm_max_ss(h, _mm_shuffle_ps(h, h, 1)));
    Tail(x + done, frames - done, 1, mn, mx);
}

void FindMinMax_c2_m256(const float* x, std::size_t frames, float* mn, float* mx) {
    __m256 lo = _mm256_setr_ps(mn[0], mn[1], mn[0], mn[1], mn[0], mn[1], mn[0], mn[1]);
    __m256 hi = _mm256_setr_ps(mx[0], mx[1], mx[0], mx[1], mx[0], mx[1], mx[0], mx[1]);
    const std::size_t done = Run(x, 2 * frames, &lo, &hi);
    __m128 l = FoldMin(lo);
    __m128 h = FoldMax(hi);
    l = _mm_min_ps(l, _mm_movehl_ps(l, l));
    h = _mm_max_ps(h, _mm_movehl_ps(h, h));
    mn[0] = _mm_cvtss_f32(l);
    mn[1] = _mm_cvtss_f32(_mm_shuffle_ps(l, l, 1));
    mx[0] = _mm_cvtss_f32(h);
    mx[1] = _mm_cvtss_f32(_mm_shuffle_ps(h, h, 1));
    Tail(x + done, 2 * frames - done, 2, mn, mx);
}

void FindMinMax_c4_m256(const float* x, std::size_t frames, float* mn, float* mx) {
    const __m128 l4 = _mm_loadu_ps(mn);
    const __m128 h4 = _mm_loadu_ps(mx);
    __m256 lo = _mm256_insertf128_ps(_mm256_castps128_ps256(l4), l4, 1);
    __m256 hi = _mm256_insertf128_ps(_mm256_castps128_ps256(h4), h4, 1);
    const std::size_t done = Run(x, 4 * frames, &lo, &hi);
    _mm_storeu_ps(mn, FoldMin(lo));
    _mm_storeu_ps(mx, FoldMax(hi));
    Tail(x + done, 4 * frames - done, 4, mn, mx);
}

}  // namespace ora::numeric::kernels
