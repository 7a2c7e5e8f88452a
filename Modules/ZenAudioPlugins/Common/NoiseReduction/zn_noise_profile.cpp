#include "zn_noise_profile.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <new>
#include <sstream>
#include <utility>

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
        m_stored.power.reserve(channels * bins);
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
    if (m_stored.power.capacity() < m_channels * m_bins) return 0;
    m_stored.power.resize(m_channels * m_bins);
    for (std::size_t c = 0; c < m_channels; ++c) {
        const std::size_t source = m_counts[c] > 0 ? c : 0;
        const double scale = 1.0 / (static_cast<double>(m_counts[source]) * m_windowEnergy);
        for (std::size_t k = 0; k < m_bins; ++k)
            m_stored.power[c * m_bins + k] = static_cast<float>(m_sum[source * m_bins + k] * scale);
    }
    m_stored.rate = m_sampleRate;
    m_stored.bins = m_bins;
    m_stored.channels = m_channels;
    Rebuild();
    return m_learnt;
}

void zn_noise_profile::Forget() noexcept {
    m_stored.bins = 0;
    m_stored.channels = 0;
    m_stored.power.clear();
    Rebuild();
}

void zn_noise_profile::Adopt(Snapshot& snapshot) noexcept {
    if (snapshot.bins < 2 || snapshot.channels == 0 || snapshot.power.size() != snapshot.bins * snapshot.channels) {
        Forget();
        return;
    }
    // Copied where it fits; otherwise the larger storage is taken, which
    // still holds this configuration's profile.
    if (snapshot.power.size() <= m_stored.power.capacity()) {
        m_stored.power.assign(snapshot.power.begin(), snapshot.power.end());
    } else {
        m_stored.power.swap(snapshot.power);
    }
    m_stored.rate = snapshot.rate;
    m_stored.bins = snapshot.bins;
    m_stored.channels = snapshot.channels;
    Rebuild();
}

const float* zn_noise_profile::Power(std::size_t channel) const {
    return m_power.data() + std::min(channel, m_channels > 0 ? m_channels - 1 : 0) * m_bins;
}

void zn_noise_profile::Rebuild() noexcept {
    if (!HasProfile() || m_bins == 0) {
        m_power.Clear();
        return;
    }
    const double binHz = m_sampleRate / (2.0 * static_cast<double>(m_bins - 1));
    const double storedBinHz = m_stored.rate / (2.0 * static_cast<double>(m_stored.bins - 1));
    for (std::size_t c = 0; c < m_channels; ++c) {
        const float* stored = m_stored.power.data() + std::min(c, m_stored.channels - 1) * m_stored.bins;
        float* power = m_power.data() + c * m_bins;
        for (std::size_t k = 0; k < m_bins; ++k) {
            const double position = std::min(static_cast<double>(k) * binHz / storedBinHz,
                                             static_cast<double>(m_stored.bins - 1));
            const auto i = static_cast<std::size_t>(position);
            const std::size_t j = std::min(i + 1, m_stored.bins - 1);
            const double t = position - static_cast<double>(i);
            const double perEnergy = (1.0 - t) * stored[i] + t * stored[j];
            power[k] = static_cast<float>(perEnergy * m_windowEnergy);
        }
    }
}

std::string zn_noise_profile::ToText() const { return Format(m_stored); }

bool zn_noise_profile::FromText(const std::string& text) {
    Snapshot snapshot;
    if (text.empty() || !Parse(text, snapshot)) return false;
    try {
        snapshot.power.reserve(m_channels * m_bins);
    } catch (const std::bad_alloc&) {
        return false;
    }
    m_stored = std::move(snapshot);
    Rebuild();
    return true;
}

std::string zn_noise_profile::Format(const Snapshot& snapshot) {
    if (snapshot.bins == 0) return {};
    std::string text = std::string(kTextTag) + " " + std::to_string(static_cast<long long>(std::llround(snapshot.rate))) +
                       " " + std::to_string(snapshot.bins) + " " + std::to_string(snapshot.channels);
    char number[32];
    for (std::size_t i = 0; i < snapshot.bins * snapshot.channels; ++i) {
        const float p = snapshot.power[i];
        const double db = p > 0.0f ? std::max(10.0 * std::log10(p), kDbFloor) : kDbFloor;
        std::snprintf(number, sizeof number, " %.2f", db);
        text += number;
    }
    return text;
}

bool zn_noise_profile::Parse(const std::string& text, Snapshot& snapshot) {
    if (text.empty()) {
        snapshot = Snapshot{};
        return true;
    }
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
    snapshot.rate = rate;
    snapshot.bins = static_cast<std::size_t>(bins);
    snapshot.channels = static_cast<std::size_t>(channels);
    snapshot.power = std::move(values);
    return true;
}

}  // namespace zen::noise_reduction
