// Inner loops of CSquareMagnitude and Rect2Polar, one per form. Free of
// intrinsics. Bins are complex values as (re, im) pairs, the layout of the
// FFT's std::complex<float> arrays.
#pragma once

#include <cstddef>

namespace ora::numeric::kernels {

// out[i] = re * re + im * im
using CSquareMagnitudeKernel = void (*)(const float* bins, float* out, std::size_t n);
// magnitude[i] = sqrt(re * re + im * im), phase[i] = atan2(im, re) (simd/MathBodies.h)
using Rect2PolarKernel = void (*)(const float* bins, float* magnitude, float* phase, std::size_t n);

void CSquareMagnitude_ref(const float* bins, float* out, std::size_t n);
void CSquareMagnitude_m128(const float* bins, float* out, std::size_t n);
void CSquareMagnitude_m256(const float* bins, float* out, std::size_t n);
void Rect2Polar_ref(const float* bins, float* magnitude, float* phase, std::size_t n);
void Rect2Polar_m128(const float* bins, float* magnitude, float* phase, std::size_t n);
void Rect2Polar_m256(const float* bins, float* magnitude, float* phase, std::size_t n);

}  // namespace ora::numeric::kernels
