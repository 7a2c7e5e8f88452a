// Inner loops of the BiquadLanes family, one per form. Free of intrinsics.
#pragma once

#include <cstddef>

#include "Algorithms/simd/BiquadPairKernels.h"

namespace ora::numeric {

// Two second-order sections in series with their own coefficients and
// states; a wire section (the default) passes its input exactly.
struct BiquadLane {
    BiquadSection sections[2];
    double w1[2] = {0.0, 0.0};  // newest internal value, per section
    double w2[2] = {0.0, 0.0};
};

namespace kernels {

using BiquadLanesKernel = void (*)(BiquadLane* const* lanes, float* const* buffers, std::size_t laneCount,
                                   std::size_t count);

void BiquadLanes_ref(BiquadLane* const* lanes, float* const* buffers, std::size_t laneCount, std::size_t count);
void BiquadLanes_m128(BiquadLane* const* lanes, float* const* buffers, std::size_t laneCount, std::size_t count);
void BiquadLanes_m256(BiquadLane* const* lanes, float* const* buffers, std::size_t laneCount, std::size_t count);

}  // namespace kernels

}  // namespace ora::numeric
