#include "LinkwitzRileyCrossover.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

namespace {

constexpr double kPi = 3.141592653589793;
constexpr float kDefaultFrequencies[] = {120.0f, 1000.0f, 5000.0f, 10000.0f};

using ora::numeric::BiquadLane;
using ora::numeric::BiquadSection;

// K = tan(pi f / fs) and the shared denominator of the three designs.
struct Prewarp {
    double K, q, D;
    Prewarp(double frequency, double sampleRate)
        : K(std::tan(kPi * frequency / sampleRate)),
          q(LinkwitzRileyCrossover::kButterworthQ),
          D(q * K * K + K + q) {}
    BiquadSection Poles(double g, double c2, double c3) const {
        return {(K - q * K * K - q) / D, 2.0 * q * (1.0 - K * K) / D, c2, c3, g};
    }
};

bool Finite(const BiquadLane& lane) {
    return std::isfinite(lane.w1[0]) && std::isfinite(lane.w2[0]) && std::isfinite(lane.w1[1]) &&
           std::isfinite(lane.w2[1]);
}

}  // namespace

LinkwitzRileyCrossover::LinkwitzRileyCrossover() : ZenAudioAlgorithm(Definitions()) {
    SetChannelCount(1);
    Rebuild();
}

const zen::ParameterTableDefinition& LinkwitzRileyCrossover::Definitions() {
    using namespace zen;
    static const ParameterTableDefinition table = MakeParameterTable(
        "LinkwitzRileyCrossover",
        {
            ContinuousParameter("BANDS", QT_TRANSLATE_NOOP("LinkwitzRileyCrossover", "Bands"), 1.0f,
                                static_cast<float>(kMaxBands), 2.0f, 1.0f),
            LogarithmicParameter("FREQ1", QT_TRANSLATE_NOOP("LinkwitzRileyCrossover", "Crossover 1"), 20.0f, 20000.0f,
                                 kDefaultFrequencies[0], 1.0f, "Hz"),
            LogarithmicParameter("FREQ2", QT_TRANSLATE_NOOP("LinkwitzRileyCrossover", "Crossover 2"), 20.0f, 20000.0f,
                                 kDefaultFrequencies[1], 1.0f, "Hz"),
            LogarithmicParameter("FREQ3", QT_TRANSLATE_NOOP("LinkwitzRileyCrossover", "Crossover 3"), 20.0f, 20000.0f,
                                 kDefaultFrequencies[2], 1.0f, "Hz"),
            LogarithmicParameter("FREQ4", QT_TRANSLATE_NOOP("LinkwitzRileyCrossover", "Crossover 4"), 20.0f, 20000.0f,
                                 kDefaultFrequencies[3], 1.0f, "Hz"),
        });
    return table;
}

BiquadSection LinkwitzRileyCrossover::LowPass(double frequency, double sampleRate) {
    const Prewarp p(frequency, sampleRate);
    return p.Poles(p.q * p.K * p.K / p.D, 1.0, 2.0);
}

BiquadSection LinkwitzRileyCrossover::HighPass(double frequency, double sampleRate) {
    const Prewarp p(frequency, sampleRate);
    return p.Poles(p.q / p.D, 1.0, -2.0);
}

BiquadSection LinkwitzRileyCrossover::AllPass(double frequency, double sampleRate) {
    // The denominator's coefficients in reverse order.
    const Prewarp p(frequency, sampleRate);
    const double b0 = p.q * p.K * p.K - p.K + p.q;
    const double b1 = 2.0 * p.q * (p.K * p.K - 1.0);
    return p.Poles(b0 / p.D, p.D / b0, b1 / b0);
}

bool LinkwitzRileyCrossover::Prepare(float sampleRate, std::uint32_t maxBlock) {
    const std::size_t channels = GetChannelCount();
    m_buffer.assign(kMaxBands * channels * maxBlock, 0.0f);
    m_bandPointers.resize(kMaxBands * channels);
    for (std::size_t i = 0; i < m_bandPointers.size(); ++i) m_bandPointers[i] = m_buffer.data() + i * maxBlock;
    ZenAudioAlgorithm::Prepare(sampleRate, maxBlock);
    Reset();
    return true;
}

void LinkwitzRileyCrossover::SetChannelCount(std::uint64_t channels) {
    ZenAudioAlgorithm::SetChannelCount(channels);
    m_channels.resize(channels);
    m_chunk.resize(channels);
    // A stage runs a low and a high lane per channel and at most one
    // all-pass lane for each band split off before it.
    for (Stage& stage : m_stages) {
        stage.lanes.reserve(channels * (2 + kMaxBands));
        stage.buffers.reserve(channels * (2 + kMaxBands));
    }
    m_buffer.clear();
    m_bandPointers.clear();
    Rebuild();
}

bool LinkwitzRileyCrossover::SetParameter(std::uint64_t index, float value) {
    if (!ZenAudioAlgorithm::SetParameter(index, value)) return false;
    Rebuild();
    return true;
}

