#include "Limiter.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

#include "../Decibels.h"

namespace {

constexpr float kTanhOne = 0.7615941559557649f;
// The look-ahead lasts this long, and never less than the true-peak latency.
constexpr double kLookAheadMs = 0.5;
// The hold after each block, in units of (true-peak latency + look-ahead).
constexpr std::uint64_t kHoldFactor = 4;
// The internal block lasts this many holds, so the gain releases for half
// of every block.
constexpr std::uint32_t kHoldsPerBlock = 2;
// The release time constant, in units of the set release time.
constexpr double kReleaseFactor = 4.0;

const ora::numeric::TruePeakConfig kTruePeakConfig{1, 1.0f, ora::numeric::TruePeakFilter::Wideband};

}  // namespace

Limiter::Limiter() : ZenAudioAlgorithm(Definitions()) {
    for (std::uint64_t i = 0; i < GetParameterCount(); ++i) SetParameter(i, GetParameter(i));
    Dimension();
}

Limiter::~Limiter() = default;

const zen::ParameterTableDefinition& Limiter::Definitions() {
    static const zen::ParameterTableDefinition table = zen::MakeParameterTable(
        "Limiter",
        {
            zen::ContinuousParameter("CEILING", QT_TRANSLATE_NOOP("Limiter", "Ceiling"), -24.0f, 0.0f, 0.0f, 0.1f,
                                     "dBTP"),
            zen::ContinuousParameter("RELEASE", QT_TRANSLATE_NOOP("Limiter", "Release"), 0.0f, 1000.0f, 1.0f, 0.01f,
                                     "ms"),
            zen::SwitchParameter("SOFT", QT_TRANSLATE_NOOP("Limiter", "Soft"), 0.0f),
        });
    return table;
}

float Limiter::CeilingGain(float db) { return zen::DbToGainFloored(static_cast<double>(db) - kCeilingMarginDb); }

float Limiter::Soften(float x, float knee) noexcept {
    const float magnitude = std::fabs(x);
    if (!(magnitude >= knee)) return x;
    return std::copysign(knee * std::tanh(magnitude / knee) / kTanhOne, x);
}

bool Limiter::Prepare(float sampleRate, std::uint32_t maxBlock) {
    ZenAudioAlgorithm::Prepare(sampleRate, maxBlock);
    Dimension();
    return true;
}

void Limiter::SetChannelCount(std::uint64_t channels) {
    ZenAudioAlgorithm::SetChannelCount(channels);
    Dimension();
}

void Limiter::Dimension() {
    const std::uint64_t channels = GetChannelCount();
    m_truePeakLatency = static_cast<std::uint32_t>(ora::numeric::UpsamplerTruePeak_x4::Latency(kTruePeakConfig.filter));
    const auto lookAhead = static_cast<std::uint32_t>(std::lround(kLookAheadMs * GetSampleRate() / 1000.0));
    m_lookAheadLength = std::max(m_truePeakLatency, lookAhead);
    m_holdLength = kHoldFactor * (m_truePeakLatency + m_lookAheadLength);
    m_blockLength = kHoldsPerBlock * static_cast<std::uint32_t>(m_holdLength);

    m_blockBuffer.Dimension(channels, GetMaxBlockSize(), m_blockLength + m_truePeakLatency);
    m_lookAhead.Dimension(channels, GetMaxBlockSize(), m_lookAheadLength);
    m_truePeaks.resize(channels);
    m_samplePeaks.resize(channels);
    m_outputPeaks.resize(channels);
    for (std::uint64_t c = 0; c < channels; ++c) {
        if (!m_truePeaks[c]) m_truePeaks[c] = std::make_unique<ora::numeric::TruePeak>(kTruePeakConfig);
        if (!m_samplePeaks[c]) m_samplePeaks[c] = std::make_unique<ora::numeric::FindMinMax>();
        if (!m_outputPeaks[c]) m_outputPeaks[c] = std::make_unique<ora::numeric::FindMinMax>();
    }
    m_blocks.assign(channels, ChannelBlock{});
    m_callInputPeak.assign(channels, 0.0f);
    m_gains.assign(m_blockLength, 1.0f);
    Reset();
}

