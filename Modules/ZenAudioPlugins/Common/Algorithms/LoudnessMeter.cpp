#include "LoudnessMeter.h"

#include <algorithm>
#include <cfloat>
#include <cmath>
#include <limits>

#include "SpeakerLayout.h"

namespace {

constexpr double kMinusInfinity = -std::numeric_limits<double>::infinity();
constexpr std::size_t kMomentarySubBlocks = LoudnessMeter::kMomentaryHops * LoudnessMeter::kSubBlocksPerHop;
constexpr std::size_t kShortTermSubBlocks = LoudnessMeter::kShortTermHops * LoudnessMeter::kSubBlocksPerHop;

bool IsFinite(float v) { return std::fabs(v) <= FLT_MAX; }

// Copies `n` samples with NaN and infinities replaced by silence.
void CopyClean(const float* x, float* out, std::size_t n) {
    for (std::size_t i = 0; i < n; ++i) out[i] = IsFinite(x[i]) ? x[i] : 0.0f;
}

}  // namespace

LoudnessMeter::LoudnessMeter()
    : m_integrated(kMinusInfinity), m_rangeLow(kMinusInfinity), m_rangeHigh(kMinusInfinity), m_clean(2 * kCleanLength) {}

void LoudnessMeter::SetChannelCount(std::uint64_t channels) {
    ZenAudioAlgorithm::SetChannelCount(channels);
    Allocate();
}

bool LoudnessMeter::Prepare(float sampleRate, std::uint32_t maxBlock) {
    ZenAudioAlgorithm::Prepare(sampleRate, maxBlock);
    m_hopLength = std::max<std::size_t>(1, static_cast<std::size_t>(std::lround(GetSampleRate() * kHopSeconds)));
    for (std::size_t k = 0; k < kSubBlocksPerHop; ++k) m_subEnds[k] = (k + 1) * m_hopLength / kSubBlocksPerHop;
    Allocate();
    Reset();
    return true;
}

void LoudnessMeter::Allocate() {
    const auto count = static_cast<std::size_t>(GetChannelCount());
    m_channels.assign(count, Channel{});
    for (std::size_t c = 0; c < count; ++c)
        m_channels[c].weight = zen::SpeakerLayout::LoudnessWeight(count, c, zen::SpeakerLayout::DefaultLfe(count));
    m_kWeighting.Prepare(GetSampleRate(), count);
    m_weightedRing.assign(kShortTermSubBlocks, 0.0);
    m_channelKRing.assign(count * kMomentarySubBlocks, 0.0);
    m_channelPlainRing.assign(count * kMomentarySubBlocks, 0.0);
    m_truePeaks.clear();
    for (std::size_t c = 0; c < count; c += 2) {
        ora::numeric::TruePeakConfig config;
        config.channels = c + 1 < count ? 2 : 1;
        m_truePeaks.push_back(std::make_unique<ora::numeric::TruePeak>(config));
    }
}

void LoudnessMeter::Reset() {
    for (Channel& ch : m_channels) {
        const double weight = ch.weight;
        ch = Channel{};
        ch.weight = weight;
    }
    m_kWeighting.Reset();
    for (auto& tp : m_truePeaks) tp->Reset();
    std::fill(m_weightedRing.begin(), m_weightedRing.end(), 0.0);
    std::fill(m_channelKRing.begin(), m_channelKRing.end(), 0.0);
    std::fill(m_channelPlainRing.begin(), m_channelPlainRing.end(), 0.0);
    m_hopPosition = 0;
    m_subBlock = 0;
    m_ringPosition = 0;
    m_channelPosition = 0;
    m_momentary = m_shortTerm = m_maxMomentary = m_maxShortTerm = 0.0;
    m_integratedBlocks.Clear();
    m_rangeWindows.Clear();
    m_integrated = kMinusInfinity;
    m_range = 0.0;
    m_rangeLow = m_rangeHigh = kMinusInfinity;
    m_hops = m_frames = m_invalid = 0;
}

void LoudnessMeter::SetChannelWeight(std::size_t channel, double weight) {
    if (channel < m_channels.size()) m_channels[channel].weight = weight;
}

double LoudnessMeter::GetChannelWeight(std::size_t channel) const {
    return channel < m_channels.size() ? m_channels[channel].weight : 0.0;
}

