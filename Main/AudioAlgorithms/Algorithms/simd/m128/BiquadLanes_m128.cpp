// BiquadLanes, 128-bit form: two lanes side by side in double, four samples
// of each loaded and stored at a time; a last odd lane takes the reference.
#include <emmintrin.h>

#include "Algorithms/simd/BiquadLanesKernels.h"

namespace ora::numeric::kernels {

namespace {

constexpr double kGuard = 1e-18;

using Field = double BiquadSection::*;

__m128d Pair(BiquadLane* const* l, std::size_t section, Field field) {
    return _mm_setr_pd(l[0]->sections[section].*field, l[1]->sections[section].*field);
}

void TwoLanes(BiquadLane* const* lanes, float* const* x, std::size_t count) {
    const __m128d g0 = Pair(lanes, 0, &BiquadSection::g), c00 = Pair(lanes, 0, &BiquadSection::c0);
    const __m128d c01 = Pair(lanes, 0, &BiquadSection::c1), c02 = Pair(lanes, 0, &BiquadSection::c2);
    const __m128d c03 = Pair(lanes, 0, &BiquadSection::c3);
    const __m128d g1 = Pair(lanes, 1, &BiquadSection::g), c10 = Pair(lanes, 1, &BiquadSection::c0);
    const __m128d c11 = Pair(lanes, 1, &BiquadSection::c1), c12 = Pair(lanes, 1, &BiquadSection::c2);
    const __m128d c13 = Pair(lanes, 1, &BiquadSection::c3);
    const __m128d guard = _mm_set1_pd(kGuard);
    __m128d a1 = _mm_setr_pd(lanes[0]->w1[0], lanes[1]->w1[0]), a2 = _mm_setr_pd(lanes[0]->w2[0], lanes[1]->w2[0]);
    __m128d b1 = _mm_setr_pd(lanes[0]->w1[1], lanes[1]->w1[1]), b2 = _mm_setr_pd(lanes[0]->w2[1], lanes[1]->w2[1]);
    // One sample of both lanes; the sums in the reference order.
    auto step = [&](__m128d in) {
        __m128d w = _mm_add_pd(_mm_add_pd(_mm_mul_pd(g0, in), _mm_mul_pd(c00, a2)), _mm_mul_pd(c01, a1));
        const __m128d middle =
            _mm_cvtps_pd(_mm_cvtpd_ps(_mm_add_pd(_mm_add_pd(w, _mm_mul_pd(c02, a2)), _mm_mul_pd(c03, a1))));
        a2 = a1;
        a1 = _mm_sub_pd(_mm_add_pd(w, guard), guard);
        w = _mm_add_pd(_mm_add_pd(_mm_mul_pd(g1, middle), _mm_mul_pd(c10, b2)), _mm_mul_pd(c11, b1));
        const __m128 y = _mm_cvtpd_ps(_mm_add_pd(_mm_add_pd(w, _mm_mul_pd(c12, b2)), _mm_mul_pd(c13, b1)));
        b2 = b1;
        b1 = _mm_sub_pd(_mm_add_pd(w, guard), guard);
        return y;  // both lanes in the low half
    };
    float* x0 = x[0];
    float* x1 = x[1];
    std::size_t f = 0;
    for (; f + 4 <= count; f += 4) {
        const __m128 r0 = _mm_loadu_ps(x0 + f), r1 = _mm_loadu_ps(x1 + f);
        const __m128 low = _mm_unpacklo_ps(r0, r1), high = _mm_unpackhi_ps(r0, r1);  // frames f, f+1 | f+2, f+3
        // One frame after the other: the recursion's order.
        const __m128 y0 = step(_mm_cvtps_pd(low));
        const __m128 y1 = step(_mm_cvtps_pd(_mm_movehl_ps(low, low)));
        const __m128 y2 = step(_mm_cvtps_pd(high));
        const __m128 y3 = step(_mm_cvtps_pd(_mm_movehl_ps(high, high)));
        const __m128 y01 = _mm_movelh_ps(y0, y1), y23 = _mm_movelh_ps(y2, y3);
        _mm_storeu_ps(x0 + f, _mm_shuffle_ps(y01, y23, _MM_SHUFFLE(2, 0, 2, 0)));
        _mm_storeu_ps(x1 + f, _mm_shuffle_ps(y01, y23, _MM_SHUFFLE(3, 1, 3, 1)));
    }
    for (; f < count; ++f) {
        const __m128 y = step(_mm_cvtps_pd(_mm_setr_ps(x0[f], x1[f], 0.0f, 0.0f)));
        x0[f] = _mm_cvtss_f32(y);
        x1[f] = _mm_cvtss_f32(_mm_shuffle_ps(y, y, 1));
    }
    double store[2];
    _mm_storeu_pd(store, a1);
    lanes[0]->w1[0] = store[0], lanes[1]->w1[0] = store[1];
    _mm_storeu_pd(store, a2);
    lanes[0]->w2[0] = store[0], lanes[1]->w2[0] = store[1];
    _mm_storeu_pd(store, b1);
    lanes[0]->w1[1] = store[0], lanes[1]->w1[1] = store[1];
    _mm_storeu_pd(store, b2);
    lanes[0]->w2[1] = store[0], lanes[1]->w2[1] = store[1];
}

}  // namespace

void BiquadLanes_m128(BiquadLane* const* lanes, float* const* buffers, std::size_t laneCount, std::size_t count) {
    std::size_t l = 0;
    for (; l + 2 <= laneCount; l += 2) TwoLanes(lanes + l, buffers + l, count);
    if (l < laneCount) BiquadLanes_ref(lanes + l, buffers + l, 1, count);
}

}  // namespace ora::numeric::kernels
