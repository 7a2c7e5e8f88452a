// BiquadLanes, 256-bit form: four lanes side by side in double, four
// samples of each loaded and stored at a time (a 4 x 4 transpose); the
// lanes left over take the 128-bit form.
#include <immintrin.h>

#include "Algorithms/simd/BiquadLanesKernels.h"

namespace ora::numeric::kernels {

namespace {

constexpr double kGuard = 1e-18;

using Field = double BiquadSection::*;

__m256d Four(BiquadLane* const* l, std::size_t section, Field field) {
    return _mm256_setr_pd(l[0]->sections[section].*field, l[1]->sections[section].*field,
                          l[2]->sections[section].*field, l[3]->sections[section].*field);
}

__m256d FourStates(BiquadLane* const* l, double (BiquadLane::*state)[2], std::size_t section) {
    return _mm256_setr_pd((l[0]->*state)[section], (l[1]->*state)[section], (l[2]->*state)[section],
                          (l[3]->*state)[section]);
}

void StoreStates(BiquadLane* const* l, double (BiquadLane::*state)[2], std::size_t section, __m256d v) {
    double store[4];
    _mm256_storeu_pd(store, v);
    for (std::size_t k = 0; k < 4; ++k) (l[k]->*state)[section] = store[k];
}

void FourLanes(BiquadLane* const* lanes, float* const* x, std::size_t count) {
    const __m256d g0 = Four(lanes, 0, &BiquadSection::g), c00 = Four(lanes, 0, &BiquadSection::c0);
    const __m256d c01 = Four(lanes, 0, &BiquadSection::c1), c02 = Four(lanes, 0, &BiquadSection::c2);
    const __m256d c03 = Four(lanes, 0, &BiquadSection::c3);
    const __m256d g1 = Four(lanes, 1, &BiquadSection::g), c10 = Four(lanes, 1, &BiquadSection::c0);
    const __m256d c11 = Four(lanes, 1, &BiquadSection::c1), c12 = Four(lanes, 1, &BiquadSection::c2);
    const __m256d c13 = Four(lanes, 1, &BiquadSection::c3);
    const __m256d guard = _mm256_set1_pd(kGuard);
    __m256d a1 = FourStates(lanes, &BiquadLane::w1, 0), a2 = FourStates(lanes, &BiquadLane::w2, 0);
    __m256d b1 = FourStates(lanes, &BiquadLane::w1, 1), b2 = FourStates(lanes, &BiquadLane::w2, 1);
    // One sample of the four lanes; the sums in the reference order.
    auto step = [&](__m128 in) {
        __m256d w = _mm256_add_pd(_mm256_add_pd(_mm256_mul_pd(g0, _mm256_cvtps_pd(in)), _mm256_mul_pd(c00, a2)),
                                  _mm256_mul_pd(c01, a1));
        const __m256d middle = _mm256_cvtps_pd(
            _mm256_cvtpd_ps(_mm256_add_pd(_mm256_add_pd(w, _mm256_mul_pd(c02, a2)), _mm256_mul_pd(c03, a1))));
        a2 = a1;
        a1 = _mm256_sub_pd(_mm256_add_pd(w, guard), guard);
        w = _mm256_add_pd(_mm256_add_pd(_mm256_mul_pd(g1, middle), _mm256_mul_pd(c10, b2)), _mm256_mul_pd(c11, b1));
        const __m128 y = _mm256_cvtpd_ps(_mm256_add_pd(_mm256_add_pd(w, _mm256_mul_pd(c12, b2)), _mm256_mul_pd(c13, b1)));
        b2 = b1;
        b1 = _mm256_sub_pd(_mm256_add_pd(w, guard), guard);
        return y;
    };
    float* x0 = x[0];
    float* x1 = x[1];
    float* x2 = x[2];
    float* x3 = x[3];
    std::size_t f = 0;
    for (; f + 4 <= count; f += 4) {
        __m128 r0 = _mm_loadu_ps(x0 + f), r1 = _mm_loadu_ps(x1 + f), r2 = _mm_loadu_ps(x2 + f),
               r3 = _mm_loadu_ps(x3 + f);
        _MM_TRANSPOSE4_PS(r0, r1, r2, r3);  // now one frame of the four lanes each
        __m128 y0 = step(r0), y1 = step(r1), y2 = step(r2), y3 = step(r3);
        _MM_TRANSPOSE4_PS(y0, y1, y2, y3);
        _mm_storeu_ps(x0 + f, y0);
        _mm_storeu_ps(x1 + f, y1);
        _mm_storeu_ps(x2 + f, y2);
        _mm_storeu_ps(x3 + f, y3);
    }
    for (; f < count; ++f) {
        const __m128 y = step(_mm_setr_ps(x0[f], x1[f], x2[f], x3[f]));
        x0[f] = _mm_cvtss_f32(y);
        x1[f] = _mm_cvtss_f32(_mm_shuffle_ps(y, y, 1));
        x2[f] = _mm_cvtss_f32(_mm_shuffle_ps(y, y, 2));
        x3[f] = _mm_cvtss_f32(_mm_shuffle_ps(y, y, 3));
    }
    StoreStates(lanes, &BiquadLane::w1, 0, a1);
    StoreStates(lanes, &BiquadLane::w2, 0, a2);
    StoreStates(lanes, &BiquadLane::w1, 1, b1);
    StoreStates(lanes, &BiquadLane::w2, 1, b2);
}

}  // namespace

void BiquadLanes_m256(BiquadLane* const* lanes, float* const* buffers, std::size_t laneCount, std::size_t count) {
    std::size_t l = 0;
    for (; l + 4 <= laneCount; l += 4) FourLanes(lanes + l, buffers + l, count);
    if (l < laneCount) BiquadLanes_m128(lanes + l, buffers + l, laneCount - l, count);
}

}  // namespace ora::numeric::kernels
