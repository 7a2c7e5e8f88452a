#include "FFT/Plugins/Polar2Rect.h"

#include <algorithm>
#include <cmath>

#include "FFT/Plugins/Rect2Polar.h"

namespace ora::fft {

bool Polar2Rect::Configure(Frame& frame, const Context& context) {
    return frame.RequireVector(variable::FSIG, type::FREQ_CPLX_VECTOR, context.channels, context.bins) &&
           frame.RequireVector(variable::SFEAT, type::FREQ_REAL_VECTOR, context.rows, context.bins) &&
           frame.RequireVector(variable::PHASE_START, type::FREQ_REAL_VECTOR, context.rows, context.bins);
}

void Polar2Rect::Process(Frame& frame, Context& context) noexcept {
    Complex* fsig = frame.Cplx(variable::FSIG, type::FREQ_CPLX_VECTOR);
    const float* mag = frame.Real(variable::SFEAT, type::FREQ_REAL_VECTOR);
    const float* phase = frame.Real(variable::PHASE_START, type::FREQ_REAL_VECTOR);
    if (fsig == nullptr || mag == nullptr || phase == nullptr) return;
    const std::size_t bins = context.bins;
    const std::size_t channels = context.channels;
    const std::size_t limit = context.bandLimit > 0 && context.bandLimit < bins ? context.bandLimit : bins;
    for (std::size_t c = 0; c < channels; ++c) std::fill(fsig + c * bins + limit, fsig + (c + 1) * bins, Complex{});
    if (!context.SharedRow()) {
        for (std::size_t c = 0; c < channels; ++c)
            for (std::size_t k = 0; k < limit; ++k) fsig[c * bins + k] = std::polar(mag[c * bins + k], phase[c * bins + k]);
        return;
    }
    const float* shared = phase + channels * bins;
    for (std::size_t k = 0; k < limit; ++k) {
        float power;
        const Complex ref = Rect2Polar::SharedReference(fsig, channels, bins, k, power);
        const float norm = std::sqrt(ref.real() * ref.real() + ref.imag() * ref.imag());
        if (!(norm > 0.0f)) continue;  // every channel silent here
        // e^(i psi) times the reference's conjugate phase.
        const Complex turn = std::polar(1.0f / norm, shared[k]) * std::conj(ref);
        for (std::size_t c = 0; c < channels; ++c) fsig[c * bins + k] *= turn;
    }
}

}  // namespace ora::fft
