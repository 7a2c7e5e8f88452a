#include "ZenSoftClipper.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenSoftClipper::kDescriptor = {
    "Soft Clipper", 1.0, zen::kPluginStateOffered, zen::MakePluginCode('Z', 'n', 'S', 'c'),
    32, 32, "ZenSoftClipper", 0, 0, -1, nullptr};

namespace {

// tanh(1) in single precision, once per process.
float TanhOne() {
    static const float value = std::tanh(1.0f);
    return value;
}

}  // namespace

ZenSoftClipper::ZenSoftClipper() {
    InitParameters(Definitions());
    InitMeters(Meters());
}

const zen::ParameterTableDefinition& ZenSoftClipper::Definitions() {
    using namespace zen;
    static const ParameterTableDefinition table = MakeParameterTable(
        "ZenSoftClipper",
        {
            ContinuousParameter("THRESHOLD", QT_TRANSLATE_NOOP("ZenSoftClipper", "Threshold"), -18.0f, 18.0f, 0.0f,
                                0.1f, "dB")
                .Smoothed(working::DbToGainFloored),
            ContinuousParameter("SHAPE", QT_TRANSLATE_NOOP("ZenSoftClipper", "Shape"), 0.0f, 1.0f, 1.0f, 0.01f)
                .Smoothed(working::Identity),
            ContinuousParameter("OUTPUT_GAIN", QT_TRANSLATE_NOOP("ZenSoftClipper", "Output Level"), -18.0f, 6.0f,
                                0.0f, 0.1f, "dB")
                .Smoothed(working::DbToGain),
        });
    return table;
}

const zen::MeterTableDefinition& ZenSoftClipper::Meters() {
    using namespace zen;
    static const MeterTableDefinition table = MakeMeterTable(
        "ZenSoftClipper",
        {
            // Drive reaches +18 dB above full scale.
            LevelMeter("CLIPPING", QT_TRANSLATE_NOOP("ZenSoftClipper", "Clipping"), "dBFS", -60.0f, 24.0f),
            LevelMeter("INPUT_PEAK", QT_TRANSLATE_NOOP("ZenSoftClipper", "Input Peak"), "dBFS", -60.0f, 6.0f)
                .PerChannel(),
            LevelMeter("OUTPUT_PEAK", QT_TRANSLATE_NOOP("ZenSoftClipper", "Output Peak"), "dBFS", -60.0f, 6.0f)
                .PerChannel(),
        });
    return table;
}

float ZenSoftClipper::Clip(float x, float k, float s) noexcept {
    const float magnitude = std::fabs(x);
    if (!(magnitude >= k)) return x;
    const float rounded = k * (s * std::tanh(magnitude / k) / TanhOne() + (1.0f - s));
    return std::copysign(rounded, x);
}

void ZenSoftClipper::ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    float clipLevel = 0.0f;
    for (std::uint32_t c = 0; c < channelCount; ++c) {
        auto threshold = Smoothed(kThreshold).Track(c);
        auto shape = Smoothed(kShape).Track(c);
        auto outputGain = Smoothed(kOutputGain).Track(c);
        float inputPeak = 0.0f;
        float outputPeak = 0.0f;
        float* samples = channels[c];
        for (std::uint32_t i = 0; i < frames; ++i) {
            const auto t = static_cast<float>(threshold.Next());
            const auto s = static_cast<float>(shape.Next());
            float x = samples[i];
            inputPeak = std::max(inputPeak, std::fabs(x));
            // Above 0 dB the threshold drives into a knee at full scale;
            // at or below, it lowers the knee without drive.
            if (t > 1.0f) x *= t;
            const float k = std::min(1.0f, t);
            if (std::fabs(x) >= k) clipLevel = std::max(clipLevel, std::fabs(x));
            x = Clip(x, k, s);
            const float y = static_cast<float>(outputGain.Next()) * x;
            samples[i] = y;
            outputPeak = std::max(outputPeak, std::fabs(y));
        }
        PublishMeter(kInputPeak, c, inputPeak);
        PublishMeter(kOutputPeak, c, outputPeak);
    }
    PublishMeter(kClipping, clipLevel);
}

template class ZenAudioPlugin<ZenSoftClipper>;
