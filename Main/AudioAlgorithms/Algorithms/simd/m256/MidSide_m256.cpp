// LR2MS and MS2LR, 256-bit form.
#include "Algorithms/simd/MidSideKernels.h"
#include "Algorithms/simd/StreamBodies.h"
#include "Algorithms/simd/m256/VecM256.h"

namespace ora::numeric::kernels {

void LR2MS_m256(const float* l, const float* r, float* m, float* s, std::size_t frames) {
    simd::LR2MS<VecM256>(l, r, m, s, frames);
}

void MS2LR_m256(const float* m, const float* s, float* l, float* r, std::size_t frames) {
    simd::MS2LR<VecM256>(m, s, l, r, frames);
}

}  // namespace ora::numeric::kernels
