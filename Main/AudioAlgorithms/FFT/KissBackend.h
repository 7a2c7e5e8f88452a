// KISS FFT: always available, any even length.
#pragma once

#include <memory>

#include "FFT/FFTBackend.h"
#include "System/AlignedBuffer.h"

namespace ora::fft {

class KissBackend final : public FFTBackend {
public:
    // Throws std::bad_alloc when a plan cannot be made.
    explicit KissBackend(std::size_t n);
    ~KissBackend() override;
    KissBackend(const KissBackend&) = delete;
    KissBackend& operator=(const KissBackend&) = delete;

    void ForwardReal(const float* in, Complex* out) noexcept override;
    void InverseReal(const Complex* in, float* out) noexcept override;
    void ForwardComplex(const Complex* in, Complex* out) noexcept override;
    void InverseComplex(const Complex* in, Complex* out) noexcept override;

private:
    void FreePlans() noexcept;

    void* m_realForward = nullptr;
    void* m_realInverse = nullptr;
    void* m_complexForward = nullptr;
    void* m_complexInverse = nullptr;
    std::size_t m_n;
    AlignedBuffer<Complex> m_bins;  // the real inverse writes into its input; keep the caller's intact
};

}  // namespace ora::fft
