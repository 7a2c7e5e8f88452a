#include "zn_lsa_gain.h"

#include <algorithm>
#include <cmath>
#include <new>

namespace zen::noise_reduction {

namespace {

constexpr float kEulerGamma = 0.5772157f;
constexpr float kMinV = 1e-12f;

// Half the exponential integral E1(v), and exp(-v) when it was needed:
// polynomial below 1 and rational above (Abramowitz and Stegun 5.1.53 and
// 5.1.56, errors below 2e-7 and 5e-5).
struct HalfE1 {
    float logGainTerm;  // 0.5 * E1(v)
    float expMinusV;
};

inline HalfE1 HalfExpIntegral(float v) noexcept {
    if (v < 1.0f) {
        const float poly =
            v * (0.99999193f + v * (-0.24991055f + v * (0.05519968f + v * (-0.00976004f + v * 0.00107857f))));
        return {0.5f * (-std::log(v) - kEulerGamma + poly), std::exp(-v)};
    }
    const float e = std::exp(-v);
    const float rational = (v * v + 2.334733f * v + 0.250621f) / (v * v + 3.330657f * v + 1.681534f);
    return {0.5f * e / v * rational, e};
}

}  // namespace

bool zn_lsa_gain::Configure(std::size_t channels, std::size_t bins) {
    m_channels = 0;
    m_bins = 0;
    if (channels == 0 || bins == 0) return false;
    try {
        m_previous.Resize(channels * bins);
        m_started.Resize(channels);
    } catch (const std::bad_alloc&) {
        return false;
    }
    m_channels = channels;
    m_bins = bins;
    return true;
}

void zn_lsa_gain::Reset() noexcept {
    m_previous.Clear();
    m_started.Clear();
}

float zn_lsa_gain::LsaGain(float xi, float gamma) noexcept {
    const float v = std::max(xi * gamma / (1.0f + xi), kMinV);
    return std::min(xi / (1.0f + xi) * std::exp(HalfExpIntegral(v).logGainTerm), 1.0f);
}

void zn_lsa_gain::Compute(std::size_t channel, const float* power, const float* noise, float overSubtraction,
                          float floor, const float* presence, float* gain) noexcept {
    if (channel >= m_channels) return;
    float* previous = m_previous.data() + channel * m_bins;
    // The first frame has no previous estimate: its own SNR stands in.
    const bool started = m_started[channel] != 0;
    m_started[channel] = 1;
    const float logFloor = std::log(std::clamp(floor, 1e-6f, 1.0f));
    const float a = started ? kDecisionDirected : 0.0f;
    for (std::size_t k = 0; k < m_bins; ++k) {
        const float gamma = std::min(power[k] / std::max(overSubtraction * noise[k], kMinNoise), kMaxPosterioriSnr);
        const float xi = std::max(a * previous[k] + (1.0f - a) * std::max(gamma - 1.0f, 0.0f), kMinPrioriSnr);
        const float v = std::max(xi * gamma / (1.0f + xi), kMinV);
        const HalfE1 e = HalfExpIntegral(v);
        const float logLsa = std::min(std::log(xi / (1.0f + xi)) + e.logGainTerm, 0.0f);
        const float lsa = std::exp(logLsa);
        previous[k] = lsa * lsa * gamma;
        const float q = presence != nullptr ? std::clamp(1.0f - presence[k], kMinAbsencePrior, kMaxAbsencePrior)
                                            : kAbsencePrior;
        const float p = 1.0f / (1.0f + q / (1.0f - q) * (1.0f + xi) * e.expMinusV);
        gain[k] = std::exp(p * std::max(logLsa, logFloor) + (1.0f - p) * logFloor);
    }
}

}  // namespace zen::noise_reduction
