// random::LCG, 256-bit form: eight consecutive states per vector.
#include "Algorithms/simd/LCGKernels.h"
#include "Algorithms/simd/StreamBodies.h"
#include "Algorithms/simd/m256/VecM256.h"

namespace ora::numeric::kernels {

std::uint32_t LCG_m256_avx2(std::uint32_t state, float* out, std::size_t n) {
    return simd::Lcg<VecM256Avx2>(state, out, n);
}

}  // namespace ora::numeric::kernels
