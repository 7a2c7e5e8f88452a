// The library's FFT: real and complex transforms of one even length, on a
// back end chosen when the object is built. KISS FFT is always there; FFTW
// (single precision) is used when the build found it. ORA_FFT=kiss|fftw,
// read once, overrides the default choice for a whole run.
//
// Construction plans and allocates (not on the audio path); the transforms
// never allocate, lock or throw. Inverse transforms are unscaled.
#pragma once

#include <cstddef>
#include <memory>

#include "FFT/FFTBackend.h"

namespace ora::fft {

enum class Backend { Kiss, Fftw };

class FFT {
public:
    static bool IsAvailable(Backend backend);
    // FFTW when available, unless ORA_FFT says otherwise.
    static Backend DefaultBackend();
    static const char* BackendName(Backend backend);

    // Throws std::invalid_argument for an odd or zero length or a back end
    // this build lacks, std::bad_alloc when planning fails.
    explicit FFT(std::size_t length, Backend backend = DefaultBackend());
    ~FFT();
    FFT(FFT&&) noexcept;
    FFT& operator=(FFT&&) noexcept;

    std::size_t Length() const { return m_length; }
    std::size_t Bins() const { return m_length / 2 + 1; }
    Backend GetBackend() const { return m_backend; }

    void ForwardReal(const float* in, Complex* out) noexcept { m_impl->ForwardReal(in, out); }
    void InverseReal(const Complex* in, float* out) noexcept { m_impl->InverseReal(in, out); }
    void ForwardComplex(const Complex* in, Complex* out) noexcept { m_impl->ForwardComplex(in, out); }
    void InverseComplex(const Complex* in, Complex* out) noexcept { m_impl->InverseComplex(in, out); }

private:
    std::size_t m_length;
    Backend m_backend;
    std::unique_ptr<FFTBackend> m_impl;
};

}  // namespace ora::fft
