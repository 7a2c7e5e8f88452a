#include "ZenMeter.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

#include "Common/Algorithms/LfeChoice.h"
#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenMeter::kDescriptor = {
    "Meter", 1.0, zen::kPluginStateOffered, zen::MakePluginCode('Z', 'n', 'M', 'e'),
    32, 32, "ZenMeter", 0, 0, -1, nullptr};

namespace {

// Display range of the loudness meters: the EBU +18 scale around -23 LUFS
// (the +9 scale lies inside it).
constexpr float kScaleLowLufs = -59.0f;
constexpr float kScaleHighLufs = -5.0f;
constexpr float kRangeMaxLu = 30.0f;

float Lufs(double lufs) { return std::max(ZenMeter::kSilenceLufs, static_cast<float>(lufs)); }

}  // namespace

ZenMeter::ZenMeter() {
    InitParameters(Definitions());
    InitMeters(Meters());
    CountNonFiniteInput();
}

const zen::ParameterTableDefinition& ZenMeter::Definitions() {
    using namespace zen;
    static const ParameterTableDefinition table = MakeParameterTable(
        "ZenMeter",
        {
            LfeChoice::Parameter(),
            ListParameter("SCALE", QT_TRANSLATE_NOOP("ZenMeter", "Scale"),
                          {QT_TRANSLATE_NOOP("ZenMeter", "EBU +9"), QT_TRANSLATE_NOOP("ZenMeter", "EBU +18")},
                          static_cast<float>(kEbu9)),
            SwitchParameter("TRUE_PEAK", QT_TRANSLATE_NOOP("ZenMeter", "True Peak"), 1.0f),
            SwitchParameter("RESET", QT_TRANSLATE_NOOP("ZenMeter", "Reset"), 0.0f),
        });
    return table;
}

const zen::MeterTableDefinition& ZenMeter::Meters() {
    using namespace zen;
    static const MeterTableDefinition table = MakeMeterTable(
        "ZenMeter",
        {
            ValueMeter("MOMENTARY", QT_TRANSLATE_NOOP("ZenMeter", "Momentary"), "LUFS", kScaleLowLufs, kScaleHighLufs)
                .AtRest(kSilenceLufs),
            ValueMeter("SHORT_TERM", QT_TRANSLATE_NOOP("ZenMeter", "Short-Term"), "LUFS", kScaleLowLufs,
                       kScaleHighLufs)
                .AtRest(kSilenceLufs),
            ValueMeter("INTEGRATED", QT_TRANSLATE_NOOP("ZenMeter", "Integrated"), "LUFS", kScaleLowLufs,
                       kScaleHighLufs)
                .AtRest(kSilenceLufs),
            ValueMeter("LOUDNESS_RANGE", QT_TRANSLATE_NOOP("ZenMeter", "Loudness Range"), "LU", 0.0f, kRangeMaxLu),
            ValueMeter("MAX_MOMENTARY", QT_TRANSLATE_NOOP("ZenMeter", "Max Momentary"), "LUFS", kScaleLowLufs,
                       kScaleHighLufs)
                .AtRest(kSilenceLufs),
            ValueMeter("MAX_SHORT_TERM", QT_TRANSLATE_NOOP("ZenMeter", "Max Short-Term"), "LUFS", kScaleLowLufs,
                       kScaleHighLufs)
                .AtRest(kSilenceLufs),
            LevelMeter("MAX_TRUE_PEAK", QT_TRANSLATE_NOOP("ZenMeter", "Max True Peak"), "dBTP", -60.0f, 6.0f),
            ValueMeter("INVALID_SAMPLES", QT_TRANSLATE_NOOP("ZenMeter", "Invalid Samples"), "", 0.0f, 1e9f),
            LevelMeter("TRUE_PEAK", QT_TRANSLATE_NOOP("ZenMeter", "True Peak"), "dBTP", -60.0f, 6.0f).PerChannel(),
            LevelMeter("SAMPLE_PEAK", QT_TRANSLATE_NOOP("ZenMeter", "Sample Peak"), "dBFS", -60.0f, 6.0f)
                .PerChannel(),
            LevelMeter("RMS", QT_TRANSLATE_NOOP("ZenMeter", "RMS"), "dBFS", -60.0f, 6.0f).PerChannel(),
            LevelMeter("AVERAGE_RMS", QT_TRANSLATE_NOOP("ZenMeter", "Average RMS"), "dBFS", -60.0f, 6.0f)
                .PerChannel(),
            RingMeter("HISTORY", QT_TRANSLATE_NOOP("ZenMeter", "Loudness History"), "LUFS", kScaleLowLufs,
                      kScaleHighLufs, 3, kHistoryRecords),
        });
    return table;
}

