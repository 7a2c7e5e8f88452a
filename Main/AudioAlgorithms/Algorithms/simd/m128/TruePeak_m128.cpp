// TruePeak's scan of the oversampled points, 128-bit form (the fused forms
// differ only in the oversampling sums and use it too).
#include "Algorithms/simd/ReductionBodies.h"
#include "Algorithms/simd/TruePeakKernels.h"
#include "Algorithms/simd/m128/VecM128.h"

namespace ora::numeric::kernels {

float TruePeakScan_m128(const float* points, std::size_t middles, float peak) {
    return simd::TruePeakScan<VecM128>(points, middles, peak);
}

}  // namespace ora::numeric::kernels
