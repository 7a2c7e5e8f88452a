// ModulatedTap, 128-bit form: four frames at a time.
#include <emmintrin.h>

#include "Algorithms/simd/ModulatedTapKernels.h"

namespace ora::numeric::kernels {

namespace {

inline float One(const float* x, float p, float fraction, float weight, std::ptrdiff_t f) {
    const auto whole = static_cast<std::ptrdiff_t>(p);
    const float a = x[f - whole];
    const float b = x[f - whole - 1];
    return weight * (a + fraction * (b - a));
}

}  // namespace

void ModulatedTap_m128(const float* x, const float* s, float delay, float depth, float weight, float* out,
                       std::size_t count, bool accumulate) {
    const __m128 one = _mm_set1_ps(1.0f), centre = _mm_set1_ps(delay), swing = _mm_set1_ps(depth);
    const __m128 w = _mm_set1_ps(weight);
    std::size_t f = 0;
    for (; f + 4 <= count; f += 4) {
        const __m128 p = _mm_max_ps(_mm_add_ps(centre, _mm_mul_ps(swing, _mm_loadu_ps(s + f))), one);
        const __m128 whole = _mm_cvtepi32_ps(_mm_cvttps_epi32(p));
        const __m128 fraction = _mm_sub_ps(p, whole);
        const float first = _mm_cvtss_f32(whole);
        if (_mm_movemask_ps(_mm_cmpeq_ps(whole, _mm_set1_ps(first))) == 0xF) {
            const float* at = x + static_cast<std::ptrdiff_t>(f) - static_cast<std::ptrdiff_t>(first);
            const __m128 a = _mm_loadu_ps(at), b = _mm_loadu_ps(at - 1);
            __m128 v = _mm_mul_ps(w, _mm_add_ps(a, _mm_mul_ps(fraction, _mm_sub_ps(b, a))));
            if (accumulate) v = _mm_add_ps(_mm_loadu_ps(out + f), v);
            _mm_storeu_ps(out + f, v);
        } else {
            alignas(16) float ps[4], fs[4];
            _mm_store_ps(ps, p);
            _mm_store_ps(fs, fraction);
            for (std::size_t j = 0; j < 4; ++j) {
                const float v = One(x, ps[j], fs[j], weight, static_cast<std::ptrdiff_t>(f + j));
                out[f + j] = accumulate ? out[f + j] + v : v;
            }
        }
    }
    for (; f < count; ++f) {
        const float sw = depth * s[f];
        const float p = delay + sw > 1.0f ? delay + sw : 1.0f;
        const float fraction = p - static_cast<float>(static_cast<std::ptrdiff_t>(p));
        const float v = One(x, p, fraction, weight, static_cast<std::ptrdiff_t>(f));
        out[f] = accumulate ? out[f] + v : v;
    }
}

}  // namespace ora::numeric::kernels
