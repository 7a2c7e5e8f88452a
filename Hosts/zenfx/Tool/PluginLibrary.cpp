#include "PluginLibrary.h"

#include <dlfcn.h>
#include <limits.h>
#include <unistd.h>

#include <cstdlib>

#include "NameSuggestions.h"
#include "ZenfxError.h"

namespace zenfx {

namespace {

constexpr const char* kLibraryName = "libZenAudioPlugins.so";

std::string ExecutableFolder() {
    char buffer[PATH_MAX];
    const ssize_t length = readlink("/proc/self/exe", buffer, sizeof(buffer) - 1);
    if (length <= 0) return {};
    std::string path(buffer, static_cast<std::size_t>(length));
    return path.substr(0, path.find_last_of('/'));
}

std::vector<std::string> CandidatePaths(const std::string& explicitPath) {
    if (!explicitPath.empty()) return {explicitPath};
    if (const char* env = std::getenv("ZENFX_LIBRARY"); env != nullptr && *env != '\0') return {env};
    const std::string folder = ExecutableFolder();
    std::vector<std::string> paths;
    if (!folder.empty()) {
        paths.push_back(folder + "/../lib/" + kLibraryName);
        paths.push_back(folder + "/" + kLibraryName);
    }
    paths.push_back(kLibraryName);
    return paths;
}

}  // namespace

PluginLibrary::PluginLibrary(const std::string& path) {
    std::string lastError;
    for (const std::string& candidate : CandidatePaths(path)) {
        const bool isPath = candidate.find('/') != std::string::npos;
        if (isPath && access(candidate.c_str(), R_OK) != 0 && candidate != path) continue;
        m_handle = dlopen(candidate.c_str(), RTLD_NOW | RTLD_LOCAL);
        if (m_handle != nullptr) {
            m_path = candidate;
            break;
        }
        lastError = dlerror();
    }
    if (m_handle == nullptr)
        throw ZenfxError("cannot load the plug-in library " + std::string(kLibraryName) +
                         (lastError.empty() ? "" : ": " + lastError));
    auto entry = reinterpret_cast<GetZenPluginInterfaceFunction>(dlsym(m_handle, "GetZenPluginInterface"));
    if (entry == nullptr) throw ZenfxError(m_path + " does not export GetZenPluginInterface");
    m_interface = entry();
    if (m_interface == nullptr) throw ZenfxError(m_path + " returned no plug-in interface");
}

PluginLibrary::~PluginLibrary() {
    // The library stays loaded: its static objects may outlive instances the
    // process still holds at exit.
}

std::vector<PluginEntry> PluginLibrary::List() const {
    std::vector<PluginEntry> plugins;
    for (int kind : {zen::kAudioPluginKind, zen::kControlPluginKind})
        for (const auto& [key, entry] : m_interface->GetPluginList(kind)) plugins.push_back({kind, key, entry});
    return plugins;
}

PluginEntry PluginLibrary::FindAudioPlugin(const std::string& nameOrKey) const {
    std::vector<std::string> names;
    for (const auto& [key, entry] : m_interface->GetPluginList(zen::kAudioPluginKind)) {
        if (EqualsIgnoreCase(nameOrKey, key) || EqualsIgnoreCase(nameOrKey, entry.name))
            return {zen::kAudioPluginKind, key, entry};
        names.push_back(entry.name);
    }
    throw ZenfxError("unknown plug-in '" + nameOrKey + "'" + DidYouMean(nameOrKey, names) +
                     " (zenfx list shows them all)");
}

PluginEntry PluginLibrary::FindPlugin(const std::string& nameOrKey) const {
    std::vector<std::string> names;
    for (const PluginEntry& plugin : List()) {
        if (EqualsIgnoreCase(nameOrKey, plugin.key) || EqualsIgnoreCase(nameOrKey, plugin.entry.name)) return plugin;
        names.push_back(plugin.entry.name);
    }
    throw ZenfxError("unknown plug-in '" + nameOrKey + "'" + DidYouMean(nameOrKey, names) +
                     " (zenfx list shows them all)");
}

std::unique_ptr<zen::PluginInstance> PluginLibrary::Create(const PluginEntry& plugin) {
    zen::PluginInstance* instance = m_interface->CreatePlugin(plugin.kind, plugin.key);
    if (instance == nullptr) throw ZenfxError("the library could not create '" + plugin.entry.name + "'");
    return std::unique_ptr<zen::PluginInstance>(instance);
}

AudioPlugin& AudioOf(zen::PluginInstance& instance) {
    AudioPlugin* audio = zen::InterfaceCast<AudioPlugin>(&instance);
    if (audio == nullptr) throw ZenfxError(std::string("'") + instance.GetName() + "' is not an audio plug-in");
    return *audio;
}

void LoadPresetByName(zen::PluginInstance& instance, const std::string& preset) {
    zen::PluginParameters* parameters = zen::InterfaceCast<AudioPlugin>(&instance);
    if (parameters == nullptr) parameters = zen::InterfaceCast<ControlPlugin>(&instance);
    const std::vector<std::string> names = parameters->GetPresetNames();
    for (const std::string& name : names)
        if (EqualsIgnoreCase(name, preset)) {
            if (!parameters->LoadPreset(name))
                throw ZenfxError(std::string("'") + instance.GetName() + "' refused its preset '" + name + "'");
            return;
        }
    throw ZenfxError(std::string("'") + instance.GetName() + "' has no preset '" + preset + "'" +
                         DidYouMean(preset, names),
                     kExitUsage);
}

}  // namespace zenfx
