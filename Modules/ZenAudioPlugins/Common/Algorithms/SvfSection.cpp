#include "SvfSection.h"

#include <cmath>

namespace zen {

namespace {

// Added to and taken from the stored state: values that would turn denormal vanish.
constexpr double kDenormalGuard = 1e-18;

}  // namespace

SvfSection::Coefficients SvfSection::FromBiQuad(const BiQuad::Coefficients& c) {
    // H(z) = (b0 + b1 z^-1 + b2 z^-2) / (1 + a1 z^-1 + a2 z^-2) of the direct form.
    const double a1 = -c.c1, a2 = -c.c0;
    const double b0 = c.g, b1 = c.g * c.c3, b2 = c.g * c.c2;
    // The integrators' denominator, (1 + gk + g^2) + (2g^2 - 2) z^-1 + (1 - gk + g^2) z^-2,
    // over its first term d, matched to the design's.
    const double g2 = (1.0 + a1 + a2) / (1.0 - a1 + a2);
    const double g = std::sqrt(g2);
    const double d = 4.0 / (1.0 - a1 + a2);
    const double k = (d - 1.0 - g2) / g;
    // The numerator as a mix of high, band and low outputs, whose numerators
    // are (1 - z^-1)^2, g (1 - z^-2) and g^2 (1 + z^-1)^2 over d.
    const double high = (b0 - b1 + b2) * d / 4.0;
    const double band = (b0 - b2) * d / (2.0 * g);
    const double low = (b0 + b1 + b2) * d / (4.0 * g2);
    Coefficients s;
    s.a1 = 1.0 / (1.0 + g * (g + k));
    s.a2 = g * s.a1;
    s.a3 = g * s.a2;
    // High = x - k band - low, so the mix is of input, band and low.
    s.m0 = high;
    s.m1 = band - k * high;
    s.m2 = low - high;
    return s;
}

void SvfSection::SetChannelCount(std::uint64_t channels) { m_states.resize(channels); }

void SvfSection::Reset() {
    for (State& s : m_states) s = State{};
}

void SvfSection::Process(float* const* channels, std::uint64_t count) noexcept {
    const Coefficients c = m_coefficients;
    for (std::size_t ch = 0; ch < m_states.size(); ++ch) {
        double ic1 = m_states[ch].ic1, ic2 = m_states[ch].ic2;
        float* x = channels[ch];
        for (std::uint64_t n = 0; n < count; ++n) {
            const double v0 = x[n];
            const double v3 = v0 - ic2;
            const double v1 = c.a1 * ic1 + c.a2 * v3;
            const double v2 = ic2 + c.a2 * ic1 + c.a3 * v3;
            ic1 = ((2.0 * v1 - ic1) + kDenormalGuard) - kDenormalGuard;
            ic2 = ((2.0 * v2 - ic2) + kDenormalGuard) - kDenormalGuard;
            x[n] = static_cast<float>(c.m0 * v0 + c.m1 * v1 + c.m2 * v2);
        }
        // A non-finite input would otherwise stay in the integrators for ever.
        if (!std::isfinite(ic1) || !std::isfinite(ic2)) ic1 = ic2 = 0.0;
        m_states[ch] = {ic1, ic2};
    }
}

}  // namespace zen
