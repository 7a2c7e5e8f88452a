// AutoCorr, 256-bit fused multiply-add form.
#include "Algorithms/simd/AutoCorrKernels.h"
#include "Algorithms/simd/FilterBodies.h"
#include "Algorithms/simd/m256/VecM256.h"

namespace ora::numeric::kernels {

void AutoCorr_m256_fma(const float* x, std::size_t frames, float* r, std::size_t lags) {
    simd::AutoCorrelate<VecM256Fma>(x, frames, r, lags);
}

}  // namespace ora::numeric::kernels
