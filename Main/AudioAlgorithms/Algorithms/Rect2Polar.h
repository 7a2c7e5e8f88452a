// Magnitude and phase of complex bins, from (re, im) pairs (an FFT's
// std::complex<float> array read as floats):
//   magnitude = sqrt(re * re + im * im): within 1.5 ulp for 1.1e-19 <= |z|
//     <= 1.8e19; below, the squares lose precision (0 under 1e-23); above,
//     +inf.
//   phase = atan2(im, re) in [-pi, pi]: atan of the smaller over the larger
//     part by a polynomial of degree 8 in its square (a Chebyshev fit on
//     [0, 1], within 1.8e-8), placed in its octant with one rounding; within
//     3e-7 rad of atan2 (2.2e-7 measured). A zero bin has phase 0 (-0 when
//     im is -0; atan2 gives pi for -0 + 0i); a NaN part, or two infinite
//     parts, give NaN.
// `ref` takes the same steps, so every form gives its result bit for bit.
#pragma once

#include <cstddef>

#include "Algorithms/simd/ComplexKernels.h"
#include "System/DispatchSettings.h"

namespace ora::numeric {

class Rect2Polar {
public:
    Rect2Polar();

    // n bins (2 n floats) to n magnitudes and n phases; no overlap with `bins`.
    void Process(const float* bins, float* magnitude, float* phase, std::size_t n) const noexcept {
        m_kernel(bins, magnitude, phase, n);
    }

    system::KernelForm GetForm() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }

private:
    system::KernelForm m_form;
    kernels::Rect2PolarKernel m_kernel;
};

}  // namespace ora::numeric
