// UpsamplerTruePeak_x4, 128-bit plain form.
#include "Algorithms/simd/TruePeakKernels.h"
#include "Algorithms/simd/m128/FilterLoops_m128.h"

namespace ora::numeric::kernels {

void UpsamplerTruePeak_x4_m128(const float* run, const float* phases, std::size_t taps, float* out,
                               std::size_t frames) {
    UpsampleTruePeak<SeparateMulAdd>(run, phases, taps, out, frames);
}

}  // namespace ora::numeric::kernels
