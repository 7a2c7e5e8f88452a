#include "ZenPhaseMeter.h"

#include <QCoreApplication>
#include <algorithm>
#include <cfloat>
#include <cmath>

#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenPhaseMeter::kDescriptor = {
    "Phase Meter", 1.0, zen::kPluginStateOffered, zen::MakePluginCode('Z', 'n', 'P', 'M'),
    2, 2, "ZenPhaseMeter", 0, 0, -1, nullptr};

namespace {

constexpr float kHalfSqrt2 = 0.70710678f;

float Finite(float x) { return std::fabs(x) <= FLT_MAX ? x : 0.0f; }

}  // namespace

ZenPhaseMeter::ZenPhaseMeter() {
    InitParameters(Definitions());
    InitMeters(Meters());
}

const zen::ParameterTableDefinition& ZenPhaseMeter::Definitions() {
    using namespace zen;
    static const ParameterTableDefinition table = MakeParameterTable(
        "ZenPhaseMeter", {
                             LogarithmicParameter("TIME", QT_TRANSLATE_NOOP("ZenPhaseMeter", "Time"), 10.0f, 5000.0f,
                                                  300.0f, 1.0f, "ms"),
                         });
    return table;
}

const zen::MeterTableDefinition& ZenPhaseMeter::Meters() {
    using namespace zen;
    static const MeterTableDefinition table = MakeMeterTable(
        "ZenPhaseMeter",
        {
            ValueMeter("CORRELATION", QT_TRANSLATE_NOOP("ZenPhaseMeter", "Correlation"), "", -1.0f, 1.0f),
            ValueMeter("BALANCE", QT_TRANSLATE_NOOP("ZenPhaseMeter", "Balance"), "", -1.0f, 1.0f),
            LevelMeter("MID", QT_TRANSLATE_NOOP("ZenPhaseMeter", "Mid"), "dBFS", -60.0f, 6.0f),
            LevelMeter("SIDE", QT_TRANSLATE_NOOP("ZenPhaseMeter", "Side"), "dBFS", -60.0f, 6.0f),
            ValueMeter("OVERALL_CORRELATION", QT_TRANSLATE_NOOP("ZenPhaseMeter", "Overall Correlation"), "", -1.0f,
                       1.0f),
            RingMeter("GONIOMETER", QT_TRANSLATE_NOOP("ZenPhaseMeter", "Goniometer"), "", -1.5f, 1.5f, 2,
                      kGoniometerPoints),
        });
    return table;
}

void ZenPhaseMeter::UpdateProcessingParameter(std::uint32_t index, float value) {
    if (index == kTime) m_correlation.SetParameter(CorrelationMeter::kTime, value);
}

bool ZenPhaseMeter::AcceptsChannelConfiguration(std::uint32_t inputs, std::uint32_t outputs) const {
    return inputs == 2 && outputs == 2;
}

void ZenPhaseMeter::PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) {
    m_correlation.SetChannelCount(2);
    m_correlation.Prepare(sampleRate, maxBlockSize);
    m_pointStep = static_cast<std::uint32_t>(std::max(1.0, std::round(sampleRate / kPointRate)));
    m_untilPoint = 0;
    SetLatency(0);
}

void ZenPhaseMeter::ProcessBlock(float* const* channels, std::uint32_t, std::uint32_t frames) noexcept {
    m_correlation.Process(channels, frames);
    const float* left = channels[0];
    const float* right = channels[1];
    std::uint32_t i = m_untilPoint;
    for (; i < frames; i += m_pointStep) {
        const float l = Finite(left[i]);
        const float r = Finite(right[i]);
        const float point[2] = {(r - l) * kHalfSqrt2, (l + r) * kHalfSqrt2};
        PushRing(kGoniometer, 0, point);
    }
    m_untilPoint = i - frames;

    const CorrelationMeter::Image now = m_correlation.Current();
    PublishMeter(kCorrelation, static_cast<float>(now.correlation));
    PublishMeter(kBalance, static_cast<float>(now.balance));
    PublishMeter(kMid, static_cast<float>(now.midRms));
    PublishMeter(kSide, static_cast<float>(now.sideRms));
    PublishMeter(kOverallCorrelation, static_cast<float>(m_correlation.Overall().correlation));
}

void ZenPhaseMeter::ResetProcessing() {
    m_correlation.Reset();
    m_untilPoint = 0;
}

template class ZenAudioPlugin<ZenPhaseMeter>;
