#include "ZenTestLocking.h"

#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenTestLocking::kDescriptor = FaultyDescriptor("Test Locking", "ZenTestLocking", 'L', 'k');

void ZenTestLocking::ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    // The fault: a lock on the audio path.
    std::lock_guard<std::mutex> lock(m_mutex);
    ZenFaultyGain::ProcessBlock(channels, channelCount, frames);
}

template class ZenAudioPlugin<ZenTestLocking>;
