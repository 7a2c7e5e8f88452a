// AutoCorr, 128-bit fused multiply-add form.
#include "Algorithms/simd/AutoCorrKernels.h"
#include "Algorithms/simd/FilterBodies.h"
#include "Algorithms/simd/m128/VecM128.h"

namespace ora::numeric::kernels {

void AutoCorr_m128_fma(const float* x, std::size_t frames, float* r, std::size_t lags) {
    simd::AutoCorrelate<VecM128Fma>(x, frames, r, lags);
}

}  // namespace ora::numeric::kernels