bool Limiter::SetParameter(std::uint64_t index, float value) {
    if (!ZenAudioAlgorithm::SetParameter(index, value)) return false;
    switch (index) {
        case kCeiling: m_ceiling = CeilingGain(value); break;
        case kRelease: SetRelease(value); break;
        case kSoft: m_soft = value != 0.0f; break;
        default: break;
    }
    return true;
}

void Limiter::SetRelease(float milliseconds) {
    const double samples = static_cast<double>(GetSampleRate()) * milliseconds / 1000.0;
    const double n = samples >= 1.0 ? std::trunc(samples) : 1.0;  // 0 ms counts as one sample
    // 1 - c taken from c as stored, so that the pair sums to exactly 1 and a
    // settled unity gain stays exact.
    m_releaseCoeff = static_cast<float>(std::exp(-1.0 / (kReleaseFactor * n)));
    m_releaseGain = 1.0f - m_releaseCoeff;
}

void Limiter::Reset() {
    m_blockBuffer.Reset();
    m_lookAhead.Reset();
    for (auto& truePeak : m_truePeaks) truePeak->Reset();
    for (auto& samplePeak : m_samplePeaks) samplePeak->Reset();
    std::fill(m_blocks.begin(), m_blocks.end(), ChannelBlock{});
    m_knee = kSoftKneeMax;
    m_gain = 1.0f;
    m_target = 1.0f;
    m_hold = 0;
    // The first block ends once the true-peak latency has passed: from then
    // on a block's reading is complete as its first sample leaves the buffer.
    m_position = m_blockLength - m_truePeakLatency;
    for (auto& peak : m_inputTruePeak) peak.store(0.0f, std::memory_order_relaxed);
    for (auto& peak : m_outputPeak) peak.store(0.0f, std::memory_order_relaxed);
    m_gainMeter.store(1.0f, std::memory_order_relaxed);
}

void Limiter::FinishBlock(std::uint64_t channelCount, float ceiling) noexcept {
    const float knee = std::max(kSoftKneeMin, std::min(ceiling, kSoftKneeMax));
    float peak = 0.0f;
    for (std::uint64_t c = 0; c < channelCount; ++c) {
        ChannelBlock& block = m_blocks[c];
        m_callInputPeak[c] = std::max(m_callInputPeak[c], block.truePeak);
        block.soft = m_soft && block.truePeak > ceiling;
        // The soft curve rises with |x|: the block's largest softened sample
        // is its largest sample softened.
        peak = std::max(peak, block.soft ? Soften(block.samplePeak, knee) : block.truePeak);
        block.truePeak = 0.0f;
    }
    m_knee = knee;
    m_target = peak > 0.0f ? std::min(1.0f, ceiling / peak) : 1.0f;
    m_hold = m_holdLength;
    m_callFinishedBlock = true;
}

void Limiter::ApplyGain(float* const* channels, std::uint64_t channelCount, std::uint64_t offset,
                        std::uint64_t frames) noexcept {
    float g = m_gain;
    const float target = m_target;
    for (std::uint64_t i = 0; i < frames;) {
        if (g > target) {
            g = target;  // instant attack
        } else if (m_hold > 0) {
            // g stays for the whole hold, and so stays under the target.
            const std::uint64_t run = std::min<std::uint64_t>(m_hold, frames - i);
            std::fill_n(m_gains.begin() + static_cast<std::ptrdiff_t>(i), run, g);
            m_hold -= run;
            i += run;
            continue;
        } else {
            const float next = std::min(m_releaseGain * target + m_releaseCoeff * g, 1.0f);
            if (next == g) {  // the release's fixed point: g stays for the rest
                std::fill_n(m_gains.begin() + static_cast<std::ptrdiff_t>(i), frames - i, g);
                break;
            }
            g = next;
        }
        g = std::min(g, 1.0f);
        m_gains[i++] = g;
    }
    m_gain = g;
    for (std::uint64_t c = 0; c < channelCount; ++c)
        m_vec.Multiply(channels[c] + offset, m_gains.data(), channels[c] + offset, frames);
}

