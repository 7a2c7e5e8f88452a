#include "FFT/Plugins/In2Dft.h"

#include <algorithm>

namespace ora::fft {

bool In2Dft::Configure(Frame& frame, const Context& context) {
    m_frame.Resize(context.frameLength);
    return frame.RequireVector(variable::TSIG, type::SIG_REAL_VECTOR, context.channels, context.fftLength) &&
           frame.RequireVector(variable::FSIG, type::FREQ_CPLX_VECTOR, context.channels, context.bins);
}

void In2Dft::Process(Frame& frame, Context& context) noexcept {
    float* tsig = frame.Real(variable::TSIG, type::SIG_REAL_VECTOR);
    Complex* fsig = frame.Cplx(variable::FSIG, type::FREQ_CPLX_VECTOR);
    if (tsig == nullptr || fsig == nullptr) return;
    const std::size_t n = context.frameLength;
    const std::size_t m = context.fftLength;
    const std::size_t half = n / 2;
    const float* win = context.window->Analysis();
    for (std::size_t c = 0; c < context.channels; ++c) {
        (*context.in)[c].Read(context.analysisStart, m_frame.data(), n);
        float* t = tsig + c * m;
        std::fill(t, t + m, 0.0f);
        // Frame sample j sits at transform index (j - n/2) mod m.
        for (std::size_t j = 0; j < half; ++j) t[j + m - half] = m_frame[j] * win[j];
        for (std::size_t j = half; j < n; ++j) t[j - half] = m_frame[j] * win[j];
        context.fft->ForwardReal(t, fsig + c * context.bins);
    }
}

}  // namespace ora::fft
