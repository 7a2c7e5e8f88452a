// FFTW in single precision, when the build found it. Plans are made with
// FFTW_ESTIMATE so construction is quick and never measures the machine.
#pragma once

#include <memory>

#include "FFT/FFTBackend.h"

namespace ora::fft {

class FftwBackend final : public FFTBackend {
public:
    static bool IsAvailable();

    // Throws std::bad_alloc when a plan cannot be made, std::runtime_error
    // when the library was built without FFTW.
    explicit FftwBackend(std::size_t n);
    ~FftwBackend() override;
    FftwBackend(const FftwBackend&) = delete;
    FftwBackend& operator=(const FftwBackend&) = delete;

    void ForwardReal(const float* in, Complex* out) noexcept override;
    void InverseReal(const Complex* in, float* out) noexcept override;
    void ForwardComplex(const Complex* in, Complex* out) noexcept override;
    void InverseComplex(const Complex* in, Complex* out) noexcept override;

private:
    struct Plans;
    std::unique_ptr<Plans> m_plans;
};

}  // namespace ora::fft