bool Limiter::Process(float* const* channels, std::uint64_t count) { return Run(channels, count, &m_ceiling, 0); }

bool Limiter::Process(float* const* channels, std::uint64_t count, const float* ceiling) noexcept {
    return Run(channels, count, ceiling, 1);
}

bool Limiter::Process(float* const* channels, std::uint64_t count, float ceiling) noexcept {
    return Run(channels, count, &ceiling, 0);
}

bool Limiter::Run(float* const* channels, std::uint64_t count, const float* ceiling, std::uint64_t stride) noexcept {
    const std::uint64_t channelCount = GetChannelCount();
    if (channelCount > kMaxChannels) return false;
    std::fill(m_callInputPeak.begin(), m_callInputPeak.end(), 0.0f);
    m_callFinishedBlock = false;
    // A block's sample peak is complete the true-peak latency before its
    // true peak, at this position.
    const std::uint32_t samplePeakDone = m_blockLength - m_truePeakLatency;
    for (std::uint64_t done = 0; done < count;) {
        const std::uint32_t boundary = m_position < samplePeakDone ? samplePeakDone : m_blockLength;
        const std::uint64_t n = std::min<std::uint64_t>(count - done, boundary - m_position);
        for (std::uint64_t c = 0; c < channelCount; ++c) {
            float* x = channels[c] + done;
            ChannelBlock& block = m_blocks[c];
            block.truePeak = std::max(block.truePeak, m_truePeaks[c]->Process(x, n));
            m_samplePeaks[c]->Process(x, n);
            m_blockBuffer.ProcessChannel(c, x, n);
            if (block.soft)
                for (std::uint64_t i = 0; i < n; ++i) x[i] = Soften(x[i], m_knee);
            m_lookAhead.ProcessChannel(c, x, n);
        }
        ApplyGain(channels, channelCount, done, n);
        m_position += static_cast<std::uint32_t>(n);
        done += n;
        if (m_position == samplePeakDone) {
            for (std::uint64_t c = 0; c < channelCount; ++c) {
                m_blocks[c].samplePeak = m_samplePeaks[c]->GetPeak(0);
                m_samplePeaks[c]->Reset();
            }
        }
        if (m_position == m_blockLength) {
            FinishBlock(channelCount, ceiling[(done - 1) * stride]);
            m_position = 0;
        }
    }
    for (std::uint64_t c = 0; c < channelCount; ++c) {
        if (m_callFinishedBlock) m_inputTruePeak[c].store(m_callInputPeak[c], std::memory_order_relaxed);
        m_outputPeaks[c]->Reset();
        m_outputPeaks[c]->Process(channels[c], count);
        m_outputPeak[c].store(m_outputPeaks[c]->GetPeak(0), std::memory_order_relaxed);
    }
    m_gainMeter.store(m_gain, std::memory_order_relaxed);
    return true;
}

float Limiter::GetInputTruePeak(std::uint64_t channel) const {
    return channel < kMaxChannels ? m_inputTruePeak[channel].load(std::memory_order_relaxed) : 0.0f;
}

float Limiter::GetOutputPeak(std::uint64_t channel) const {
    return channel < kMaxChannels ? m_outputPeak[channel].load(std::memory_order_relaxed) : 0.0f;
}

float Limiter::GetMeter(std::uint64_t index) const {
    if (index == kGainMeter) return zen::GainToMeterDb(GetGain());
    const std::uint64_t channel = (index - 1) / 2;
    if (channel >= std::min(GetChannelCount(), kMaxChannels)) return 0.0f;
    return zen::GainToMeterDb(index == InputTruePeakMeter(channel) ? GetInputTruePeak(channel) : GetOutputPeak(channel));
}
