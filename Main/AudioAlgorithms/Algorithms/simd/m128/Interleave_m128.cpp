// Interleave and Deinterleave of two channels, 128-bit form.
#include "Algorithms/simd/InterleaveKernels.h"
#include "Algorithms/simd/StreamBodies.h"
#include "Algorithms/simd/m128/VecM128.h"

namespace ora::numeric::kernels {

void Interleave_c2_m128(const float* a, const float* b, float* interleaved, std::size_t frames) {
    simd::InterleaveTwo<VecM128>(a, b, interleaved, frames);
}

void Deinterleave_c2_m128(const float* interleaved, float* a, float* b, std::size_t frames) {
    simd::DeinterleaveTwo<VecM128>(interleaved, a, b, frames);
}

}  // namespace ora::numeric::kernels
