// ModulatedTap, 128-bit form: four frames at a time.
#include "Algorithms/simd/ModulatedTapKernels.h"
#include "Algorithms/simd/StreamBodies.h"
#include "Algorithms/simd/m128/VecM128.h"

namespace ora::numeric::kernels {

void ModulatedTap_m128(const float* x, const float* s, float delay, float depth, float weight, float* out,
                        std::size_t count, bool accumulate) {
    simd::ModulatedTap<VecM128>(x, s, delay, depth, weight, out, count, accumulate);
}

}  // namespace ora::numeric::kernels
