// ModulatedTap, 256-bit form: eight frames at a time.
#include <immintrin.h>

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

void ModulatedTap_m256(const float* x, const float* s, float delay, float depth, float weight, float* out,
                       std::size_t count, bool accumulate) {
    const __m256 one = _mm256_set1_ps(1.0f), centre = _mm256_set1_ps(delay), swing = _mm256_set1_ps(depth);
    const __m256 w = _mm256_set1_ps(weight);
    std::size_t f = 0;
    for (; f + 8 <= count; f += 8) {
        const __m256 p = _mm256_max_ps(_mm256_add_ps(centre, _mm256_mul_ps(swing, _mm256_loadu_ps(s + f))), one);
        const __m256 whole = _mm256_cvtepi32_ps(_mm256_cvttps_epi32(p));
        const __m256 fraction = _mm256_sub_ps(p, whole);
        const float first = _mm_cvtss_f32(_mm256_castps256_ps128(whole));
        if (_mm256_movemask_ps(_mm256_cmp_ps(whole, _mm256_set1_ps(first), _CMP_EQ_OQ)) == 0xFF) {
            const float* at = x + static_cast<std::ptrdiff_t>(f) - static_cast<std::ptrdiff_t>(first);
            const __m256 a = _mm256_loadu_ps(at), b = _mm256_loadu_ps(at - 1);
            __m256 v = _mm256_mul_ps(w, _mm256_add_ps(a, _mm256_mul_ps(fraction, _mm256_sub_ps(b, a))));
            if (accumulate) v = _mm256_add_ps(_mm256_loadu_ps(out + f), v);
            _mm256_storeu_ps(out + f, v);
        } else {
            alignas(32) float ps[8], fs[8];
            _mm256_store_ps(ps, p);
            _mm256_store_ps(fs, fraction);
            for (std::size_t j = 0; j < 8; ++j) {
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