void LoudnessMeter::SetTruePeakEnabled(bool enabled) {
    if (enabled && !m_truePeakEnabled)
        for (auto& tp : m_truePeaks) tp->Reset();
    m_truePeakEnabled = enabled;
}

bool LoudnessMeter::Process(float* const* channels, std::uint64_t count) {
    const std::size_t channelCount = m_channels.size();
    if (channelCount == 0 || count == 0) return true;
    for (Channel& ch : m_channels) ch.blockInvalid = 0;
    const auto frames = static_cast<std::size_t>(count);
    for (std::size_t done = 0; done < frames;) {
        const std::size_t n = std::min(frames - done, m_subEnds[m_subBlock] - m_hopPosition);
        for (std::size_t c = 0; c < channelCount; c += 2) {
            if (c + 1 < channelCount)
                MeasurePair(c, channels[c] + done, channels[c + 1] + done, n);
            else
                Measure(c, channels[c] + done, n);
        }
        m_hopPosition += n;
        done += n;
        if (m_hopPosition == m_subEnds[m_subBlock]) CloseSubBlock();
    }
    MeasureTruePeaks(channels, frames);
    m_frames += count;
    return true;
}

std::size_t LoudnessMeter::MeasureLevels(std::size_t channel, const float* x, std::size_t n) noexcept {
    Channel& ch = m_channels[channel];
    double plain = ch.plainPower;
    float peak = ch.samplePeak;
    std::size_t invalid = 0;
    for (std::size_t i = 0; i < n; ++i) {
        const float v = x[i];
        if (IsFinite(v)) {
            plain += static_cast<double>(v) * v;
            peak = std::max(peak, std::fabs(v));
        } else {
            ++invalid;
        }
    }
    ch.plainPower = plain;
    ch.samplePeak = peak;
    ch.blockInvalid += invalid;
    m_invalid += invalid;
    return invalid;
}

void LoudnessMeter::MeasurePair(std::size_t first, const float* x0, const float* x1, std::size_t n) noexcept {
    if (MeasureLevels(first, x0, n) + MeasureLevels(first + 1, x1, n) > 0) {
        MeasureLoudness(first, x0, n);
        MeasureLoudness(first + 1, x1, n);
        return;
    }
    m_kWeighting.AccumulatePower(first, x0, x1, n, m_channels[first].kPower, m_channels[first + 1].kPower);
}

void LoudnessMeter::Measure(std::size_t channel, const float* x, std::size_t n) noexcept {
    MeasureLevels(channel, x, n);
    MeasureLoudness(channel, x, n);
}

void LoudnessMeter::MeasureLoudness(std::size_t channel, const float* x, std::size_t n) noexcept {
    Channel& ch = m_channels[channel];
    bool clean = true;
    for (std::size_t i = 0; i < n && clean; ++i) clean = IsFinite(x[i]);
    if (clean) {
        m_kWeighting.AccumulatePower(channel, x, n, ch.kPower);
        return;
    }
    for (std::size_t done = 0; done < n; done += kCleanLength) {
        const std::size_t m = std::min(kCleanLength, n - done);
        CopyClean(x + done, m_clean.data(), m);
        m_kWeighting.AccumulatePower(channel, m_clean.data(), m, ch.kPower);
    }
}

void LoudnessMeter::MeasureTruePeaks(const float* const* channels, std::size_t count) noexcept {
    if (!m_truePeakEnabled) return;
    for (std::size_t p = 0; p < m_truePeaks.size(); ++p) {
        ora::numeric::TruePeak& meter = *m_truePeaks[p];
        const std::size_t first = 2 * p;
        const auto width = static_cast<std::size_t>(meter.GetChannelCount());
        auto take = [&] {
            for (std::size_t j = 0; j < width; ++j) {
                float& held = m_channels[first + j].truePeak;
                held = std::max(held, meter.GetChannelPeak(static_cast<int>(j)));
            }
        };
        bool clean = true;
        for (std::size_t j = 0; j < width; ++j) clean = clean && m_channels[first + j].blockInvalid == 0;
        if (clean) {
            meter.Process(channels + first, count);
            take();
            continue;
        }
        float* copies[2] = {m_clean.data(), m_clean.data() + kCleanLength};
        for (std::size_t done = 0; done < count; done += kCleanLength) {
            const std::size_t m = std::min(kCleanLength, count - done);
            for (std::size_t j = 0; j < width; ++j) CopyClean(channels[first + j] + done, copies[j], m);
            meter.Process(copies, m);
            take();
        }
    }
}

