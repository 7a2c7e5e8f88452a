#include "ZenHumRemoval.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenHumRemoval::kDescriptor = {
    "De-Hummer", 1.0, zen::kPluginStateOffered, zen::MakePluginCode('Z', 'e', 'n', 'h'),
    8, 8, "ZenHumRemoval", 0, 0, -1, nullptr};

namespace {

constexpr double kPi = 3.141592653589793;
constexpr float kMainsHz[] = {50.0f, 60.0f};

}  // namespace

ZenHumRemoval::ZenHumRemoval() {
    InitParameters(Definitions());
    InitMeters(Meters());
}

const zen::ParameterTableDefinition& ZenHumRemoval::Definitions() {
    using namespace zen;
    static const ParameterTableDefinition table = MakeParameterTable(
        "ZenHumRemoval",
        {
            ListParameter("FREQUENCY", QT_TRANSLATE_NOOP("ZenHumRemoval", "Frequency"),
                          {QT_TRANSLATE_NOOP("ZenHumRemoval", "50 Hz"), QT_TRANSLATE_NOOP("ZenHumRemoval", "60 Hz")},
                          static_cast<float>(k50Hz)),
            ContinuousParameter("HARMONICS", QT_TRANSLATE_NOOP("ZenHumRemoval", "Harmonics"), 1.0f,
                                static_cast<float>(TrackingNotchBank::kMaxHarmonics), 10.0f, 1.0f),
            ContinuousParameter("WIDTH", QT_TRANSLATE_NOOP("ZenHumRemoval", "Width"), 0.1f, 10.0f, 1.0f, 0.01f, "Hz"),
            SwitchParameter("TRACKING", QT_TRANSLATE_NOOP("ZenHumRemoval", "Tracking"), 1.0f),
            ContinuousParameter("AMOUNT", QT_TRANSLATE_NOOP("ZenHumRemoval", "Amount"), 0.0f, 100.0f, 100.0f, 0.1f, "%")
                .Smoothed(working::PercentToFraction),
            SwitchParameter("LISTEN", QT_TRANSLATE_NOOP("ZenHumRemoval", "listen to removed hum"), 0.0f)
                .Smoothed(working::Identity),
        });
    return table;
}

const zen::MeterTableDefinition& ZenHumRemoval::Meters() {
    using namespace zen;
    static const MeterTableDefinition table = MakeMeterTable(
        "ZenHumRemoval",
        {
            ValueMeter("HUM_FREQUENCY", QT_TRANSLATE_NOOP("ZenHumRemoval", "Hum Frequency"), "Hz", 49.0f, 61.0f)
                .AtRest(kMainsHz[k50Hz]),
            LevelMeter("HUM_LEVEL", QT_TRANSLATE_NOOP("ZenHumRemoval", "Hum Level"), "dBFS", -90.0f, 0.0f),
            LevelMeter("OUTPUT_PEAK", QT_TRANSLATE_NOOP("ZenHumRemoval", "Output Peak"), "dBFS", -60.0f, 6.0f)
                .PerChannel(),
        });
    return table;
}

std::uint32_t ZenHumRemoval::GetTailLength() const {
    // The fundamental's canceller is the slowest: a one-pole of half the width.
    const double width = Parameters()[kWidth].GetValue();
    return static_cast<std::uint32_t>(std::ceil(kTailNepers / (kPi * width) * GetSampleRate()));
}

bool ZenHumRemoval::ApplyNeutralSetting() {
    ZenAudioPluginImpl::ApplyNeutralSetting();
    return SetParameter(kAmount, 0.0f);
}

void ZenHumRemoval::UpdateProcessingParameter(std::uint32_t index, float value) {
    switch (index) {
        case kFrequency:
            m_notches.SetParameter(TrackingNotchBank::kFundamental,
                                   kMainsHz[std::clamp(static_cast<int>(std::lround(value)), 0, 1)]);
            break;
        case kHarmonics: m_notches.SetParameter(TrackingNotchBank::kHarmonics, value); break;
        case kWidth: m_notches.SetParameter(TrackingNotchBank::kWidth, value); break;
        case kTracking: m_notches.SetParameter(TrackingNotchBank::kTracking, value); break;
        default: break;
    }
}

void ZenHumRemoval::PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) {
    const std::uint32_t channels = GetProcessChannelCount();
    m_notches.SetChannelCount(channels);
    m_notches.Prepare(sampleRate, maxBlockSize);
    m_humBuffer.assign(static_cast<std::size_t>(channels) * maxBlockSize, 0.0f);
    m_hum.resize(channels);
    for (std::uint32_t c = 0; c < channels; ++c) m_hum[c] = m_humBuffer.data() + c * maxBlockSize;
    SetLatency(0);
    ResetProcessing();
}

void ZenHumRemoval::ResetProcessing() { m_notches.Reset(); }

void ZenHumRemoval::ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    m_notches.EstimateHum(channels, m_hum.data(), frames);
    float humPeak = 0.0f;
    for (std::uint32_t c = 0; c < channelCount; ++c) {
        auto amount = Smoothed(kAmount).Track(c);
        auto listen = Smoothed(kListen).Track(c);
        float* x = channels[c];
        const float* hum = m_hum[c];
        float outputPeak = 0.0f;
        for (std::uint32_t i = 0; i < frames; ++i) {
            const double removed = amount.Next() * hum[i];
            const double l = listen.Next();
            const auto y = static_cast<float>((1.0 - l) * (x[i] - removed) + l * removed);
            x[i] = y;
            humPeak = std::max(humPeak, std::fabs(hum[i]));
            outputPeak = std::max(outputPeak, std::fabs(y));
        }
        PublishMeter(kOutputPeak, c, outputPeak);
    }
    PublishMeter(kHumFrequency, static_cast<float>(m_notches.GetTrackedFrequency()));
    PublishMeter(kHumLevel, humPeak);
}

template class ZenAudioPlugin<ZenHumRemoval>;
