#include "KWeightingFilter.h"

#include <algorithm>
#include <cmath>

namespace zen {

namespace {
constexpr double kPi = 3.141592653589793;
}  // namespace

KWeightingFilter::Design KWeightingFilter::DesignFor(double sampleRate) {
    Design design{};
    {
        const double k = std::tan(kPi * kShelfFrequency / sampleRate);
        const double vh = std::pow(10.0, kShelfGainDb / 20.0);
        const double vb = std::pow(vh, kShelfMidExponent);
        const double a0 = 1.0 + k / kShelfQ + k * k;
        design[0] = {(vh + vb * k / kShelfQ + k * k) / a0, 2.0 * (k * k - vh) / a0, (vh - vb * k / kShelfQ + k * k) / a0,
                     2.0 * (k * k - 1.0) / a0, (1.0 - k / kShelfQ + k * k) / a0};
    }
    {
        auto a0Of = [](double rate) {
            const double k = std::tan(kPi * kHighPassFrequency / rate);
            return 1.0 + k / kHighPassQ + k * k;
        };
        const double k = std::tan(kPi * kHighPassFrequency / sampleRate);
        const double a0 = a0Of(sampleRate);
        // The published numerator 1, -2, 1 leaves a passband gain of a0
        // (+0.04 dB at 48 kHz); other rates keep that gain rather than
        // their own a0, which would drift by 0.05 dB at 22.05 kHz.
        const double b = a0Of(kReferenceRate) / a0;
        design[1] = {b, -2.0 * b, b, 2.0 * (k * k - 1.0) / a0, (1.0 - k / kHighPassQ + k * k) / a0};
    }
    return design;
}

void KWeightingFilter::Prepare(double sampleRate, std::size_t channels) {
    m_design = DesignFor(sampleRate);
    m_states.assign(channels, State{});
}

void KWeightingFilter::Reset() noexcept { std::fill(m_states.begin(), m_states.end(), State{}); }

void KWeightingFilter::AccumulatePower(std::size_t channel, const float* x, std::size_t n, double& sum) noexcept {
    const Design d = m_design;
    State s = m_states[channel];
    double total = sum;
    for (std::size_t i = 0; i < n; ++i) {
        const double y = Step(d, s, x[i]);
        total += y * y;
    }
    m_states[channel] = s;
    sum = total;
}

void KWeightingFilter::AccumulatePower(std::size_t first, const float* x0, const float* x1, std::size_t n,
                                       double& sum0, double& sum1) noexcept {
    const Design d = m_design;
    State s0 = m_states[first];
    State s1 = m_states[first + 1];
    double total0 = sum0, total1 = sum1;
    for (std::size_t i = 0; i < n; ++i) {
        const double y0 = Step(d, s0, x0[i]);
        const double y1 = Step(d, s1, x1[i]);
        total0 += y0 * y0;
        total1 += y1 * y1;
    }
    m_states[first] = s0;
    m_states[first + 1] = s1;
    sum0 = total0;
    sum1 = total1;
}

}  // namespace zen
