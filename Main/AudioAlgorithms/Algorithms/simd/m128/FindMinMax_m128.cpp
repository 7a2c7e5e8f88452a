// FindMinMax, 128-bit form.
#include "Algorithms/simd/FindMinMaxKernels.h"
#include "Algorithms/simd/ReductionBodies.h"
#include "Algorithms/simd/m128/VecM128.h"

namespace ora::numeric::kernels {

void FindMinMax_m128(const float* x, std::size_t frames, int channels, float* mn, float* mx) {
    simd::FindMinMax<VecM128>(x, frames, channels, mn, mx);
}

}  // namespace ora::numeric::kernels
