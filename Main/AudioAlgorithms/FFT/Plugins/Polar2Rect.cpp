#include "FFT/Plugins/Polar2Rect.h"

#include <cmath>

namespace ora::fft {

bool Polar2Rect::Configure(Frame& frame, const Context& context) {
    return frame.RequireVector(variable::FSIG, type::FREQ_CPLX_VECTOR, context.channels, context.bins) &&
           frame.RequireVector(variable::SFEAT, type::FREQ_REAL_VECTOR, context.rows, context.bins) &&
           frame.RequireVector(variable::PHASE_IN, type::FREQ_REAL_VECTOR, context.rows, context.bins) &&
           frame.RequireVector(variable::PHASE_START, type::FREQ_REAL_VECTOR, context.rows, context.bins);
}

void Polar2Rect::Process(Frame& frame, Context& context) noexcept {
    Complex* fsig = frame.Cplx(variable::FSIG, type::FREQ_CPLX_VECTOR);
    const float* mag = frame.Real(variable::SFEAT, type::FREQ_REAL_VECTOR);
    const float* phaseIn = frame.Real(variable::PHASE_IN, type::FREQ_REAL_VECTOR);
    const float* phase = frame.Real(variable::PHASE_START, type::FREQ_REAL_VECTOR);
    if (fsig == nullptr || mag == nullptr || phaseIn == nullptr || phase == nullptr) return;
    const std::size_t bins = context.bins;
    const bool shared = context.SharedRow();
    const std::size_t ref = context.channels * bins;
    const std::size_t limit = context.bandLimit > 0 && context.bandLimit < bins ? context.bandLimit : bins;
    for (std::size_t c = 0; c < context.channels; ++c) {
        const std::size_t row = c * bins;
        for (std::size_t k = limit; k < bins; ++k) fsig[row + k] = Complex{0.0f, 0.0f};
        for (std::size_t k = 0; k < limit; ++k) {
            const float psi = shared ? phase[ref + k] + (phaseIn[row + k] - phaseIn[ref + k]) : phase[row + k];
            fsig[row + k] = std::polar(mag[row + k], psi);
        }
    }
}

}  // namespace ora::fft
