// FindMinMax, 256-bit form.
#include "Algorithms/simd/FindMinMaxKernels.h"
#include "Algorithms/simd/ReductionBodies.h"
#include "Algorithms/simd/m256/VecM256.h"

namespace ora::numeric::kernels {

void FindMinMax_m256(const float* x, std::size_t frames, int channels, float* mn, float* mx) {
    simd::FindMinMax<VecM256>(x, frames, channels, mn, mx);
}

}  // namespace ora::numeric::kernels
