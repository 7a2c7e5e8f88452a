#include "ZenTestBlockPeak.h"

#include <algorithm>
#include <cmath>

#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenTestBlockPeak::kDescriptor =
    FaultyDescriptor("Test Block Peak", "ZenTestBlockPeak", 'B', 'p');

void ZenTestBlockPeak::ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    for (std::uint32_t c = 0; c < channelCount; ++c) {
        float peak = 0.0f;
        for (std::uint32_t i = 0; i < frames; ++i) peak = std::max(peak, std::fabs(channels[c][i]));
        // The fault: one gain for whatever block the host happens to pass.
        const float gain = peak > kCeiling ? kCeiling / peak : 1.0f;
        for (std::uint32_t i = 0; i < frames; ++i) channels[c][i] *= gain;
    }
    ZenFaultyGain::ProcessBlock(channels, channelCount, frames);
}

template class ZenAudioPlugin<ZenTestBlockPeak>;
