// "Performance Testing": how every audio plug-in is run on the null device to measure its CPU load.
#pragma once

#include "ZenSettingsControl.h"

class PerformanceTesting : public ZenSettingsControl {
public:
    static constexpr const char* kName = "Performance Testing";
    static constexpr const char* kClassName = "PerformanceTesting";

    PerformanceTesting();
};
