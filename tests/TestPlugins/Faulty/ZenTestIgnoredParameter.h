// "Test Ignored Parameter": answers true to changes of "Gain" but keeps the
// old value.
#pragma once

#include "ZenFaultyGain.h"

class ZenTestIgnoredParameter : public ZenFaultyGain {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    ZenTestIgnoredParameter() : ZenFaultyGain(kDescriptor.className) {}

protected:
    bool OnParameterChanged(std::uint32_t index, float value) override;
};
