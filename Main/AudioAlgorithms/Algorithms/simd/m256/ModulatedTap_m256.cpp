// ModulatedTap, 256-bit form: eight frames at a time.
#include "Algorithms/simd/ModulatedTapKernels.h"
#include "Algorithms/simd/StreamBodies.h"
#include "Algorithms/simd/m256/VecM256.h"

namespace ora::numeric::kernels {

void ModulatedTap_m256(const float* x, const float* s, float delay, float depth, float weight, float* out,
                        std::size_t count, bool accumulate) {
    simd::ModulatedTap<VecM256>(x, s, delay, depth, weight, out, count, accumulate);
}

}  // namespace ora::numeric::kernels