void LinkwitzRileyCrossover::Rebuild() {
    const auto bands = static_cast<std::size_t>(
        std::clamp<long>(std::lround(GetParameter(kBands)), 1, static_cast<long>(kMaxBands)));
    if (bands != m_bandCount)
        for (ChannelLanes& c : m_channels)
            for (auto& lanes : c.allPass) lanes = {};  // they filter other frequencies now
    m_bandCount = bands;

    const double fs = GetSampleRate();
    const std::size_t splits = bands - 1;
    for (std::size_t s = 0; s < splits; ++s)
        m_splits[s] = std::clamp(static_cast<double>(GetParameter(kFrequency1 + s)), 1.0, kHighestShareOfRate * fs);
    std::sort(m_splits.begin(), m_splits.begin() + static_cast<std::ptrdiff_t>(splits));

    std::array<BiquadSection, kMaxSplits> low, high, allPass;
    for (std::size_t s = 0; s < splits; ++s) {
        low[s] = LowPass(m_splits[s], fs);
        high[s] = HighPass(m_splits[s], fs);
        allPass[s] = AllPass(m_splits[s], fs);
    }
    for (ChannelLanes& c : m_channels) {
        for (std::size_t s = 0; s < splits; ++s) {
            c.low[s].sections[0] = c.low[s].sections[1] = low[s];
            c.high[s].sections[0] = c.high[s].sections[1] = high[s];
        }
        // Band j needs the all-passes of splits j + 1 onward, two to a lane.
        for (std::size_t j = 0; j + 2 < bands; ++j)
            for (std::size_t k = 0, s = j + 1; s < splits; ++k, s += 2) {
                c.allPass[j][k].sections[0] = allPass[s];
                c.allPass[j][k].sections[1] = s + 1 < splits ? allPass[s + 1] : BiquadSection{};
            }
    }

    // Stage s splits band s into bands s and s + 1, and carries the next
    // all-pass lane of every band split off earlier: band j's lane k runs in
    // stage j + 1 + k, once band j is complete.
    const std::size_t bufferCount = m_bandPointers.size();
    for (std::size_t s = 0; s < kMaxSplits; ++s) {
        Stage& stage = m_stages[s];
        stage.lanes.clear();
        stage.buffers.clear();
        if (s >= splits || bufferCount == 0) continue;
        for (std::size_t ch = 0; ch < m_channels.size(); ++ch) {
            stage.lanes.push_back(&m_channels[ch].low[s]);
            stage.buffers.push_back(Band(s)[ch]);
            stage.lanes.push_back(&m_channels[ch].high[s]);
            stage.buffers.push_back(Band(s + 1)[ch]);
            for (std::size_t j = 0; j < s; ++j) {
                const std::size_t k = s - 1 - j;
                if (2 * k + j + 1 < splits) {
                    stage.lanes.push_back(&m_channels[ch].allPass[j][k]);
                    stage.buffers.push_back(Band(j)[ch]);
                }
            }
        }
    }
}

void LinkwitzRileyCrossover::Reset() {
    for (ChannelLanes& c : m_channels) {
        for (BiquadLane& lane : c.low) lane.w1[0] = lane.w1[1] = lane.w2[0] = lane.w2[1] = 0.0;
        for (BiquadLane& lane : c.high) lane.w1[0] = lane.w1[1] = lane.w2[0] = lane.w2[1] = 0.0;
        for (auto& lanes : c.allPass)
            for (BiquadLane& lane : lanes) lane.w1[0] = lane.w1[1] = lane.w2[0] = lane.w2[1] = 0.0;
    }
}

void LinkwitzRileyCrossover::ClearNonFinite() noexcept {
    // A non-finite input would otherwise ring in the recursions forever.
    for (std::size_t s = 0; s + 1 < m_bandCount; ++s)
        for (BiquadLane* lane : m_stages[s].lanes)
            if (!Finite(*lane)) lane->w1[0] = lane->w1[1] = lane->w2[0] = lane->w2[1] = 0.0;
}

void LinkwitzRileyCrossover::Split(const float* const* input, std::uint64_t count) noexcept {
    const std::size_t channels = GetChannelCount();
    if (m_bandPointers.empty() || count == 0) return;
    const auto n = static_cast<std::size_t>(std::min<std::uint64_t>(count, GetMaxBlockSize()));
    for (std::size_t c = 0; c < channels; ++c)
        if (input[c] != Band(0)[c]) std::copy_n(input[c], n, Band(0)[c]);
    for (std::size_t s = 0; s + 1 < m_bandCount; ++s) {
        for (std::size_t c = 0; c < channels; ++c) std::copy_n(Band(s)[c], n, Band(s + 1)[c]);
        const Stage& stage = m_stages[s];
        m_kernel.Process(stage.lanes.data(), stage.buffers.data(), stage.lanes.size(), n);
    }
    ClearNonFinite();
}

bool LinkwitzRileyCrossover::Process(float* const* channels, std::uint64_t count) {
    const std::size_t channelCount = GetChannelCount();
    const std::size_t block = GetMaxBlockSize();
    if (channelCount == 0 || count == 0) return true;
    if (m_bandPointers.empty()) return false;  // not prepared
    for (std::uint64_t done = 0; done < count; done += block) {
        const auto n = static_cast<std::size_t>(std::min<std::uint64_t>(block, count - done));
        for (std::size_t c = 0; c < channelCount; ++c) m_chunk[c] = channels[c] + done;
        Split(m_chunk.data(), n);
        for (std::size_t c = 0; c < channelCount; ++c) {
            float* y = channels[c] + done;
            std::copy_n(Band(0)[c], n, y);
            for (std::size_t b = 1; b < m_bandCount; ++b) {
                const float* x = Band(b)[c];
                for (std::size_t i = 0; i < n; ++i) y[i] += x[i];
            }
        }
    }
    return true;
}
