// FindMinMax, 128-bit form.
#include <immintrin.h>

#include "Algorithms/simd/FindMinMaxKernels.h"

namespace ora::numeric::kernels {

namespace {

// Lanes hold channels in the order given by `mn`/`mx` repeated; min/max of a
// NaN lane keeps the held value, as the reference's comparisons do.
void Tail(const float* x, std::size_t count, int channels, float* mn, float* mx) {
    for (std::size_t i = 0; i < count; ++i) {
        const int c = static_cast<int>(i % static_cast<std::size_t>(channels));
        if (x[i] < mn[c]) mn[c] = x[i];
        if (x[i] > mx[c]) mx[c] = x[i];
    }
}

void Run(const float* x, std::size_t values, __m128 lo, __m128 hi, __m128* outLo, __m128* outHi, std::size_t* done) {
    std::size_t i = 0;
    for (; i + 4 <= values; i += 4) {
        const __m128 v = _mm_loadu_ps(x + i);
        lo = _mm_min_ps(v, lo);
        hi = _mm_max_ps(v, hi);
    }
    *outLo = lo;
    *outHi = hi;
    *done = i;
}

}  // namespace

void FindMinMax_c1_m128(const float* x, std::size_t frames, float* mn, float* mx) {
    __m128 lo, hi;
    std::size_t done;
    Run(x, frames, _mm_set1_ps(mn[0]), _mm_set1_ps(mx[0]), &lo, &hi, &done);
    lo = _mm_min_ps(lo, _mm_movehl_ps(lo, lo));
    hi = _mm_max_ps(hi, _mm_movehl_ps(hi, hi));
    mn[0] = _mm_cvtss_f32(_mm_min_ss(lo, _mm_shuffle_ps(lo, lo, 1)));
    mx[0] = _mm_cvtss_f32(_mm_max_ss(hi, _mm_shuffle_ps(hi, hi, 1)));
    Tail(x + done, frames - done, 1, mn, mx);
}

void FindMinMax_c2_m128(const float* x, std::size_t frames, float* mn, float* mx) {
    __m128 lo, hi;
    std::size_t done;
    Run(x, 2 * frames, _mm_setr_ps(mn[0], mn[1], mn[0], mn[1]), _mm_setr_ps(mx[0], mx[1], mx[0], mx[1]), &lo, &hi,
        &done);
    lo = _mm_min_ps(lo, _mm_movehl_ps(lo, lo));
    hi = _mm_max_ps(hi, _mm_movehl_ps(hi, hi));
    mn[0] = _mm_cvtss_f32(lo);
    mn[1] = _mm_cvtss_f32(_mm_shuffle_ps(lo, lo, 1));
    mx[0] = _mm_cvtss_f32(hi);
    mx[1] = _mm_cvtss_f32(_mm_shuffle_ps(hi, hi, 1));
    Tail(x + done, 2 * frames - done, 2, mn, mx);
}

void FindMinMax_c4_m128(const float* x, std::size_t frames, float* mn, float* mx) {
    __m128 lo, hi;
    std::size_t done;
    Run(x, 4 * frames, _mm_loadu_ps(mn), _mm_loadu_ps(mx), &lo, &hi, &done);
    _mm_storeu_ps(mn, lo);
    _mm_storeu_ps(mx, hi);
}

}  // namespace ora::numeric::kernels
