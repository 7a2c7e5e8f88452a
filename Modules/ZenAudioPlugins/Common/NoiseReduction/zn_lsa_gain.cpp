#include "zn_lsa_gain.h"

#include <algorithm>
#include <cmath>
#include <new>

namespace zen::noise_reduction {

namespace {

constexpr float kEulerGamma = 0.5772157f;
constexpr float kMinV = 1e-12f;
// Beyond this v, exp(-v) and E1(v) are below 1e-7: speech is certain and
// the LSA gain is the Wiener gain.
constexpr float kCertainV = 16.0f;

// Half the exponential integral E1(v): polynomial below 1 and rational
// above (Abramowitz and Stegun 5.1.53 and 5.1.56, errors below 2e-7 and
// 5e-5).
inline float HalfExpIntegral(float v) noexcept {
    if (v < 1.0f) {
        const float poly =
            v * (0.99999193f + v * (-0.24991055f + v * (0.05519968f + v * (-0.00976004f + v * 0.00107857f))));
        return 0.5f * (-std::log(v) - kEulerGamma + poly);
    }
    const float rational = (v * v + 2.334733f * v + 0.250621f) / (v * v + 3.330657f * v + 1.681534f);
    return 0.5f * std::exp(-v) / v * rational;
}

}  // namespace

bool zn_lsa_gain::Configure(std::size_t channels, std::size_t bins, double binHz, double hopSeconds) {
    m_channels = 0;
    m_bins = 0;
    if (channels == 0 || bins == 0 || !(binHz > 0.0) || !(hopSeconds > 0.0)) return false;
    try {
        m_previous.Resize(channels * bins);
        m_smoothedSnr.Resize(channels * bins);
        m_started.Resize(channels);
        m_snr.Resize(bins);
        m_prefix.Resize(bins + 1);
    } catch (const std::bad_alloc&) {
        return false;
    }
    m_channels = channels;
    m_bins = bins;
    m_bandHalfWidth = static_cast<std::size_t>(std::max(1.0, std::round(kBandHalfWidthHz / binHz)));
    m_bandSmoothing = static_cast<float>(std::exp(-hopSeconds / kBandSmoothingSeconds));
    Reset();
    return true;
}

void zn_lsa_gain::Reset() noexcept {
    m_previous.Clear();
    m_smoothedSnr.Clear();
    m_started.Clear();
}

float zn_lsa_gain::LsaGain(float xi, float gamma) noexcept {
    const float v = std::max(xi * gamma / (1.0f + xi), kMinV);
    return std::min(xi / (1.0f + xi) * std::exp(HalfExpIntegral(v)), 1.0f);
}

void zn_lsa_gain::Compute(std::size_t channel, const float* power, const float* noise, float overSubtraction,
                          float floor, const float* presence, float* gain) noexcept {
    if (channel >= m_channels) return;
    const std::size_t bins = m_bins;
    float* previous = m_previous.data() + channel * bins;
    float* smoothed = m_smoothedSnr.data() + channel * bins;
    float* xi = m_snr.data();
    double* prefix = m_prefix.data();
    // The first frame has no previous estimate: its own SNR stands in.
    const bool started = m_started[channel] != 0;
    m_started[channel] = 1;
    const float a = started ? kDecisionDirected : 0.0f;
    const float b = started ? m_bandSmoothing : 0.0f;
    prefix[0] = 0.0;
    for (std::size_t k = 0; k < bins; ++k) {
        const float gamma = std::min(power[k] / std::max(noise[k], kMinNoise), kMaxPosterioriSnr);
        xi[k] = std::max(a * previous[k] + (1.0f - a) * std::max(gamma - 1.0f, 0.0f), kMinPrioriSnr);
        smoothed[k] = b * smoothed[k] + (1.0f - b) * xi[k];
        prefix[k + 1] = prefix[k] + smoothed[k];
    }

    const float logFloor = std::log(std::clamp(floor, 1e-6f, 1.0f));
    const float share = 1.0f / std::max(overSubtraction, 1e-6f);
    const float bandNoise = std::pow(10.0f, kBandNoiseDb / 10.0f), bandSpeech = std::pow(10.0f, kBandSpeechDb / 10.0f);
    const float bandRange = std::log(bandSpeech / bandNoise);
    const std::size_t w = m_bandHalfWidth;
    for (std::size_t k = 0; k < bins; ++k) {
        const float gamma = std::min(power[k] / std::max(noise[k], kMinNoise), kMaxPosterioriSnr);
        // Presence, from the SNRs against the noise as estimated.
        float p = 1.0f;
        const float vRaw = xi[k] * gamma / (1.0f + xi[k]);
        if (vRaw < kCertainV) {
            const float q = presence != nullptr ? std::clamp(1.0f - presence[k], kMinAbsencePrior, kMaxAbsencePrior)
                                                : kAbsencePrior;
            p = 1.0f / (1.0f + q / (1.0f - q) * (1.0f + xi[k]) * std::exp(-vRaw));
            const std::size_t lo = k >= w ? k - w : 0, hi = std::min(k + w + 1, bins);
            const auto band = static_cast<float>((prefix[hi] - prefix[lo]) / static_cast<double>(hi - lo));
            if (band >= bandSpeech) p = 1.0f;
            else if (band > bandNoise) p = std::max(p, std::log(band / bandNoise) / bandRange);
        }
        // The gain, against the noise the sensitivity sets.
        const float x = std::max(xi[k] * share, kMinPrioriSnr), g = gamma * share;
        const float v = std::max(x * g / (1.0f + x), kMinV);
        const float logLsa = std::min(std::log(x / (1.0f + x)) + (v < kCertainV ? HalfExpIntegral(v) : 0.0f), 0.0f);
        gain[k] = std::exp(p * std::max(logLsa, logFloor) + (1.0f - p) * logFloor);
        previous[k] = gain[k] * gain[k] * gamma;
    }
}

}  // namespace zen::noise_reduction
