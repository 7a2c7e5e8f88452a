#include "ZenLimiter.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

#include "Common/Decibels.h"
#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenLimiter::kDescriptor = {
    "Limiter", 1.0, zen::kPluginStateOffered, zen::MakePluginCode('Z', 'n', 'L', 'r'),
    32, 32, "ZenLimiter", 0, 0, -1, nullptr};

namespace {

constexpr float kTanhOne = 0.7615941559557649f;
constexpr double kPi = 3.14159265358979323846;
constexpr double kReferenceRate = 48000.0;  // of the look-ahead's length
// The hold after each block, in units of (true-peak latency + look-ahead).
constexpr std::uint64_t kHoldFactor = 4;
// The release time constant, in units of the set release time.
constexpr double kReleaseFactor = 4.0;

// A raised-cosine window of `length` taps summing to 1, symmetric: its first
// half, the middle included.
std::vector<float> RampHalf(std::size_t length) {
    std::vector<double> window(length);
    double sum = 0.0;
    for (std::size_t k = 0; k < length; ++k) {
        const double s = std::sin(kPi * static_cast<double>(k + 1) / static_cast<double>(length + 1));
        window[k] = s * s;
        sum += window[k];
    }
    std::vector<float> half((length + 1) / 2);
    for (std::size_t k = 0; k < half.size(); ++k) half[k] = static_cast<float>(window[k] / sum);
    return half;
}

}  // namespace

ZenLimiter::ZenLimiter() {
    InitParameters(Definitions());
    InitMeters(Meters());
}

ZenLimiter::~ZenLimiter() = default;

const zen::ParameterTableDefinition& ZenLimiter::Definitions() {
    static const zen::ParameterTableDefinition table = zen::MakeParameterTable(
        "ZenLimiter",
        {
            zen::ContinuousParameter("INPUT_GAIN", QT_TRANSLATE_NOOP("ZenLimiter", "Input Gain"), -18.0f, 18.0f, 0.0f,
                                     0.1f, "dB")
                .Smoothed(zen::working::DbToGainFloored),
            zen::ContinuousParameter("THRESHOLD", QT_TRANSLATE_NOOP("ZenLimiter", "Ceiling"), -24.0f, 0.0f, 0.0f, 0.1f,
                                     "dBTP")
                .SmoothedSingle(CeilingGain),
            zen::ContinuousParameter("RELEASE", QT_TRANSLATE_NOOP("ZenLimiter", "Release"), 0.0f, 1000.0f, 1.0f, 0.01f,
                                     "ms"),
            zen::SwitchParameter("SOFT", QT_TRANSLATE_NOOP("ZenLimiter", "Soft"), 0.0f),
        });
    return table;
}

const zen::MeterTableDefinition& ZenLimiter::Meters() {
    static const zen::MeterTableDefinition table = zen::MakeMeterTable(
        "ZenLimiter",
        {
            zen::LevelMeter("GAIN_REDUCTION", QT_TRANSLATE_NOOP("ZenLimiter", "Gain Reduction"), "dB",
                            kGainMeterFloorDb, 0.0f)
                .SilenceReads(kGainMeterFloorDb)
                .AtRest(1.0f),
            // Input gain reaches +18 dB.
            zen::LevelMeter("INPUT_TRUE_PEAK", QT_TRANSLATE_NOOP("ZenLimiter", "Input True Peak"), "dBTP",
                            kLevelMeterFloorDb, 24.0f)
                .SilenceReads(kLevelMeterFloorDb)
                .PerChannel(),
            zen::LevelMeter("OUTPUT_PEAK", QT_TRANSLATE_NOOP("ZenLimiter", "Output Peak"), "dBFS", kLevelMeterFloorDb,
                            0.0f)
                .SilenceReads(kLevelMeterFloorDb)
                .PerChannel(),
        });
    return table;
}

float ZenLimiter::CeilingGain(float ceilingDb) {
    return zen::DbToGainFloored(static_cast<double>(ceilingDb) - kCeilingMarginDb);
}

float ZenLimiter::Soften(float x, float knee) noexcept {
    const float magnitude = std::fabs(x);
    if (!(magnitude >= knee)) return x;
    return std::copysign(knee * std::tanh(magnitude / knee) / kTanhOne, x);
}

void ZenLimiter::UpdateProcessingParameter(std::uint32_t index, float value) {
    if (index == kSoft) m_soft = value != 0.0f;
    if (index != kRelease) return;
    const auto samples = static_cast<std::uint64_t>(static_cast<double>(GetSampleRate()) * value / 1000.0);
    const double c = std::exp(-1.0 / (kReleaseFactor * static_cast<double>(std::max<std::uint64_t>(samples, 1))));
    m_releaseCoeff = static_cast<float>(c);
    m_releaseGain = static_cast<float>(1.0 - c);
}