void ZenMeter::UpdateProcessingParameter(std::uint32_t index, float value) {
    switch (index) {
        case kLfeChannel:
            m_lfeChoice = value;
            zen::LfeChoice::ApplyWeights(m_loudness, m_lfeChoice);
            break;
        case kTruePeak: m_loudness.SetTruePeakEnabled(value >= 0.5f); break;
        case kReset: {
            const bool on = value >= 0.5f;
            if (on && !m_resetHeld) {
                m_loudness.Reset();
                m_hopsPushed = 0;
                m_nonFiniteAtReset = NonFiniteInputSamples();
                ResetMeters();
            }
            m_resetHeld = on;
            break;
        }
        default: break;  // the scale is the editor's
    }
}

void ZenMeter::PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) {
    m_loudness.SetChannelCount(GetProcessChannelCount());
    m_loudness.Prepare(sampleRate, maxBlockSize);
    zen::LfeChoice::ApplyWeights(m_loudness, m_lfeChoice);
    m_hopsPushed = 0;
    SetLatency(0);
}

void ZenMeter::ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    // Cut at every 100 ms hop so that the history holds every hop, whatever the block size.
    const std::size_t hop = m_loudness.HopLength();
    for (std::uint32_t done = 0; done < frames;) {
        const auto untilHop = static_cast<std::uint32_t>(hop - m_loudness.FramesMeasured() % hop);
        const std::uint32_t n = std::min(frames - done, untilHop);
        for (std::uint32_t c = 0; c < channelCount; ++c) m_chunk[c] = channels[c] + done;
        m_loudness.Process(m_chunk, n);
        done += n;
        if (m_loudness.Hops() != m_hopsPushed) {
            m_hopsPushed = m_loudness.Hops();
            const float record[3] = {Lufs(m_loudness.Momentary()), Lufs(m_loudness.ShortTerm()),
                                     Lufs(m_loudness.Integrated())};
            PushRing(kHistory, 0, record);
        }
    }
    Publish();
}

void ZenMeter::Publish() noexcept {
    PublishMeter(kMomentary, Lufs(m_loudness.Momentary()));
    PublishMeter(kShortTerm, Lufs(m_loudness.ShortTerm()));
    PublishMeter(kIntegrated, Lufs(m_loudness.Integrated()));
    PublishMeter(kRange, static_cast<float>(m_loudness.Range()));
    PublishMeter(kMaxMomentary, Lufs(m_loudness.MaxMomentary()));
    PublishMeter(kMaxShortTerm, Lufs(m_loudness.MaxShortTerm()));
    const std::uint64_t invalid = m_loudness.InvalidSamples() + NonFiniteInputSamples() - m_nonFiniteAtReset;
    PublishMeter(kInvalidSamples, static_cast<float>(invalid));
    float loudest = 0.0f;
    const auto channels = static_cast<std::uint32_t>(m_loudness.GetChannelCount());
    for (std::uint32_t c = 0; c < channels; ++c) {
        const float truePeak = m_loudness.TruePeak(c);
        loudest = std::max(loudest, truePeak);
        PublishMeter(kTruePeakMeter, c, truePeak);
        PublishMeter(kSamplePeak, c, m_loudness.SamplePeak(c));
        PublishMeter(kRms, c, static_cast<float>(m_loudness.Rms(c)));
        PublishMeter(kAverageRms, c, static_cast<float>(m_loudness.AverageRms(c)));
    }
    PublishMeter(kMaxTruePeak, loudest);
}

void ZenMeter::ResetProcessing() {
    m_loudness.Reset();
    m_hopsPushed = 0;
    m_nonFiniteAtReset = NonFiniteInputSamples();
}

template class ZenAudioPlugin<ZenMeter>;
