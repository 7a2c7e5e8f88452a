#include "ZenSoftClipper.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

#include "Common/Decibels.h"
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
    AttachSmoothedValue(m_threshold);
    AttachSmoothedValue(m_shape);
    AttachSmoothedValue(m_outputGain);
}

const zen::ParameterTableDefinition& ZenSoftClipper::Definitions() {
    static const zen::ParameterTableDefinition table = zen::MakeParameterTable(
        "ZenSoftClipper",
        {
            zen::ContinuousParameter("THRESHOLD", QT_TRANSLATE_NOOP("ZenSoftClipper", "Threshold"), -18.0f, 18.0f,
                                     0.0f, 0.1f, "dB"),
            zen::ContinuousParameter("SHAPE", QT_TRANSLATE_NOOP("ZenSoftClipper", "Shape"), 0.0f, 1.0f, 1.0f, 0.01f),
            zen::ContinuousParameter("OUTPUT_GAIN", QT_TRANSLATE_NOOP("ZenSoftClipper", "Output Level"), -18.0f,
                                     6.0f, 0.0f, 0.1f, "dB"),
        });
    return table;
}

bool ZenSoftClipper::OnParameterChanged(std::uint32_t index, float value) {
    if (!ZenAudioPluginImpl::OnParameterChanged(index, value)) return false;
    switch (index) {
        case kThreshold: m_threshold.SetTarget(zen::DbToGainFloored(value)); break;
        case kShape: m_shape.SetTarget(value); break;
        case kOutputGain: m_outputGain.SetTarget(zen::DbToGain(value)); break;
        default: break;
    }
    return true;
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
        auto threshold = m_threshold.Track(c);
        auto shape = m_shape.Track(c);
        auto outputGain = m_outputGain.Track(c);
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
        m_inputPeak[c].store(inputPeak, std::memory_order_relaxed);
        m_outputPeak[c].store(outputPeak, std::memory_order_relaxed);
    }
    m_clipLevel.store(clipLevel, std::memory_order_relaxed);
}

void ZenSoftClipper::ResetProcessing() {
    for (std::uint32_t c = 0; c < kMaxChannels; ++c) {
        m_inputPeak[c].store(0.0f);
        m_outputPeak[c].store(0.0f);
    }
    m_clipLevel.store(0.0f);
}

std::uint32_t ZenSoftClipper::GetMeterCount() const { return 1 + 2 * GetProcessChannelCount(); }

bool ZenSoftClipper::GetMeterInfo(std::uint32_t index, zen::MeterInfo& info) const {
    if (index >= GetMeterCount()) return false;
    info.unit = "dBFS";
    info.minimum = -60.0f;
    info.maximum = 6.0f;
    if (index == kClipMeter) {
        info.name = QCoreApplication::translate("ZenSoftClipper", "Clipping").toStdString();
        info.maximum = 24.0f;  // drive reaches +18 dB above full scale
        return true;
    }
    const std::uint32_t channel = (index - 1) / 2;
    const QString name = (index - 1) % 2 == 0 ? QCoreApplication::translate("ZenSoftClipper", "Input Peak %1")
                                              : QCoreApplication::translate("ZenSoftClipper", "Output Peak %1");
    info.name = name.arg(channel + 1).toStdString();
    return true;
}

float ZenSoftClipper::GetMeter(std::uint32_t index) const {
    if (index >= GetMeterCount()) return 0.0f;
    if (index == kClipMeter) return zen::GainToMeterDb(m_clipLevel.load(std::memory_order_relaxed));
    const std::uint32_t channel = (index - 1) / 2;
    const auto& peaks = (index - 1) % 2 == 0 ? m_inputPeak : m_outputPeak;
    return zen::GainToMeterDb(peaks[channel].load(std::memory_order_relaxed));
}

template class ZenAudioPlugin<ZenSoftClipper>;
