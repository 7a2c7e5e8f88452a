#include "ZenTestAllocating.h"

#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenTestAllocating::kDescriptor =
    FaultyDescriptor("Test Allocating", "ZenTestAllocating", 'A', 'l');

void ZenTestAllocating::ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    // The fault: scratch sized on the audio thread instead of in Prepare.
    std::vector<float> scratch(channels[0], channels[0] + frames);
    m_scratch.swap(scratch);
    ZenFaultyGain::ProcessBlock(channels, channelCount, frames);
}

template class ZenAudioPlugin<ZenTestAllocating>;
