#include "ZenDeesser.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>
#include <iterator>

#include "Common/Decibels.h"
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

ZenDeesser::ZenDeesser() { InitParameters(Definitions()); }

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
    m_outputPeak.store(peak, std::memory_order_relaxed);
}

void ZenDeesser::ResetProcessing() {
    m_deesser.Reset();
    m_outputPeak.store(0.0f, std::memory_order_relaxed);
}

bool ZenDeesser::GetMeterInfo(std::uint32_t index, zen::MeterInfo& info) const {
    switch (index) {
        case kReductionMeter:
            info.name = QCoreApplication::translate("ZenDeesser", "Reduction").toStdString();
            info.unit = "dB";
            info.minimum = kReductionMeterFloorDb;
            info.maximum = 0.0f;
            return true;
        case kOutputMeter:
            info.name = QCoreApplication::translate("ZenDeesser", "Output").toStdString();
            info.unit = "dBFS";
            info.minimum = -60.0f;
            info.maximum = 6.0f;
            return true;
        default: return false;
    }
}

float ZenDeesser::GetMeter(std::uint32_t index) const {
    switch (index) {
        case kReductionMeter: return m_deesser.GetMeter(Deesser::kReductionMeter);
        case kOutputMeter: return zen::GainToMeterDb(m_outputPeak.load(std::memory_order_relaxed));
        default: return 0.0f;
    }
}

template class ZenAudioPlugin<ZenDeesser>;
