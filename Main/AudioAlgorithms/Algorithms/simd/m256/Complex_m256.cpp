// CSquareMagnitude and Rect2Polar, 256-bit form.
#include "Algorithms/simd/ComplexKernels.h"
#include "Algorithms/simd/StreamBodies.h"
#include "Algorithms/simd/m256/VecM256.h"

namespace ora::numeric::kernels {

void CSquareMagnitude_m256(const float* bins, float* out, std::size_t n) { simd::CSquareMagnitude<VecM256>(bins, out, n); }

void Rect2Polar_m256(const float* bins, float* magnitude, float* phase, std::size_t n) {
    simd::Rect2Polar<VecM256>(bins, magnitude, phase, n);
}

}  // namespace ora::numeric::kernels
