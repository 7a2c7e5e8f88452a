#include "FFT/Plugins/Polar2Rect.h"

#include <algorithm>
#include <cmath>

#include "FFT/PhaseMath.h"
#include "FFT/Plugins/Rect2Polar.h"

namespace ora::fft {

bool Polar2Rect::Configure(Frame& frame, const Context& context) {
    m_turn.Resize(context.bins);
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
    const bool shared = context.SharedRow();
    // Unit phasors of the reconstructed phases: of each channel's, or of the shared row's.
    const std::size_t rows = shared ? 1 : channels;
    for (std::size_t r = 0; r < rows; ++r) {
        const float* psi = phase + (shared ? channels : r) * bins;
        Complex* turn = shared ? m_turn.data() : fsig + r * bins;
        std::size_t k = 0;
        for (; k + 4 <= limit; k += 4) {
            Float4 s, c;
            SinCos(Load4(psi + k), s, c);
            for (std::size_t i = 0; i < 4; ++i) turn[k + i] = Complex{c[i], s[i]};
        }
        for (; k < limit; ++k) {
            Float4 s, c;
            SinCos(Splat(psi[k]), s, c);
            turn[k] = Complex{c[0], s[0]};
        }
    }
    if (!shared) {
        for (std::size_t c = 0; c < channels; ++c)
            for (std::size_t k = 0; k < limit; ++k) fsig[c * bins + k] *= mag[c * bins + k];
        return;
    }
    for (std::size_t k = 0; k < limit; ++k) {
        float power;
        const Complex ref = Rect2Polar::SharedReference(fsig, channels, bins, k, power);
        const float norm = std::sqrt(ref.real() * ref.real() + ref.imag() * ref.imag());
        if (!(norm > 0.0f)) continue;  // every channel silent here
        // The shared row's new phase less its analysis phase.
        const Complex turn = m_turn[k] * std::conj(ref) / norm;
        for (std::size_t c = 0; c < channels; ++c) fsig[c * bins + k] *= turn;
    }
}

}  // namespace ora::fft
