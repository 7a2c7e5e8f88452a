#include "Library.h"

#include <dlfcn.h>
#include <unistd.h>

namespace zenlv2 {

Library::Library(const std::vector<std::string>& candidates) {
    for (const std::string& candidate : candidates) {
        const bool isPath = candidate.find('/') != std::string::npos;
        if (isPath && access(candidate.c_str(), R_OK) != 0) continue;
        m_handle = dlopen(candidate.c_str(), RTLD_NOW | RTLD_LOCAL);
        if (m_handle == nullptr) {
            m_error = dlerror();
            continue;
        }
        m_path = candidate;
        break;
    }
    if (m_handle == nullptr) {
        if (m_error.empty()) m_error = "not found";
        return;
    }
    auto entry = reinterpret_cast<GetZenPluginInterfaceFunction>(dlsym(m_handle, "GetZenPluginInterface"));
    m_interface = entry != nullptr ? entry() : nullptr;
    if (m_interface == nullptr) m_error = m_path + " has no plug-in interface";
}

Library::~Library() {
    // The library stays loaded: its statics may outlive instances a host
    // still holds, and another Library may share the handle.
}

std::unique_ptr<zen::PluginInstance> Library::Create(const std::string& key) {
    if (m_interface == nullptr) return nullptr;
    std::unique_ptr<zen::PluginInstance> instance(m_interface->CreatePlugin(zen::kAudioPluginKind, key));
    if (zen::InterfaceCast<AudioPlugin>(instance.get()) == nullptr) return nullptr;
    return instance;
}

}  // namespace zenlv2