double LoudnessMeter::SumLast(const double* ring, std::size_t size, std::size_t end, std::size_t count) noexcept {
    // Always in the same order from the oldest, so the sum depends on time
    // alone; four partial sums keep the adds from waiting on each other.
    double lanes[4] = {0.0, 0.0, 0.0, 0.0};
    std::size_t i = (end + size - count) % size;
    for (std::size_t k = 0; k < count; ++k) {
        lanes[k % 4] += ring[i];
        if (++i == size) i = 0;
    }
    return (lanes[0] + lanes[1]) + (lanes[2] + lanes[3]);
}

void LoudnessMeter::CloseSubBlock() noexcept {
    double weighted = 0.0;
    for (std::size_t c = 0; c < m_channels.size(); ++c) {
        Channel& ch = m_channels[c];
        weighted += ch.weight * ch.kPower;
        m_channelKRing[c * kMomentarySubBlocks + m_channelPosition] = ch.kPower;
        m_channelPlainRing[c * kMomentarySubBlocks + m_channelPosition] = ch.plainPower;
        ch.plainTotal += ch.plainPower;
        ch.kPower = 0.0;
        ch.plainPower = 0.0;
    }
    m_weightedRing[m_ringPosition] = weighted;
    m_ringPosition = (m_ringPosition + 1) % kShortTermSubBlocks;
    m_channelPosition = (m_channelPosition + 1) % kMomentarySubBlocks;

    const auto hop = static_cast<double>(m_hopLength);
    m_momentary = SumLast(m_weightedRing.data(), kShortTermSubBlocks, m_ringPosition, kMomentarySubBlocks) /
                  (hop * kMomentaryHops);
    m_shortTerm = SumLast(m_weightedRing.data(), kShortTermSubBlocks, m_ringPosition, kShortTermSubBlocks) /
                  (hop * kShortTermHops);
    m_maxMomentary = std::max(m_maxMomentary, m_momentary);
    m_maxShortTerm = std::max(m_maxShortTerm, m_shortTerm);

    if (++m_subBlock == kSubBlocksPerHop) {
        m_subBlock = 0;
        m_hopPosition = 0;
        CloseHop();
    }
}

void LoudnessMeter::CloseHop() noexcept {
    ++m_hops;
    if (m_hops >= kMomentaryHops) {
        m_integratedBlocks.AddBlock(m_momentary);
        m_integrated = m_integratedBlocks.Loudness();
    }
    if (m_hops >= kShortTermHops) {
        m_rangeWindows.AddShortTerm(m_shortTerm);
        m_range = m_rangeWindows.Range();
        m_rangeLow = m_rangeWindows.Low();
        m_rangeHigh = m_rangeWindows.High();
    }
}

double LoudnessMeter::ChannelMomentary(std::size_t channel) const {
    const double power = SumLast(m_channelKRing.data() + channel * kMomentarySubBlocks, kMomentarySubBlocks,
                                 m_channelPosition, kMomentarySubBlocks) /
                         (static_cast<double>(m_hopLength) * kMomentaryHops);
    return zen::LoudnessHistogram::Lufs(power);
}

float LoudnessMeter::TruePeak(std::size_t channel) const {
    const Channel& ch = m_channels[channel];
    return std::max(ch.truePeak, ch.samplePeak);
}

double LoudnessMeter::Rms(std::size_t channel) const {
    const double power = SumLast(m_channelPlainRing.data() + channel * kMomentarySubBlocks, kMomentarySubBlocks,
                                 m_channelPosition, kMomentarySubBlocks) /
                         (static_cast<double>(m_hopLength) * kMomentaryHops);
    return std::sqrt(power);
}

double LoudnessMeter::AverageRms(std::size_t channel) const {
    if (m_frames == 0) return 0.0;
    const Channel& ch = m_channels[channel];
    return std::sqrt((ch.plainTotal + ch.plainPower) / static_cast<double>(m_frames));
}
