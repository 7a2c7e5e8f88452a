#include "zn_noise_profile.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <new>
#include <sstream>

namespace zen::noise_reduction {

namespace {

constexpr double kDbFloor = -300.0;

}  // namespace

bool zn_noise_profile::Configure(std::size_t channels, std::size_t bins, double sampleRate, double windowEnergy) {
    m_channels = 0;
    m_bins = 0;
    if (channels == 0 || channels > kMaxChannels || bins < 2 || !(sampleRate > 0.0) || !(windowEnergy > 0.0))
        return false;
    try {
        m_sum.Resize(channels * bins);
        m_counts.Resize(channels);
        m_power.Resize(channels * bins);
        m_stored.reserve(channels * bins);
    } catch (const std::bad_alloc&) {
        return false;
    }
    m_channels = channels;
    m_bins = bins;
    m_sampleRate = sampleRate;
    m_windowEnergy = windowEnergy;
    m_learning = false;
    m_learnt = 0;
    Rebuild();
    return true;
}

void zn_noise_profile::Begin() noexcept {
    m_sum.Clear();
    m_counts.Clear();
    m_learnt = 0;
    m_learning = m_channels > 0;
}

void zn_noise_profile::Learn(std::size_t channel, const float* power) noexcept {
    if (!m_learning || channel >= m_channels) return;
    double* sum = m_sum.data() + channel * m_bins;
    for (std::size_t k = 0; k < m_bins; ++k) sum[k] += power[k];
    ++m_counts[channel];
    if (channel == 0) ++m_learnt;
}

std::uint64_t zn_noise_profile::End() noexcept {
    if (!m_learning) return 0;
    m_learning = false;
    if (m_learnt == 0) return 0;
    // Within the capacity reserved at Configure: no allocation.
    if (m_stored.capacity() < m_channels * m_bins) return 0;
    m_stored.resize(m_channels * m_bins);
    for (std::size_t c = 0; c < m_channels; ++c) {
        const std::size_t source = m_counts[c] > 0 ? c : 0;
        const double scale = 1.0 / (static_cast<double>(m_counts[source]) * m_windowEnergy);
        for (std::size_t k = 0; k < m_bins; ++k)
            m_stored[c * m_bins + k] = static_cast<float>(m_sum[source * m_bins + k] * scale);
    }
    m_storedRate = m_sampleRate;
    m_storedBins = m_bins;
    m_storedChannels = m_channels;
    m_hasProfile = true;
    Rebuild();
    return m_learnt;
}

const float* zn_noise_profile::Power(std::size_t channel) const {
    return m_power.data() + std::min(channel, m_channels > 0 ? m_channels - 1 : 0) * m_bins;
}

void zn_noise_profile::Rebuild() noexcept {
    if (!m_hasProfile || m_storedBins < 2 || m_storedChannels == 0 || m_bins == 0) {
        m_power.Clear();
        return;
    }
    const double binHz = m_sampleRate / (2.0 * static_cast<double>(m_bins - 1));
    const double storedBinHz = m_storedRate / (2.0 * static_cast<double>(m_storedBins - 1));
    for (std::size_t c = 0; c < m_channels; ++c) {
        const float* stored = m_stored.data() + std::min(c, m_storedChannels - 1) * m_storedBins;
        float* power = m_power.data() + c * m_bins;
        for (std::size_t k = 0; k < m_bins; ++k) {
            const double position = std::min(static_cast<double>(k) * binHz / storedBinHz,
                                             static_cast<double>(m_storedBins - 1));
            const auto i = static_cast<std::size_t>(position);
            const std::size_t j = std::min(i + 1, m_storedBins - 1);
            const double t = position - static_cast<double>(i);
            const double perEnergy = (1.0 - t) * stored[i] + t * stored[j];
            power[k] = static_cast<float>(perEnergy * m_windowEnergy);
        }
    }
}

std::string zn_noise_profile::ToText() const {
    if (!m_hasProfile) return {};
    std::string text = std::string(kTextTag) + " " + std::to_string(static_cast<long long>(std::llround(m_storedRate))) +
                       " " + std::to_string(m_storedBins) + " " + std::to_string(m_storedChannels);
    char number[32];
    for (std::size_t i = 0; i < m_storedBins * m_storedChannels; ++i) {
        const double db = m_stored[i] > 0.0f ? std::max(10.0 * std::log10(m_stored[i]), kDbFloor) : kDbFloor;
        std::snprintf(number, sizeof number, " %.2f", db);
        text += number;
    }
    return text;
}

bool zn_noise_profile::FromText(const std::string& text) {
    std::istringstream in(text);
    std::string tag;
    double rate = 0.0;
    long long bins = 0, channels = 0;
    if (!(in >> tag >> rate >> bins >> channels) || tag != kTextTag || !(rate > 0.0) || bins < 2 || channels < 1 ||
        bins > (1 << 20) || channels > static_cast<long long>(kMaxChannels))
        return false;
    std::vector<float> values(static_cast<std::size_t>(bins * channels));
    for (float& v : values) {
        double db = 0.0;
        if (!(in >> db) || !std::isfinite(db)) return false;
        v = db <= kDbFloor ? 0.0f : static_cast<float>(std::pow(10.0, db / 10.0));
    }
    std::string rest;
    if (in >> rest) return false;
    m_stored.assign(values.begin(), values.end());
    m_storedRate = rate;
    m_storedBins = static_cast<std::size_t>(bins);
    m_storedChannels = static_cast<std::size_t>(channels);
    m_hasProfile = true;
    Rebuild();
    return true;
}

}  // namespace zen::noise_reduction
