// ZenControlPlugin<Settings>: the most derived class of a control plug-in
// instance and its registration in the control registry by name. Settings
// derives from ZenControlPluginImpl and supplies `static const char* const
// kName` (registry name) and `kClassName`; its source ends with
//
//   template class ZenControlPlugin<BChainSettings>;
#pragma once

#include "ControlPluginRegistry.h"
#include "ZenControlPluginImpl.h"

template <class Settings>
class ZenControlPlugin final : public Settings {
public:
    ZenControlPlugin() = default;

    static zen::PluginInstance* Create(zen::HostServices* hostServices) {
        try {
            auto* instance = new ZenControlPlugin<Settings>();
            instance->AttachToHost(Settings::kName, Settings::kClassName, hostServices);
            return static_cast<zen::PluginInstance*>(instance);
        } catch (...) {
            return nullptr;
        }
    }

    static const bool kRegistered;
};

template <class Settings>
const bool ZenControlPlugin<Settings>::kRegistered =
    zen::ControlPluginRegistry::Instance().Register(Settings::kName, &ZenControlPlugin<Settings>::Create);

