// LaneTranspose, 128-bit form: blocks of 4 lanes x 4 frames.
#include <xmmintrin.h>

#include "Algorithms/simd/LaneTransposeKernels.h"

namespace ora::numeric::kernels {

namespace {

constexpr std::size_t kLanes = 16;

void ToFrames(const float* const* rows, float* frames, std::size_t count) {
    std::size_t f = 0;
    for (; f + 4 <= count; f += 4) {
        for (std::size_t k = 0; k < kLanes; k += 4) {
            __m128 r0 = _mm_loadu_ps(rows[k] + f), r1 = _mm_loadu_ps(rows[k + 1] + f);
            __m128 r2 = _mm_loadu_ps(rows[k + 2] + f), r3 = _mm_loadu_ps(rows[k + 3] + f);
            _MM_TRANSPOSE4_PS(r0, r1, r2, r3);
            _mm_storeu_ps(frames + f * kLanes + k, r0);
            _mm_storeu_ps(frames + (f + 1) * kLanes + k, r1);
            _mm_storeu_ps(frames + (f + 2) * kLanes + k, r2);
            _mm_storeu_ps(frames + (f + 3) * kLanes + k, r3);
        }
    }
    for (; f < count; ++f)
        for (std::size_t k = 0; k < kLanes; ++k) frames[f * kLanes + k] = rows[k][f];
}

void FromFrames(const float* frames, float* const* rows, std::size_t count) {
    std::size_t f = 0;
    for (; f + 4 <= count; f += 4) {
        for (std::size_t k = 0; k < kLanes; k += 4) {
            __m128 r0 = _mm_loadu_ps(frames + f * kLanes + k), r1 = _mm_loadu_ps(frames + (f + 1) * kLanes + k);
            __m128 r2 = _mm_loadu_ps(frames + (f + 2) * kLanes + k), r3 = _mm_loadu_ps(frames + (f + 3) * kLanes + k);
            _MM_TRANSPOSE4_PS(r0, r1, r2, r3);
            _mm_storeu_ps(rows[k] + f, r0);
            _mm_storeu_ps(rows[k + 1] + f, r1);
            _mm_storeu_ps(rows[k + 2] + f, r2);
            _mm_storeu_ps(rows[k + 3] + f, r3);
        }
    }
    for (; f < count; ++f)
        for (std::size_t k = 0; k < kLanes; ++k) rows[k][f] = frames[f * kLanes + k];
}

}  // namespace

const LaneTransposeKernels kLaneTranspose_m128 = {ToFrames, FromFrames};

}  // namespace ora::numeric::kernels
