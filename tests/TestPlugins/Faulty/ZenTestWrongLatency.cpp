#include "ZenTestWrongLatency.h"

#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenTestWrongLatency::kDescriptor =
    FaultyDescriptor("Test Wrong Latency", "ZenTestWrongLatency", 'W', 'l');

void ZenTestWrongLatency::PrepareProcessing(float, std::uint32_t maxBlock) {
    m_delay.Dimension(GetProcessChannelCount(), maxBlock, kDelay);
    // The fault: a latency that is not the delay.
    SetLatency(kReported);
}

void ZenTestWrongLatency::ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    for (std::uint32_t c = 0; c < channelCount; ++c) m_delay.ProcessChannel(c, channels[c], frames);
    ZenFaultyGain::ProcessBlock(channels, channelCount, frames);
}

void ZenTestWrongLatency::ResetProcessing() { m_delay.Reset(); }

template class ZenAudioPlugin<ZenTestWrongLatency>;
