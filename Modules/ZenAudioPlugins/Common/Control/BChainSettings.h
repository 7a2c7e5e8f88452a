// "B-Chain Control": per output channel of the monitor path: gain, sample-exact delay, polarity and a four-band EQ for
// room tuning.
#pragma once

#include "ZenSettingsControl.h"

class BChainSettings : public ZenSettingsControl {
public:
    static constexpr const char* kName = "B-Chain Control";
    static constexpr const char* kClassName = "BChainSettings";

    BChainSettings();
};
