#include "FFT/Plugins/Dft2Out.h"

namespace ora::fft {

bool Dft2Out::Configure(Frame& frame, const Context& context) {
    return frame.RequireVector(variable::TSIG, type::SIG_REAL_VECTOR, context.channels, context.fftLength) &&
           frame.RequireVector(variable::FSIG, type::FREQ_CPLX_VECTOR, context.channels, context.bins);
}

void Dft2Out::Process(Frame& frame, Context& context) noexcept {
    float* tsig = frame.Real(variable::TSIG, type::SIG_REAL_VECTOR);
    Complex* fsig = frame.Cplx(variable::FSIG, type::FREQ_CPLX_VECTOR);
    if (tsig == nullptr || fsig == nullptr) return;
    const std::size_t n = context.frameLength;
    const std::size_t m = context.fftLength;
    const std::size_t half = n / 2;
    const float* dual = context.window->Dual();
    const float scale = context.gain / static_cast<float>(m);
    for (std::size_t c = 0; c < context.channels; ++c) {
        float* t = tsig + c * m;
        context.fft->InverseReal(fsig + c * context.bins, t);
        float* out = (*context.out)[c].data();
        for (std::size_t j = 0; j < half; ++j) out[j] += t[j + m - half] * scale * dual[j];
        for (std::size_t j = half; j < n; ++j) out[j] += t[j - half] * scale * dual[j];
    }
}

}  // namespace ora::fft
