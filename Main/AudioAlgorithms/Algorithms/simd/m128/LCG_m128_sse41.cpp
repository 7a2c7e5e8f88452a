// random::LCG, 128-bit form: four consecutive states per vector.
#include "Algorithms/simd/LCGKernels.h"
#include "Algorithms/simd/StreamBodies.h"
#include "Algorithms/simd/m128/VecM128.h"

namespace ora::numeric::kernels {

std::uint32_t LCG_m128_sse41(std::uint32_t state, float* out, std::size_t n) {
    return simd::Lcg<VecM128Sse41>(state, out, n);
}

}  // namespace ora::numeric::kernels
