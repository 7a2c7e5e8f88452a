// The library's entry: GetZenPluginInterface and the interface it returns.
//
// Typical host session (this compiles as it stands; a test sees to it):
//
//   zen::PluginInterface* lib = GetZenPluginInterface();  // any thread, once or often
//   lib->SetHostContext(ctx); lib->SetHostServices(s);    // before creating instances
//   for (auto& [key, entry] : lib->GetPluginList(zen::kAudioPluginKind)) {
//       zen::PluginInstance* inst = lib->CreatePlugin(zen::kAudioPluginKind, key);
//       AudioPlugin* audio = zen::InterfaceCast<AudioPlugin>(inst);
//       // ... see AudioPlugin.h for the calling order ...
//       delete inst;                                      // the host owns instances
//   }
//
// Failures are never exceptions: an unknown key or kind answers an empty list
// or a null instance.
#pragma once

#include <map>
#include <string>

#include "PluginTypes.h"

namespace zen {

class PluginInterface {
public:
    // 100 for this version of the interface.
    virtual int GetInterfaceVersion() const = 0;

    // Kind 0: registry key ("%1:%2", name and decimal code) -> entry of every
    // audio plug-in. Kind 2: name -> entry of every control plug-in. Any other
    // kind: empty. Ordered by key. UI thread; allocates.
    virtual std::map<std::string, PluginListEntry> GetPluginList(int kind) const = 0;

    // Creates an instance by exact key, or null for an unknown key or kind.
    // The caller owns the instance and destroys it with delete. UI thread.
    virtual PluginInstance* CreatePlugin(int kind, const std::string& key) = 0;

    // Stored and handed to every audio instance created afterwards.
    virtual void SetHostContext(void* context) = 0;
    virtual void SetHostServices(HostServices* services) = 0;

protected:
    ~PluginInterface() = default;  // the library owns the one interface object
};

// Key of an audio plug-in in the registry: "Soft Clipper:1517179747".
inline std::string MakePluginKey(const std::string& name, PluginCode code) {
    return name + ":" + std::to_string(code);
}

}  // namespace zen

// The library's one exported entry. Returns the same object on every call.
extern "C" __attribute__((visibility("default"))) zen::PluginInterface* GetZenPluginInterface();

// Type of GetZenPluginInterface, for hosts that load the library with dlopen.
using GetZenPluginInterfaceFunction = zen::PluginInterface* (*)();
