#include "FFT/Plugins/Rect2Polar.h"

#include <cmath>

#include "FFT/PhaseMath.h"

namespace ora::fft {

bool Rect2Polar::Configure(Frame& frame, const Context& context) {
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
    const double turn = kTwoPi / static_cast<double>(context.fftLength) * context.analysisOffset;
    if (context.SharedRow()) {
        const std::size_t r = context.channels * bins;
        for (std::size_t k = 0; k < bins; ++k) {
            float power;
            const Complex ref = SharedReference(fsig, context.channels, bins, k, power);
            mag2[r + k] = power;
            mag[r + k] = std::sqrt(power);
            phase[r + k] = static_cast<float>(std::atan2(ref.imag(), ref.real()) + turn * static_cast<double>(k));
        }
        return;
    }
    for (std::size_t c = 0; c < context.channels; ++c) {
        const Complex* x = fsig + c * bins;
        for (std::size_t k = 0; k < bins; ++k) {
            const float power = x[k].real() * x[k].real() + x[k].imag() * x[k].imag();
            mag2[c * bins + k] = power;
            mag[c * bins + k] = std::sqrt(power);
            phase[c * bins + k] = static_cast<float>(std::atan2(x[k].imag(), x[k].real()) + turn * static_cast<double>(k));
        }
    }
}

}  // namespace ora::fft
