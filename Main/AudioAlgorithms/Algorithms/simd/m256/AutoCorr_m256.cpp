// AutoCorr, 256-bit form.
#include "Algorithms/simd/AutoCorrKernels.h"
#include "Algorithms/simd/FilterBodies.h"
#include "Algorithms/simd/m256/VecM256.h"

namespace ora::numeric::kernels {

void AutoCorr_m256(const float* x, std::size_t frames, float* r, std::size_t lags) {
    simd::AutoCorrelate<VecM256>(x, frames, r, lags);
}

}  // namespace ora::numeric::kernels
