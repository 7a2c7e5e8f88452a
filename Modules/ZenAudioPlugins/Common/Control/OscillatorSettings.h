// "Test Tones Settings": the test signal zenfx renders: sine, pink or white noise or a sweep, its level, frequency and
// channel.
#pragma once

#include "ZenSettingsControl.h"

class OscillatorSettings : public ZenSettingsControl {
public:
    static constexpr const char* kName = "Test Tones Settings";
    static constexpr const char* kClassName = "OscillatorSettings";

    OscillatorSettings();
};
