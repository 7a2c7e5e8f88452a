// CSquareMagnitude and Rect2Polar, 128-bit form.
#include "Algorithms/simd/ComplexKernels.h"
#include "Algorithms/simd/StreamBodies.h"
#include "Algorithms/simd/m128/VecM128.h"

namespace ora::numeric::kernels {

void CSquareMagnitude_m128(const float* bins, float* out, std::size_t n) { simd::CSquareMagnitude<VecM128>(bins, out, n); }

void Rect2Polar_m128(const float* bins, float* magnitude, float* phase, std::size_t n) {
    simd::Rect2Polar<VecM128>(bins, magnitude, phase, n);
}

}  // namespace ora::numeric::kernels
