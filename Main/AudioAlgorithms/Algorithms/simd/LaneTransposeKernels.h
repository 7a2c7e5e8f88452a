// Inner loops of the LaneTranspose family, one table per form. Free of
// intrinsics. Frames are 16 floats; rows are 16 pointers.
#pragma once

#include <cstddef>

namespace ora::numeric::kernels {

struct LaneTransposeKernels {
    void (*toFrames)(const float* const* rows, float* frames, std::size_t count);
    void (*fromFrames)(const float* frames, float* const* rows, std::size_t count);
};

extern const LaneTransposeKernels kLaneTranspose_ref;
extern const LaneTransposeKernels kLaneTranspose_m128;
extern const LaneTransposeKernels kLaneTranspose_m256;

}  // namespace ora::numeric::kernels
