#include "ZenTestNanState.h"

#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenTestNanState::kDescriptor = FaultyDescriptor("Test NaN State", "ZenTestNanState", 'N', 's');

void ZenTestNanState::ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    const float s = GetParameter(kSmoothing);
    for (std::uint32_t c = 0; c < channelCount; ++c) {
        float y = m_state[c];
        // The fault: nothing clears a non-finite state.
        for (std::uint32_t i = 0; i < frames; ++i) channels[c][i] = y = (1.0f - s) * channels[c][i] + s * y;
        m_state[c] = y;
    }
    ZenFaultyGain::ProcessBlock(channels, channelCount, frames);
}

void ZenTestNanState::ResetProcessing() {
    for (float& state : m_state) state = 0.0f;
}

template class ZenAudioPlugin<ZenTestNanState>;
