// One FFT back end: transforms of one length, planned once at construction.
// Execution never allocates. Inverse transforms are unscaled (a forward then
// inverse transform multiplies by the length), as in both libraries.
#pragma once

#include <complex>
#include <cstddef>

namespace ora::fft {

using Complex = std::complex<float>;

class FFTBackend {
public:
    virtual ~FFTBackend() = default;

    // n real samples to n/2 + 1 bins.
    virtual void ForwardReal(const float* in, Complex* out) noexcept = 0;
    // n/2 + 1 bins to n real samples; the imaginary parts of bins 0 and n/2
    // are ignored.
    virtual void InverseReal(const Complex* in, float* out) noexcept = 0;
    virtual void ForwardComplex(const Complex* in, Complex* out) noexcept = 0;
    virtual void InverseComplex(const Complex* in, Complex* out) noexcept = 0;
};

}  // namespace ora::fft
