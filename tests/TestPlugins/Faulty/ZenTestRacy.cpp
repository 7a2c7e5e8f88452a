#include "ZenTestRacy.h"

#include "Common/Decibels.h"
#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenTestRacy::kDescriptor = FaultyDescriptor("Test Racy", "ZenTestRacy", 'R', 'c');

bool ZenTestRacy::OnParameterChanged(std::uint32_t index, float value) {
    if (!ZenFaultyGain::OnParameterChanged(index, value)) return false;
    // The fault: written here, read on the audio thread, not atomic.
    if (index == kGain) m_plainGain = zen::DbToGain(value);
    return true;
}

void ZenTestRacy::ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    for (std::uint32_t c = 0; c < channelCount; ++c)
        for (std::uint32_t i = 0; i < frames; ++i) channels[c][i] *= m_plainGain;
}

template class ZenAudioPlugin<ZenTestRacy>;
