// ZenAudioPlugin<Class>: the most derived class of every audio plug-in
// instance, and the registration of Class in the audio registry. A plug-in's
// source ends with an explicit instantiation, which registers the class while
// the library loads:
//
//   template class ZenAudioPlugin<ZenSoftClipper>;
//
// Class supplies `static const zen::PluginDescriptor kDescriptor`, its row of
// the plug-in table.
#pragma once

#include "AudioPluginRegistry.h"
#include "ZenAudioPluginImpl.h"

template <class Class>
class ZenAudioPlugin final : public Class {
public:
    ZenAudioPlugin() = default;
    // The most derived destructor: the plug-in's overrides still run here.
    ~ZenAudioPlugin() override { this->ShutdownPlugin(); }

    // The factory: constructs the instance and hands it the host's context,
    // services and the registry's descriptor. Null if construction fails.
    static zen::PluginInstance* Create(void* hostContext, zen::HostServices* hostServices, const zen::PluginDescriptor* descriptor) {
        try {
            auto* instance = new ZenAudioPlugin<Class>();
            instance->AttachToHost(descriptor, hostContext, hostServices);
            if (!instance->InitializePlugin()) {
                delete instance;
                return nullptr;
            }
            return static_cast<zen::PluginInstance*>(instance);
        } catch (...) {
            return nullptr;
        }
    }

    static const bool kRegistered;
};

template <class Class>
const bool ZenAudioPlugin<Class>::kRegistered =
    zen::AudioPluginRegistry::Instance().Register(Class::kDescriptor, &ZenAudioPlugin<Class>::Create);

