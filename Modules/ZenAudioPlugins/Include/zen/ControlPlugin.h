// The interface of a control plug-in instance: a panel of settings of the
// host's console, with parameters and state but no audio.
#pragma once

#include "PluginParameters.h"

class ControlPlugin : public zen::PluginParameters {
public:
    static constexpr const char* kInterfaceName = "ControlPlugin";

protected:
    ~ControlPlugin() = default;  // destroyed through zen::PluginInstance
};
