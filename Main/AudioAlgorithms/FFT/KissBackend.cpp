#include "FFT/KissBackend.h"

#include <kiss_fft.h>
#include <kiss_fftr.h>

#include <algorithm>
#include <new>

namespace ora::fft {

static_assert(sizeof(kiss_fft_cpx) == sizeof(Complex), "KISS FFT works on float pairs");

KissBackend::KissBackend(std::size_t n) : m_n(n), m_bins(n / 2 + 1) {
    const int size = static_cast<int>(n);
    m_realForward = kiss_fftr_alloc(size, 0, nullptr, nullptr);
    m_realInverse = kiss_fftr_alloc(size, 1, nullptr, nullptr);
    m_complexForward = kiss_fft_alloc(size, 0, nullptr, nullptr);
    m_complexInverse = kiss_fft_alloc(size, 1, nullptr, nullptr);
    if (!m_realForward || !m_realInverse || !m_complexForward || !m_complexInverse) {
        FreePlans();
        throw std::bad_alloc();
    }
}

KissBackend::~KissBackend() { FreePlans(); }

void KissBackend::FreePlans() noexcept {
    kiss_fftr_free(m_realForward);
    kiss_fftr_free(m_realInverse);
    kiss_fft_free(m_complexForward);
    kiss_fft_free(m_complexInverse);
    m_realForward = m_realInverse = m_complexForward = m_complexInverse = nullptr;
}

void KissBackend::ForwardReal(const float* in, Complex* out) noexcept {
    kiss_fftr(static_cast<kiss_fftr_cfg>(m_realForward), in, reinterpret_cast<kiss_fft_cpx*>(out));
}

void KissBackend::InverseReal(const Complex* in, float* out) noexcept {
    std::copy_n(in, m_n / 2 + 1, m_bins.data());
    m_bins[0].imag(0.0f);
    m_bins[m_n / 2].imag(0.0f);
    kiss_fftri(static_cast<kiss_fftr_cfg>(m_realInverse), reinterpret_cast<const kiss_fft_cpx*>(m_bins.data()), out);
}

void KissBackend::ForwardComplex(const Complex* in, Complex* out) noexcept {
    kiss_fft(static_cast<kiss_fft_cfg>(m_complexForward), reinterpret_cast<const kiss_fft_cpx*>(in),
             reinterpret_cast<kiss_fft_cpx*>(out));
}

void KissBackend::InverseComplex(const Complex* in, Complex* out) noexcept {
    kiss_fft(static_cast<kiss_fft_cfg>(m_complexInverse), reinterpret_cast<const kiss_fft_cpx*>(in),
             reinterpret_cast<kiss_fft_cpx*>(out));
}

}  // namespace ora::fft
