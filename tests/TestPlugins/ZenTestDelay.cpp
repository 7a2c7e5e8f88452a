#include "ZenTestDelay.h"

#include "Common/Decibels.h"
#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenTestDelay::kDescriptor = {
    "Test Delay", 1.0, zen::kPluginStateOffered, zen::MakePluginCode('Z', 't', 'D', 'l'),
    2, 2, "ZenTestDelay", 0, 0, -1, nullptr};

ZenTestDelay::ZenTestDelay() {
    InitParameters(Definitions());
    AttachSmoothedValue(m_gain);
}

const zen::ParameterTableDefinition& ZenTestDelay::Definitions() {
    static const zen::ParameterTableDefinition table = zen::MakeParameterTable(
        "ZenTestDelay", {
                            zen::ContinuousParameter("DELAY", "Delay", 0.0f, 4800.0f, 64.0f, 1.0f, "samples"),
                            zen::ContinuousParameter("GAIN", "Gain", -24.0f, 12.0f, 0.0f, 0.1f, "dB"),
                            zen::ListParameter("MODE", "Mode", {"Plain", "Inverted"}, 0.0f),
                        });
    return table;
}

bool ZenTestDelay::OnParameterChanged(std::uint32_t index, float value) {
    if (!ZenAudioPluginImpl::OnParameterChanged(index, value)) return false;
    if (index == kGain) m_gain.SetTarget(zen::DbToGain(value));
    return true;
}

void ZenTestDelay::UpdateProcessingParameter(std::uint32_t, float) { ++m_updates; }

void ZenTestDelay::PrepareProcessing(float, std::uint32_t maxBlock) {
    const auto delay = static_cast<std::uint32_t>(GetParameter(kDelay));
    m_delay.Dimension(GetProcessChannelCount(), maxBlock, delay);
    SetLatency(delay);
}

void ZenTestDelay::ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    const float sign = GetParameter(kMode) >= 0.5f ? -1.0f : 1.0f;
    for (std::uint32_t c = 0; c < channelCount; ++c) {
        auto gain = m_gain.Track(c);
        m_delay.ProcessChannel(c, channels[c], frames);
        for (std::uint32_t i = 0; i < frames; ++i) channels[c][i] *= sign * static_cast<float>(gain.Next());
    }
}

void ZenTestDelay::ResetProcessing() { m_delay.Reset(); }

template class ZenAudioPlugin<ZenTestDelay>;
