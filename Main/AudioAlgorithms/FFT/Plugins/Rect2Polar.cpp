#include "FFT/Plugins/Rect2Polar.h"

#include <cmath>

#include "FFT/PhaseMath.h"

namespace ora::fft {

namespace {

// Magnitude and phase of n bins whose powers are given, the phase turned
// by `turn` per bin; four at a time, the last few as lanes of their own.
void Polar(const Complex* x, const float* power, float* mag, float* phase, std::size_t n, float turn) noexcept {
    const Float4 lane = {0.0f, 1.0f, 2.0f, 3.0f};
    std::size_t k = 0;
    for (; k + 4 <= n; k += 4) {
        const Float4 re = {x[k].real(), x[k + 1].real(), x[k + 2].real(), x[k + 3].real()};
        const Float4 im = {x[k].imag(), x[k + 1].imag(), x[k + 2].imag(), x[k + 3].imag()};
        Store4(phase + k, Atan2(im, re) + (lane + static_cast<float>(k)) * turn);
        for (std::size_t i = 0; i < 4; ++i) mag[k + i] = std::sqrt(power[k + i]);
    }
    for (; k < n; ++k) {
        phase[k] = Atan2(Splat(x[k].imag()), Splat(x[k].real()))[0] + static_cast<float>(k) * turn;
        mag[k] = std::sqrt(power[k]);
    }
}

}  // namespace

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
        Polar(reference, mag2 + r, mag + r, phase + r, bins, turn);
        return;
    }
    for (std::size_t c = 0; c < context.channels; ++c) {
        const Complex* x = fsig + c * bins;
        const std::size_t row = c * bins;
        for (std::size_t k = 0; k < bins; ++k) mag2[row + k] = x[k].real() * x[k].real() + x[k].imag() * x[k].imag();
        Polar(x, mag2 + row, mag + row, phase + row, bins, turn);
    }
}

}  // namespace ora::fft
