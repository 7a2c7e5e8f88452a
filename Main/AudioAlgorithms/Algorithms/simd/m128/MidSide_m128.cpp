// LR2MS and MS2LR, 128-bit form.
#include "Algorithms/simd/MidSideKernels.h"
#include "Algorithms/simd/StreamBodies.h"
#include "Algorithms/simd/m128/VecM128.h"

namespace ora::numeric::kernels {

void LR2MS_m128(const float* l, const float* r, float* m, float* s, std::size_t frames) {
    simd::LR2MS<VecM128>(l, r, m, s, frames);
}

void MS2LR_m128(const float* m, const float* s, float* l, float* r, std::size_t frames) {
    simd::MS2LR<VecM128>(m, s, l, r, frames);
}

}  // namespace ora::numeric::kernels
