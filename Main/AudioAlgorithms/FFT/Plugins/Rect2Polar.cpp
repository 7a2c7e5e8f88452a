#include "FFT/Plugins/Rect2Polar.h"

#include <cmath>

#include "FFT/PhaseMath.h"

namespace ora::fft {

void Rect2Polar::Polar(const Complex* x, float* mag, float* phase, std::size_t n, float turn) const noexcept {
    m_polar.Process(reinterpret_cast<const float*>(x), mag, phase, n);
    for (std::size_t k = 0; k < n; ++k) phase[k] += static_cast<float>(k) * turn;
}

bool Rect2Polar::Configure(Frame& frame, const Context& context) {
    m_reference.Resize(context.bins);
    return frame.RequireVector(variable::FSIG, type::FREQ_CPLX_VECTOR, context.channels, context.bins) &&
           frame.RequireVector(variable::SFEAT, type::FREQ_REAL_VECTOR, context.rows, context.bins) &&
           frame.RequireVector(variable::MAG2, type::FREQ_REAL_VECTOR, context.rows, context.bins) &&
           frame.RequireVector(variable::PHASE_IN, type::FREQ_REAL_VECTOR, context.rows, context.bins);
}

void Rect2Polar::Process(Frame& frame, Context& context) noexcept {
    const Complex* fsig = frame.Cplx(variable::FSIG, type::FREQ_CPLX_VECTOR);
    float* mag = frame.Real(variable::SFEAT, type::FREQ_REAL_VECTOR);
    float* mag2 = frame.Real(variable::MAG2, type::FREQ_REAL_VECTOR);
    float* phase = frame.Real(variable::PHASE_IN, type::FREQ_REAL_VECTOR);
    if (fsig == nullptr || mag == nullptr || mag2 == nullptr || phase == nullptr) return;
    const std::size_t bins = context.bins;
    // Phases at the frame's true centre: bin k turns by its frequency times
    // the offset.
    const auto turn = static_cast<float>(kTwoPi / static_cast<double>(context.fftLength) * context.analysisOffset);
    if (context.SharedRow()) {
        const std::size_t r = context.channels * bins;
        Complex* reference = m_reference.data();
        for (std::size_t k = 0; k < bins; ++k) reference[k] = SharedReference(fsig, context.channels, bins, k, mag2[r + k]);
        Polar(reference, mag + r, phase + r, bins, turn);
        // The shared row's magnitude is the channels' total, not its sum's.
        m_func.Sqrt(mag2 + r, mag + r, bins);
        return;
    }
    for (std::size_t c = 0; c < context.channels; ++c) {
        const Complex* x = fsig + c * bins;
        const std::size_t row = c * bins;
        for (std::size_t k = 0; k < bins; ++k) mag2[row + k] = x[k].real() * x[k].real() + x[k].imag() * x[k].imag();
        Polar(x, mag + row, phase + row, bins, turn);
    }
}

}  // namespace ora::fft
