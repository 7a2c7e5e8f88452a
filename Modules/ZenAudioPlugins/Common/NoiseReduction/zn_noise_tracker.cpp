#include "zn_noise_tracker.h"

#include <algorithm>
#include <cmath>
#include <new>

namespace zen::noise_reduction {

namespace {

float Coefficient(double seconds, double hopSeconds) {
    return static_cast<float>(std::exp(-hopSeconds / seconds));
}

}  // namespace

bool zn_noise_tracker::Configure(std::size_t channels, std::size_t bins, double hopSeconds) {
    m_channels = 0;
    m_bins = 0;
    if (channels == 0 || bins < 2 || !(hopSeconds > 0.0)) return false;
    try {
        const std::size_t n = channels * bins;
        m_smoothed.Resize(n);
        m_minimum.Resize(n);
        m_running.Resize(n);
        m_parts.Resize(n * kSubWindows);
        m_part.Resize(channels);
        m_noise.Resize(n);
        m_presence.Resize(n);
        m_frequencySmoothed.Resize(bins);
        m_frames.Resize(channels);
        m_age.Resize(channels);
    } catch (const std::bad_alloc&) {
        return false;
    }
    m_channels = channels;
    m_bins = bins;
    m_alphaS = Coefficient(kPowerSmoothingSeconds, hopSeconds);
    m_alphaD = Coefficient(kNoiseSmoothingSeconds, hopSeconds);
    m_alphaP = Coefficient(kPresenceSmoothingSeconds, hopSeconds);
    m_subWindow = static_cast<std::uint32_t>(
        std::max(1.0, std::round(kMinimumWindowSeconds / kSubWindows / hopSeconds)));
    m_warmUp = static_cast<std::uint32_t>(std::max(1.0, std::round(kWarmUpSeconds / hopSeconds)));
    Reset();
    return true;
}

void zn_noise_tracker::Reset() noexcept {
    m_smoothed.Clear();
    m_minimum.Clear();
    m_running.Clear();
    m_parts.Clear();
    m_part.Clear();
    m_noise.Clear();
    m_presence.Clear();
    m_frames.Clear();
    m_age.Clear();
}

void zn_noise_tracker::Update(std::size_t channel, const float* power, float voice) noexcept {
    if (channel >= m_channels) return;
    const std::size_t bins = m_bins;
    const std::size_t offset = channel * bins;
    float* s = m_smoothed.data() + offset;
    float* smin = m_minimum.data() + offset;
    float* stmp = m_running.data() + offset;
    float* noise = m_noise.data() + offset;
    float* p = m_presence.data() + offset;
    float* sf = m_frequencySmoothed.data();
    voice = std::clamp(voice, 0.0f, 1.0f);

    // A three-bin smoothing across frequency steadies the minimum search.
    sf[0] = 0.5f * (power[0] + power[1]);
    for (std::size_t k = 1; k + 1 < bins; ++k) sf[k] = 0.25f * (power[k - 1] + power[k + 1]) + 0.5f * power[k];
    sf[bins - 1] = 0.5f * (power[bins - 2] + power[bins - 1]);

    std::uint32_t& frames = m_frames[channel];
    std::uint32_t& age = m_age[channel];
    float* parts = m_parts.data() + offset * kSubWindows;
    if (age < m_warmUp) {
        // The plain mean of the frames so far; the minima start from a
        // settled smoothed power rather than from one frame's chance low.
        const float share = 1.0f / static_cast<float>(++age);
        const float as = frames == 0 ? 0.0f : m_alphaS;
        for (std::size_t k = 0; k < bins; ++k) {
            s[k] = std::max(as * s[k] + (1.0f - as) * sf[k], kPowerFloor);
            smin[k] = stmp[k] = s[k];
            for (std::uint32_t u = 0; u < kSubWindows; ++u) parts[u * bins + k] = s[k];
            noise[k] = std::max(noise[k] + share * (power[k] - noise[k]), kPowerFloor);
            p[k] = 0.0f;
        }
    } else {
        const float as = m_alphaS, ad = m_alphaD, ap = m_alphaP;
        for (std::size_t k = 0; k < bins; ++k) {
            s[k] = std::max(as * s[k] + (1.0f - as) * sf[k], kPowerFloor);
            smin[k] = std::min(smin[k], s[k]);
            stmp[k] = std::min(stmp[k], s[k]);
            const float indicator = s[k] > kPresenceRatio * smin[k] ? voice : 0.0f;
            p[k] = ap * p[k] + (1.0f - ap) * indicator;
            const float held = power[k] > kSpeechGate * noise[k] ? voice : p[k];
            const float a = ad + (1.0f - ad) * std::max(p[k], held);
            const float averaged = std::min(a * noise[k] + (1.0f - a) * power[k], kFollowDown * s[k]);
            noise[k] = std::max(std::max(averaged, kMinimumShare * smin[k]), kPowerFloor);
        }
    }
    if (++frames > m_subWindow) {
        // The part ends: the window's minimum drops the oldest part.
        std::uint32_t& part = m_part[channel];
        float* newest = parts + part * bins;
        for (std::size_t k = 0; k < bins; ++k) newest[k] = stmp[k];
        part = (part + 1) % kSubWindows;
        for (std::size_t k = 0; k < bins; ++k) {
            float m = s[k];
            for (std::uint32_t u = 0; u < kSubWindows; ++u) m = std::min(m, parts[u * bins + k]);
            smin[k] = m;
            stmp[k] = s[k];
        }
        frames = 1;
    }
}

}  // namespace zen::noise_reduction
