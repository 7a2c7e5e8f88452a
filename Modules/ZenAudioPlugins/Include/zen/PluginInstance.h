// Lifetime and identity of every plug-in instance.
#pragma once

#include "PluginTypes.h"

namespace zen {

class PluginInstance {
public:
    static constexpr const char* kInterfaceName = "zen::PluginInstance";

    // Destroys the instance; never while another thread uses it.
    virtual ~PluginInstance() = default;

    // PluginKind of the instance.
    virtual int GetKind() const = 0;

    // Audio plug-ins: the registry's descriptor (valid while the library is
    // loaded). Control plug-ins: null.
    virtual const PluginDescriptor* GetDescriptor() const = 0;

    // Display name (audio: descriptor name; control: registry name).
    virtual const char* GetName() const = 0;

    // Cast by interface name: "zen::PluginInstance", "AudioPlugin" (audio
    // instances), "ControlPlugin" (control instances) and "ZenControlValueHost"
    // answer the matching base; other names answer null. Prefer InterfaceCast.
    virtual void* QueryInterface(const char* interfaceName) = 0;
};

// InterfaceCast<AudioPlugin>(instance): the instance's AudioPlugin, or null.
template <class Interface>
Interface* InterfaceCast(PluginInstance* instance) {
    return instance ? static_cast<Interface*>(instance->QueryInterface(Interface::kInterfaceName)) : nullptr;
}

}  // namespace zen
