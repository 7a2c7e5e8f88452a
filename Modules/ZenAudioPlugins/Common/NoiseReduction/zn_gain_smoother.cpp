#include "zn_gain_smoother.h"

#include <algorithm>
#include <cmath>
#include <new>

namespace zen::noise_reduction {

bool zn_gain_smoother::Configure(std::size_t channels, std::size_t bins, double sampleRate, double hopSeconds) {
    m_channels = 0;
    m_bins = 0;
    if (channels == 0 || bins < 2 || !(sampleRate > 0.0) || !(hopSeconds > 0.0)) return false;
    try {
        m_halfWidth.Resize(bins);
        m_prefix.Resize(bins + 1);
        m_smoothed.Resize(channels * bins);
        m_started.Resize(channels);
    } catch (const std::bad_alloc&) {
        return false;
    }
    m_channels = channels;
    m_bins = bins;
    m_binHz = sampleRate / (2.0 * static_cast<double>(bins - 1));
    m_hopSeconds = hopSeconds;
    SetAmount(m_amount);
    Reset();
    return true;
}

void zn_gain_smoother::Reset() noexcept {
    m_smoothed.Clear();
    m_started.Clear();
}

void zn_gain_smoother::SetAmount(float amount) noexcept {
    m_amount = std::clamp(std::isfinite(amount) ? amount : 0.0f, 0.0f, 1.0f);
    const double seconds = kMaxTimeSeconds * m_amount;
    m_timeCoefficient = seconds > 0.0 ? static_cast<float>(std::exp(-m_hopSeconds / seconds)) : 0.0f;
    // Half a band of `octaves` around bin k spans k * (2^(octaves/2) - 1) bins.
    const double spread = std::pow(2.0, kMaxOctaves * m_amount / 2.0) - 1.0;
    for (std::size_t k = 0; k < m_halfWidth.size(); ++k) {
        const double hz = static_cast<double>(k) * m_binHz;
        m_halfWidth[k] = hz < kLowestSmoothedHz ? 0 : static_cast<std::size_t>(static_cast<double>(k) * spread);
    }
}

void zn_gain_smoother::Process(std::size_t channel, float* gain, float floor) noexcept {
    if (channel >= m_channels || m_amount <= 0.0f) return;
    const std::size_t bins = m_bins;
    double* prefix = m_prefix.data();
    prefix[0] = 0.0;
    for (std::size_t k = 0; k < bins; ++k) prefix[k + 1] = prefix[k] + gain[k];
    float* smoothed = m_smoothed.data() + channel * bins;
    const bool started = m_started[channel] != 0;
    m_started[channel] = 1;
    const float a = started ? m_timeCoefficient : 0.0f;
    for (std::size_t k = 0; k < bins; ++k) {
        const std::size_t w = m_halfWidth[k];
        const std::size_t lo = k >= w ? k - w : 0;
        const std::size_t hi = std::min(k + w + 1, bins);
        const auto band = static_cast<float>((prefix[hi] - prefix[lo]) / static_cast<double>(hi - lo));
        smoothed[k] = a * smoothed[k] + (1.0f - a) * band;
        gain[k] = std::max(smoothed[k], floor);
    }
}

}  // namespace zen::noise_reduction
