// BiquadPair, 256-bit form: four lanes side by side in double, then pairs.
#include <immintrin.h>

#include "Algorithms/simd/BiquadPairKernels.h"

namespace ora::numeric::kernels {

namespace {

constexpr double kGuard = 1e-18;

void OneLane(const BiquadSection* s, BiquadPairState& st, float* x, std::size_t l, std::size_t count) {
    double a1 = st.w1[0][l], a2 = st.w2[0][l], b1 = st.w1[1][l], b2 = st.w2[1][l];
    for (std::size_t f = 0; f < count; ++f) {
        double w = s[0].g * static_cast<double>(x[f]) + s[0].c0 * a2 + s[0].c1 * a1;
        const float middle = static_cast<float>(w + s[0].c2 * a2 + s[0].c3 * a1);
        a2 = a1;
        a1 = (w + kGuard) - kGuard;
        w = s[1].g * static_cast<double>(middle) + s[1].c0 * b2 + s[1].c1 * b1;
        x[f] = static_cast<float>(w + s[1].c2 * b2 + s[1].c3 * b1);
        b2 = b1;
        b1 = (w + kGuard) - kGuard;
    }
    st.w1[0][l] = a1;
    st.w2[0][l] = a2;
    st.w1[1][l] = b1;
    st.w2[1][l] = b2;
}

}  // namespace

void BiquadPair_m256(const BiquadSection* s, BiquadPairState& st, float* const* lanes, std::size_t laneCount,
                     std::size_t count) {
    const __m128d g0 = _mm_set1_pd(s[0].g), c00 = _mm_set1_pd(s[0].c0), c01 = _mm_set1_pd(s[0].c1);
    const __m128d c02 = _mm_set1_pd(s[0].c2), c03 = _mm_set1_pd(s[0].c3);
    const __m128d g1 = _mm_set1_pd(s[1].g), c10 = _mm_set1_pd(s[1].c0), c11 = _mm_set1_pd(s[1].c1);
    const __m128d c12 = _mm_set1_pd(s[1].c2), c13 = _mm_set1_pd(s[1].c3);
    const __m128d guard = _mm_set1_pd(kGuard);
    const __m256d G0 = _mm256_set1_pd(s[0].g), C00 = _mm256_set1_pd(s[0].c0), C01 = _mm256_set1_pd(s[0].c1);
    const __m256d C02 = _mm256_set1_pd(s[0].c2), C03 = _mm256_set1_pd(s[0].c3);
    const __m256d G1 = _mm256_set1_pd(s[1].g), C10 = _mm256_set1_pd(s[1].c0), C11 = _mm256_set1_pd(s[1].c1);
    const __m256d C12 = _mm256_set1_pd(s[1].c2), C13 = _mm256_set1_pd(s[1].c3);
    const __m256d GUARD = _mm256_set1_pd(kGuard);
    std::size_t l = 0;
    for (; l + 4 <= laneCount; l += 4) {
        __m256d a1 = _mm256_loadu_pd(&st.w1[0][l]), a2 = _mm256_loadu_pd(&st.w2[0][l]);
        __m256d b1 = _mm256_loadu_pd(&st.w1[1][l]), b2 = _mm256_loadu_pd(&st.w2[1][l]);
        float* x0 = lanes[l];
        float* x1 = lanes[l + 1];
        float* x2 = lanes[l + 2];
        float* x3 = lanes[l + 3];
        for (std::size_t f = 0; f < count; ++f) {
            const __m256d x = _mm256_cvtps_pd(_mm_setr_ps(x0[f], x1[f], x2[f], x3[f]));
            __m256d w = _mm256_add_pd(_mm256_add_pd(_mm256_mul_pd(G0, x), _mm256_mul_pd(C00, a2)), _mm256_mul_pd(C01, a1));
            const __m256d middle = _mm256_cvtps_pd(
                _mm256_cvtpd_ps(_mm256_add_pd(_mm256_add_pd(w, _mm256_mul_pd(C02, a2)), _mm256_mul_pd(C03, a1))));
            a2 = a1;
            a1 = _mm256_sub_pd(_mm256_add_pd(w, GUARD), GUARD);
            w = _mm256_add_pd(_mm256_add_pd(_mm256_mul_pd(G1, middle), _mm256_mul_pd(C10, b2)), _mm256_mul_pd(C11, b1));
            const __m128 y =
                _mm256_cvtpd_ps(_mm256_add_pd(_mm256_add_pd(w, _mm256_mul_pd(C12, b2)), _mm256_mul_pd(C13, b1)));
            b2 = b1;
            b1 = _mm256_sub_pd(_mm256_add_pd(w, GUARD), GUARD);
            x0[f] = _mm_cvtss_f32(y);
            x1[f] = _mm_cvtss_f32(_mm_shuffle_ps(y, y, 1));
            x2[f] = _mm_cvtss_f32(_mm_shuffle_ps(y, y, 2));
            x3[f] = _mm_cvtss_f32(_mm_shuffle_ps(y, y, 3));
        }
        _mm256_storeu_pd(&st.w1[0][l], a1);
        _mm256_storeu_pd(&st.w2[0][l], a2);
        _mm256_storeu_pd(&st.w1[1][l], b1);
        _mm256_storeu_pd(&st.w2[1][l], b2);
    }
    for (; l + 2 <= laneCount; l += 2) {
        __m128d a1 = _mm_loadu_pd(&st.w1[0][l]), a2 = _mm_loadu_pd(&st.w2[0][l]);
        __m128d b1 = _mm_loadu_pd(&st.w1[1][l]), b2 = _mm_loadu_pd(&st.w2[1][l]);
        float* x0 = lanes[l];
        float* x1 = lanes[l + 1];
        for (std::size_t f = 0; f < count; ++f) {
            const __m128d x = _mm_cvtps_pd(_mm_setr_ps(x0[f], x1[f], 0.0f, 0.0f));
            __m128d w = _mm_add_pd(_mm_add_pd(_mm_mul_pd(g0, x), _mm_mul_pd(c00, a2)), _mm_mul_pd(c01, a1));
            const __m128d middle =
                _mm_cvtps_pd(_mm_cvtpd_ps(_mm_add_pd(_mm_add_pd(w, _mm_mul_pd(c02, a2)), _mm_mul_pd(c03, a1))));
            a2 = a1;
            a1 = _mm_sub_pd(_mm_add_pd(w, guard), guard);
            w = _mm_add_pd(_mm_add_pd(_mm_mul_pd(g1, middle), _mm_mul_pd(c10, b2)), _mm_mul_pd(c11, b1));
            const __m128 y = _mm_cvtpd_ps(_mm_add_pd(_mm_add_pd(w, _mm_mul_pd(c12, b2)), _mm_mul_pd(c13, b1)));
            b2 = b1;
            b1 = _mm_sub_pd(_mm_add_pd(w, guard), guard);
            x0[f] = _mm_cvtss_f32(y);
            x1[f] = _mm_cvtss_f32(_mm_shuffle_ps(y, y, 1));
        }
        _mm_storeu_pd(&st.w1[0][l], a1);
        _mm_storeu_pd(&st.w2[0][l], a2);
        _mm_storeu_pd(&st.w1[1][l], b1);
        _mm_storeu_pd(&st.w2[1][l], b2);
    }
    if (l < laneCount) OneLane(s, st, lanes[l], l, count);
}

}  // namespace ora::numeric::kernels
