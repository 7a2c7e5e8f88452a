// FIRS, 128-bit plain form.
#include "Algorithms/simd/FIRKernels.h"
#include "Algorithms/simd/FilterBodies.h"
#include "Algorithms/simd/m128/VecM128.h"

namespace ora::numeric::kernels {

void FIRS_c1_m128(const float* run, const float* half, std::size_t length, float* out, std::size_t frames) {
    simd::FirSymmetricOne<VecM128>(run, half, length, out, frames);
}

void FIRS_c2_m128(const float* run0, const float* run1, const float* half, std::size_t length, float* out0, float* out1,
                  std::size_t frames) {
    simd::FirSymmetricTwo<VecM128>(run0, run1, half, length, out0, out1, frames);
}

}  // namespace ora::numeric::kernels
