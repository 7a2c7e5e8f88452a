#include "FFT/FFT.h"

#include <cstdlib>
#include <cstring>
#include <stdexcept>

#include "FFT/FftwBackend.h"
#include "FFT/KissBackend.h"

namespace ora::fft {

bool FFT::IsAvailable(Backend backend) { return backend == Backend::Kiss || FftwBackend::IsAvailable(); }

Backend FFT::DefaultBackend() {
    static const Backend chosen = [] {
        const char* forced = std::getenv("ORA_FFT");
        if (forced != nullptr && std::strcmp(forced, "kiss") == 0) return Backend::Kiss;
        return FftwBackend::IsAvailable() ? Backend::Fftw : Backend::Kiss;
    }();
    return chosen;
}

const char* FFT::BackendName(Backend backend) { return backend == Backend::Fftw ? "fftw" : "kiss"; }

FFT::FFT(std::size_t length, Backend backend) : m_length(length), m_backend(backend) {
    if (length < 2 || length % 2 != 0) throw std::invalid_argument("FFT length must be even and non-zero");
    if (!IsAvailable(backend)) throw std::invalid_argument("FFT back end not built");
    if (backend == Backend::Fftw)
        m_impl = std::make_unique<FftwBackend>(length);
    else
        m_impl = std::make_unique<KissBackend>(length);
}

FFT::~FFT() = default;
FFT::FFT(FFT&&) noexcept = default;
FFT& FFT::operator=(FFT&&) noexcept = default;

}  // namespace ora::fft
