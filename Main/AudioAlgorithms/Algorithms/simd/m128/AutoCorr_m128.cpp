// AutoCorr, 128-bit form.
#include "Algorithms/simd/AutoCorrKernels.h"
#include "Algorithms/simd/FilterBodies.h"
#include "Algorithms/simd/m128/VecM128.h"

namespace ora::numeric::kernels {

void AutoCorr_m128(const float* x, std::size_t frames, float* r, std::size_t lags) {
    simd::AutoCorrelate<VecM128>(x, frames, r, lags);
}

}  // namespace ora::numeric::kernels
