// "TalkbackSettings": talkback source and level, destinations, main monitor dim and latch or momentary.
#pragma once

#include "ZenSettingsControl.h"

class TalkbackSettings : public ZenSettingsControl {
public:
    static constexpr const char* kName = "TalkbackSettings";
    static constexpr const char* kClassName = "TalkbackSettings";

    TalkbackSettings();
};
