// "Remote Control Settings": the bindings of control-surface messages (MIDI, OSC) to channel, slot and parameter.
#pragma once

#include "ZenSettingsControl.h"

class RemoteControlSettings : public ZenSettingsControl {
public:
    static constexpr const char* kName = "Remote Control Settings";
    static constexpr const char* kClassName = "RemoteControlSettings";

    RemoteControlSettings();
};
