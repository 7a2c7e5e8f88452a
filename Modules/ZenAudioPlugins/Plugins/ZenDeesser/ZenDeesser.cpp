#include "ZenDeesser.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>
#include <iterator>

#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenDeesser::kDescriptor = {
    "De-Esser", 1.0, zen::kPluginStateOffered, zen::MakePluginCode('Z', 'e', 'n', 's'),
    2, 2, "ZenDeesser", 0, 0, -1, nullptr};

namespace {

// The Deesser parameter each of ours drives, in our index order.
constexpr std::uint64_t kForwardedTo[] = {Deesser::kListen, Deesser::kRange, Deesser::kMode, Deesser::kAmount};

// Display range of the reduction meter: the largest boost, 100 % "Amount", is 16.7 dB.
constexpr float kReductionMeterFloorDb = -18.0f;

}  // namespace

ZenDeesser::ZenDeesser() {
    InitParameters(Definitions());
    InitMeters(Meters());
}

const zen::ParameterTableDefinition& ZenDeesser::Definitions() {
    static const zen::ParameterTableDefinition table = zen::MakeParameterTable(
        "ZenDeesser",
        {
            zen::SwitchParameter("ESS_ONLY", QT_TRANSLATE_NOOP("ZenDeesser", "Ess Only"), 0.0f),
            // The algorithm's own default is 1000 Hz; this one always overrides it.
            zen::ContinuousParameter("RANGE", QT_TRANSLATE_NOOP("ZenDeesser", "Frequency"), 700.0f, 9000.0f, 7000.0f,
                                     1.0f, "Hz"),
            zen::ListParameter("MODE", QT_TRANSLATE_NOOP("ZenDeesser", "Range"),
                               {QT_TRANSLATE_NOOP("ZenDeesser", "Narrow"), QT_TRANSLATE_NOOP("ZenDeesser", "Wide"),
                                QT_TRANSLATE_NOOP("ZenDeesser", "HF")},
                               0.0f),
            zen::ContinuousParameter("AMOUNT", QT_TRANSLATE_NOOP("ZenDeesser", "Amount"), 0.0f, 100.0f, 50.0f, 0.1f,
                                     "%"),
        });
    return table;
}

const zen::MeterTableDefinition& ZenDeesser::Meters() {
    static const zen::MeterTableDefinition table = zen::MakeMeterTable(
        "ZenDeesser", {
                          zen::ValueMeter("REDUCTION", QT_TRANSLATE_NOOP("ZenDeesser", "Reduction"), "dB",
                                          kReductionMeterFloorDb, 0.0f),
                          zen::LevelMeter("OUTPUT", QT_TRANSLATE_NOOP("ZenDeesser", "Output"), "dBFS", -60.0f, 6.0f),
                      });
    return table;
}

void ZenDeesser::UpdateProcessingParameter(std::uint32_t index, float value) {
    if (index < std::size(kForwardedTo)) m_deesser.SetParameter(kForwardedTo[index], value);
}

bool ZenDeesser::AcceptsChannelConfiguration(std::uint32_t inputs, std::uint32_t outputs) const {
    return inputs == outputs && inputs >= 1 && inputs <= SibilanceControl::kMaxChannels;
}

void ZenDeesser::PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) {
    m_deesser.SetChannelCount(GetProcessChannelCount());
    m_deesser.Prepare(sampleRate, maxBlockSize);
    SetLatency(0);
    ResetProcessing();
}

void ZenDeesser::ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    m_deesser.Process(channels, frames);
    float peak = 0.0f;
    for (std::uint32_t c = 0; c < channelCount; ++c)
        for (std::uint32_t i = 0; i < frames; ++i) peak = std::max(peak, std::fabs(channels[c][i]));
    PublishMeter(kReductionMeter, m_deesser.GetMeter(Deesser::kReductionMeter));
    PublishMeter(kOutputMeter, peak);
}

void ZenDeesser::ResetProcessing() { m_deesser.Reset(); }

template class ZenAudioPlugin<ZenDeesser>;
