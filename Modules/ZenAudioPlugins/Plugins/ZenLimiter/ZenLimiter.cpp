#include "ZenLimiter.h"

#include <QCoreApplication>
#include <algorithm>

#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenLimiter::kDescriptor = {
    "Limiter", 1.0, zen::kPluginStateOffered, zen::MakePluginCode('Z', 'n', 'L', 'r'),
    32, 32, "ZenLimiter", 0, 0, -1, nullptr};

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
                .SmoothedSingle(Limiter::CeilingGain),
            zen::ContinuousParameter("RELEASE", QT_TRANSLATE_NOOP("ZenLimiter", "Release"), 0.0f, 1000.0f, 1.0f, 0.01f,
                                     "ms"),
            zen::SwitchParameter("SOFT", QT_TRANSLATE_NOOP("ZenLimiter", "Soft"), 0.0f),
        },
        zen::HostScale::PerMille);  // template integers are places along the controls
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

void ZenLimiter::UpdateProcessingParameter(std::uint32_t index, float value) {
    if (index == kRelease) m_limiter.SetParameter(Limiter::kRelease, value);
    if (index == kSoft) m_limiter.SetParameter(Limiter::kSoft, value);
}

void ZenLimiter::PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) {
    m_limiter.SetChannelCount(GetProcessChannelCount());
    m_limiter.Prepare(sampleRate, maxBlockSize);
    m_ceilings.assign(maxBlockSize, 1.0f);
    SetLatency(m_limiter.GetLatency());
}

void ZenLimiter::ResetProcessing() { m_limiter.Reset(); }

void ZenLimiter::ApplyInputGain(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    for (std::uint32_t c = 0; c < channelCount; ++c) {
        auto gain = Smoothed(kInputGain).Track(c);
        float* x = channels[c];
        if (!gain.IsSettled()) {
            for (std::uint32_t i = 0; i < frames; ++i) x[i] *= static_cast<float>(gain.Next());
        } else if (const auto g = static_cast<float>(gain.Value()); g != 1.0f) {
            m_vec.Scale(x, g, x, frames);
        }
    }
}

void ZenLimiter::Limit(float* const* channels, std::uint32_t frames) noexcept {
    auto ceiling = Smoothed(kCeiling).Track(0);
    if (ceiling.IsSettled()) {
        m_limiter.Process(channels, frames, static_cast<float>(ceiling.Value()));
        return;
    }
    for (std::uint32_t i = 0; i < frames; ++i) m_ceilings[i] = static_cast<float>(ceiling.Next());
    m_limiter.Process(channels, frames, m_ceilings.data());
}

void ZenLimiter::ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    ApplyInputGain(channels, channelCount, frames);
    Limit(channels, frames);

    for (std::uint32_t c = 0; c < channelCount; ++c) {
        PublishMeter(kInputTruePeakMeter, c, m_limiter.GetInputTruePeak(c));
        PublishMeter(kOutputPeakMeter, c, m_limiter.GetOutputPeak(c));
    }
    PublishMeter(kGainMeter, m_limiter.GetGain());
}

template class ZenAudioPlugin<ZenLimiter>;