void ZenLimiter::PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) {
    const std::uint32_t channels = GetProcessChannelCount();
    const double scale = sampleRate / kReferenceRate;
    const ora::numeric::TruePeakConfig truePeak{1, 1.0f, ora::numeric::TruePeakFilter::Wideband};
    m_truePeakLatency = static_cast<std::uint32_t>(ora::numeric::UpsamplerTruePeak_x4::Latency(truePeak.filter));
    m_lookAheadLength = std::max(1u, static_cast<std::uint32_t>(std::lround(kLookAheadAt48k * scale)));
    m_blockLength = kHoldsPerBlock * static_cast<std::uint32_t>(kHoldFactor * (m_truePeakLatency + m_lookAheadLength));

    m_blockBuffer.Dimension(channels, maxBlockSize, m_blockLength + m_truePeakLatency);
    m_lookAhead.Dimension(channels, maxBlockSize, m_lookAheadLength);
    m_truePeaks.clear();
    m_softTruePeaks.clear();
    m_samplePeaks.clear();
    m_softened.assign(maxBlockSize, 0.0f);
    for (std::uint32_t c = 0; c < channels; ++c) {
        m_truePeaks.push_back(std::make_unique<ora::numeric::TruePeak>(truePeak));
        m_softTruePeaks.push_back(std::make_unique<ora::numeric::TruePeak>(truePeak));
        m_samplePeaks.push_back(std::make_unique<ora::numeric::FindMinMax>(ora::numeric::FindMinMaxConfig{1}));
    }
    m_gains.assign(m_blockLength, 1.0f);
    // A drop spreads over the look-ahead and ends just as the block that
    // caused it arrives: a step would splatter, and its band-limited
    // waveform overshoot the ceiling between samples.
    const std::size_t rampLength = m_lookAheadLength + 1;
    m_gainRamp.Reconfigure(ora::numeric::FIRSConfig{1, RampHalf(rampLength), rampLength});
    m_lastChannelCount = channels;
    SetLatency(m_blockLength + m_truePeakLatency + m_lookAheadLength);
    Clear();
}

void ZenLimiter::ResetProcessing() { Clear(); }

void ZenLimiter::Clear() noexcept {
    m_blockBuffer.Reset();
    m_lookAhead.Reset();
    for (auto& truePeak : m_truePeaks) truePeak->Reset();
    for (auto& truePeak : m_softTruePeaks) truePeak->Reset();
    m_softMeasuring = false;
    for (auto& samplePeak : m_samplePeaks) samplePeak->Reset();
    m_blocks.fill(ChannelBlock{});
    m_knee = kSoftKneeMax;
    m_gain = 1.0f;
    m_target = 1.0f;
    m_hold = 0;
    m_appliedGain = 1.0f;
    m_gainRamp.Reset();
    // The first block ends once the true-peak latency has passed: from then
    // on a block's reading is complete as its first sample leaves the buffer.
    m_position = m_blockLength - m_truePeakLatency;
    ResetMeters();
}

void ZenLimiter::FinishBlock(std::uint32_t channelCount, float ceiling) noexcept {
    const bool softOn = m_soft;
    const float knee = std::max(kSoftKneeMin, std::min(ceiling, kSoftKneeMax));
    float peak = 0.0f;
    for (std::uint32_t c = 0; c < channelCount; ++c) {
        ChannelBlock& block = m_blocks[c];
        m_callInputPeak[c] = std::max(m_callInputPeak[c], block.truePeak);
        block.soft = softOn && block.truePeak > ceiling;
        // The soft curve rises with |x|, so the block's largest softened
        // sample is its largest sample softened; its harmonics add peaks
        // between samples, read from the softened copy.
        peak = std::max(peak, block.soft ? std::max(Soften(block.samplePeak, knee), block.softTruePeak) : block.truePeak);
        block.truePeak = 0.0f;
        block.softTruePeak = 0.0f;
    }
    m_knee = knee;
    m_target = peak > 0.0f ? std::min(1.0f, ceiling / peak) : 1.0f;
    m_hold = kHoldFactor * (m_truePeakLatency + m_lookAheadLength);
    m_callFinishedBlock = true;
}

