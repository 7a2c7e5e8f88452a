// UpsamplerTruePeak_x4, 256-bit plain form.
#include "Algorithms/simd/TruePeakKernels.h"
#include "Algorithms/simd/FilterBodies.h"
#include "Algorithms/simd/m256/VecM256.h"

namespace ora::numeric::kernels {

void UpsamplerTruePeak_x4_m256(const float* run, const float* phases, std::size_t taps, float* out,
                               std::size_t frames) {
    simd::UpsampleTruePeak<VecM256>(run, phases, taps, out, frames);
}

}  // namespace ora::numeric::kernels
