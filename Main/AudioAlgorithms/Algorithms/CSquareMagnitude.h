// Squared magnitude of complex bins, |z|^2 = re * re + im * im, for power
// spectra. Bins are (re, im) pairs: an FFT's std::complex<float> array read
// as floats. Every form gives the reference result bit for bit.
#pragma once

#include <cstddef>

#include "Algorithms/simd/ComplexKernels.h"
#include "System/DispatchSettings.h"

namespace ora::numeric {

class CSquareMagnitude {
public:
    CSquareMagnitude();

    // n bins (2 n floats) to n values; `out` must not overlap `bins`.
    void Process(const float* bins, float* out, std::size_t n) const noexcept { m_kernel(bins, out, n); }

    system::KernelForm GetForm() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }

private:
    system::KernelForm m_form;
    kernels::CSquareMagnitudeKernel m_kernel;
};

}  // namespace ora::numeric
