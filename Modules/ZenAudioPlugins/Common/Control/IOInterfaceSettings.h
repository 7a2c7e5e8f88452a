// "I/O Interface Settings": the device bridge's device, rate, block size, channel counts and routing.
#pragma once

#include "ZenSettingsControl.h"

class IOInterfaceSettings : public ZenSettingsControl {
public:
    static constexpr const char* kName = "I/O Interface Settings";
    static constexpr const char* kClassName = "IOInterfaceSettings";

    IOInterfaceSettings();
};