void ZenLimiter::ApplyGain(float* const* channels, std::uint32_t channelCount, std::size_t offset,
                           std::size_t frames) noexcept {
    float g = m_gain;
    for (std::size_t i = 0; i < frames; ++i) {
        if (g > m_target) {
            g = m_target;  // instant attack
        } else if (m_hold > 0) {
            --m_hold;
        } else {
            g = m_releaseGain * m_target + m_releaseCoeff * g;
        }
        g = std::min(g, 1.0f);
        m_gains[i] = 1.0f - g;
    }
    m_gain = g;
    // The reduction is ramped, not the gain, so that unity stays exact.
    m_gainRamp.Process(m_gains.data(), m_gains.data(), frames);
    for (std::size_t i = 0; i < frames; ++i) m_gains[i] = 1.0f - m_gains[i];
    m_appliedGain = m_gains[frames - 1];
    for (std::uint32_t c = 0; c < channelCount; ++c)
        m_vec.Multiply(channels[c] + offset, m_gains.data(), channels[c] + offset, frames);
}

void ZenLimiter::ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    if (channelCount != m_lastChannelCount || channelCount > m_truePeaks.size()) {
        Clear();
        m_lastChannelCount = channelCount;
        channelCount = std::min<std::uint32_t>(channelCount, static_cast<std::uint32_t>(m_truePeaks.size()));
    }
    for (std::uint32_t c = 0; c < channelCount; ++c) {
        auto gain = Smoothed(kInputGain).Track(c);
        float* x = channels[c];
        for (std::uint32_t i = 0; i < frames; ++i) x[i] *= static_cast<float>(gain.Next());
    }

    std::fill_n(m_callInputPeak, channelCount, 0.0f);
    m_callFinishedBlock = false;
    // A block's sample peak is complete the true-peak latency before its
    // true peak, at this position.
    const std::uint32_t samplePeakDone = m_blockLength - m_truePeakLatency;
    zen::SmoothedValueGroup& ceilingGroup = Smoothed(kCeiling);
    auto ceilingCursor = ceilingGroup.Track(0);
    float ceiling = 0.0f;
    // The softened copy is measured only while Soft is on; its readers start
    // from silence when it is switched on.
    const bool softOn = m_soft;
    if (softOn && !m_softMeasuring)
        for (auto& truePeak : m_softTruePeaks) truePeak->Reset();
    m_softMeasuring = softOn;
    const float measureKnee =
        std::max(kSoftKneeMin, std::min(static_cast<float>(ceilingGroup[0].current.load(std::memory_order_relaxed)),
                                        kSoftKneeMax));
    for (std::uint32_t done = 0; done < frames;) {
        const std::uint32_t boundary = m_position < samplePeakDone ? samplePeakDone : m_blockLength;
        const std::uint32_t n = std::min(frames - done, boundary - m_position);
        for (std::uint32_t c = 0; c < channelCount; ++c) {
            float* x = channels[c] + done;
            ChannelBlock& block = m_blocks[c];
            block.truePeak = std::max(block.truePeak, m_truePeaks[c]->Process(x, n));
            if (softOn) {
                for (std::uint32_t i = 0; i < n; ++i) m_softened[i] = Soften(x[i], measureKnee);
                block.softTruePeak = std::max(block.softTruePeak, m_softTruePeaks[c]->Process(m_softened.data(), n));
            }
            m_samplePeaks[c]->Process(x, n);
            m_blockBuffer.ProcessChannel(c, x, n);
            if (block.soft)
                for (std::uint32_t i = 0; i < n; ++i) x[i] = Soften(x[i], m_knee);
            m_lookAhead.ProcessChannel(c, x, n);
        }
        ApplyGain(channels, channelCount, done, n);
        for (std::uint32_t i = 0; i < n; ++i) ceiling = static_cast<float>(ceilingCursor.Next());
        m_position += n;
        done += n;
        if (m_position == samplePeakDone) {
            for (std::uint32_t c = 0; c < channelCount; ++c) {
                m_blocks[c].samplePeak = m_samplePeaks[c]->GetPeak(0);
                m_samplePeaks[c]->Reset();
            }
        }
        if (m_position == m_blockLength) {
            FinishBlock(channelCount, ceiling);
            m_position = 0;
        }
    }

    for (std::uint32_t c = 0; c < channelCount; ++c) {
        const float* y = channels[c];
        float peak = 0.0f;
        for (std::uint32_t i = 0; i < frames; ++i) peak = std::max(peak, std::fabs(y[i]));
        PublishMeter(kOutputPeakMeter, c, peak);
        if (m_callFinishedBlock) PublishMeter(kInputTruePeakMeter, c, m_callInputPeak[c]);
    }
    PublishMeter(kGainMeter, m_appliedGain);
}

template class ZenAudioPlugin<ZenLimiter>;
