// Mix, 256-bit form.
#include "Algorithms/simd/MixKernels.h"
#include "Algorithms/simd/StreamBodies.h"
#include "Algorithms/simd/m256/VecM256.h"

namespace ora::numeric::kernels {

void Mix_m256(const float* const* sources, const float* weights, std::size_t count, float* out, std::size_t frames) {
    simd::Mix<VecM256>(sources, weights, count, out, frames);
}

}  // namespace ora::numeric::kernels
