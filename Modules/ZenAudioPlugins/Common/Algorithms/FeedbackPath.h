// What a signal passes on its way back into a delay line: a low cut and a
// high cut (second-order Butterworth sections designed by BiQuad), then a
// soft limiter that leaves everything up to full scale untouched and never
// gives more than kCeiling. So a loop through it stays bounded whatever it is
// fed, and a non-finite sample enters as silence. Prepare allocates; the rest
// is real-time safe.
#pragma once

#include <cmath>
#include <cstdint>
#include <memory>
#include <vector>

#include "BiQuad.h"

class FeedbackPath {
public:
    // The limiter is transparent up to the knee and approaches the ceiling.
    static constexpr float kKnee = 1.0f;
    static constexpr float kCeiling = 2.0f;
    static constexpr double kButterworthQ = 0.7071067811865476;

    static float SoftLimit(float x) noexcept {
        const float magnitude = std::fabs(x);
        if (magnitude <= kKnee) return x;
        if (std::isnan(x)) return 0.0f;
        const float span = kCeiling - kKnee;
        return std::copysign(kKnee + span * std::tanh((magnitude - kKnee) / span), x);
    }

    FeedbackPath();
    ~FeedbackPath();

    void Prepare(double sampleRate, std::uint32_t channels);
    // Cut-off frequencies in Hz; 0 switches a cut off, as does a high cut at
    // or above 0.45 of the rate. Redesigns at once, keeping the filters' state.
    void SetCuts(double lowCut, double highCut);
    void Reset() noexcept;

    // The two cuts as designed (a wire when off).
    const BiQuad::Coefficients& LowCutCoefficients() const { return m_low; }
    const BiQuad::Coefficients& HighCutCoefficients() const { return m_high; }

    float Process(std::uint32_t channel, float x) noexcept {
        State& s = m_states[channel];
        const double v = Section(m_low, s.low, std::isfinite(x) ? x : 0.0f);
        return SoftLimit(static_cast<float>(Section(m_high, s.high, v)));
    }

private:
    struct History {
        double w1 = 0.0, w2 = 0.0;
    };
    struct State {
        History low, high;
    };

    static double Section(const BiQuad::Coefficients& k, History& h, double x) noexcept {
        const double w = k.g * x + k.c0 * h.w2 + k.c1 * h.w1;
        const double y = w + k.c2 * h.w2 + k.c3 * h.w1;
        h.w2 = h.w1;
        h.w1 = (w + 1e-18) - 1e-18;
        return y;
    }

    std::unique_ptr<BiQuad> m_lowDesign;
    std::unique_ptr<BiQuad> m_highDesign;
    BiQuad::Coefficients m_low;
    BiQuad::Coefficients m_high;
    std::vector<State> m_states;
    double m_sampleRate = 48000.0;
};
