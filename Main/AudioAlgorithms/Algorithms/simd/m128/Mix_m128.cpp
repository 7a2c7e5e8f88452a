// Mix, 128-bit form.
#include "Algorithms/simd/MixKernels.h"
#include "Algorithms/simd/StreamBodies.h"
#include "Algorithms/simd/m128/VecM128.h"

namespace ora::numeric::kernels {

void Mix_m128(const float* const* sources, const float* weights, std::size_t count, float* out, std::size_t frames) {
    simd::Mix<VecM128>(sources, weights, count, out, frames);
}

}  // namespace ora::numeric::kernels
