// FIR, 256-bit fused multiply-add form.
#include "Algorithms/simd/FIRKernels.h"
#include "Algorithms/simd/FilterBodies.h"
#include "Algorithms/simd/m256/VecM256.h"

namespace ora::numeric::kernels {

void FIR_c1_m256_fma(const float* run, const float* reversed, std::size_t taps, float* out, std::size_t frames) {
    simd::FirOne<VecM256Fma>(run, reversed, taps, out, frames);
}

void FIR_c2_m256_fma(const float* run0, const float* run1, const float* reversed, std::size_t taps, float* out0,
                     float* out1, std::size_t frames) {
    simd::FirTwo<VecM256Fma>(run0, run1, reversed, taps, out0, out1, frames);
}

}  // namespace ora::numeric::kernels
