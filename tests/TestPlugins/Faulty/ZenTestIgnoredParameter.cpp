#include "ZenTestIgnoredParameter.h"

#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenTestIgnoredParameter::kDescriptor =
    FaultyDescriptor("Test Ignored Parameter", "ZenTestIgnoredParameter", 'I', 'g');

bool ZenTestIgnoredParameter::OnParameterChanged(std::uint32_t index, float value) {
    // The fault: the change is acknowledged and dropped.
    if (index == kGain) return true;
    return ZenFaultyGain::OnParameterChanged(index, value);
}

template class ZenAudioPlugin<ZenTestIgnoredParameter>;
