#include "Lfo.h"

#include <algorithm>
#include <cmath>

namespace {

constexpr double kTwoPi = 6.283185307179586;

}  // namespace

float Lfo::Sine(double phase) noexcept {
    // Fold to a quarter cycle around zero, then an odd Taylor polynomial.
    double q = phase - std::floor(phase + 0.5);
    if (q > 0.25) q = 0.5 - q;
    if (q < -0.25) q = -0.5 - q;
    const double x = kTwoPi * q;
    const double x2 = x * x;
    const double p = 1.0 + x2 * (-1.0 / 6.0 + x2 * (1.0 / 120.0 + x2 * (-1.0 / 5040.0 + x2 * (1.0 / 362880.0 - x2 / 39916800.0))));
    return static_cast<float>(x * p);
}

void Lfo::SetSampleRate(double sampleRate) noexcept {
    m_sampleRate = sampleRate;
    SetRate(m_rate);
}

void Lfo::SetRate(double hertz) noexcept {
    m_rate = hertz;
    // At most one cycle per sample, so the phase stays in [0, 1).
    m_increment = std::min(std::max(hertz, 0.0) / m_sampleRate, 0.5);
}

void Lfo::Reset() noexcept {
    m_phase = m_startPhase;
    m_seed = 1u + static_cast<std::uint32_t>(m_startPhase * 65536.0);
    m_from = Draw();
    m_to = Draw();
}

float Lfo::Draw() noexcept {
    m_seed = m_seed * 1664525u + 1013904223u;
    return static_cast<float>(m_seed >> 8) * (2.0f / 16777216.0f) - 1.0f;
}

float Lfo::Value() const noexcept {
    switch (m_shape) {
        case kTriangle: {
            double p = m_phase + 0.25;
            if (p >= 1.0) p -= 1.0;
            return static_cast<float>(1.0 - 4.0 * std::fabs(p - 0.5));
        }
        case kRandom: {
            // A raised-cosine step from one random value to the next: smooth, no corners.
            const float s = Sine(0.25 * m_phase);
            return m_from + (m_to - m_from) * s * s;
        }
        case kSine:
        default: return Sine(m_phase);
    }
}
