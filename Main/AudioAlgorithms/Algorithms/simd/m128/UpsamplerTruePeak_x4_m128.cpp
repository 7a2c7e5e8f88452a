// UpsamplerTruePeak_x4, 128-bit plain form.
#include "Algorithms/simd/TruePeakKernels.h"
#include "Algorithms/simd/FilterBodies.h"
#include "Algorithms/simd/m128/VecM128.h"

namespace ora::numeric::kernels {

void UpsamplerTruePeak_x4_m128(const float* run, const float* phases, std::size_t taps, float* out,
                               std::size_t frames) {
    simd::UpsampleTruePeak<VecM128>(run, phases, taps, out, frames);
}

}  // namespace ora::numeric::kernels
