// The plug-in library, loaded with dlopen and used through its public
// headers only.
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "zen/Zen.h"

namespace zenfx {

struct PluginEntry {
    int kind = zen::kAudioPluginKind;
    std::string key;
    zen::PluginListEntry entry;
};

class PluginLibrary {
public:
    // Loads the library from `path`, or when empty from $ZENFX_LIBRARY, then
    // next to the executable (../lib and the same folder), then the system
    // search path. Throws ZenfxError when it cannot be loaded.
    explicit PluginLibrary(const std::string& path = {});
    ~PluginLibrary();
    PluginLibrary(const PluginLibrary&) = delete;
    PluginLibrary& operator=(const PluginLibrary&) = delete;

    zen::PluginInterface& Interface() { return *m_interface; }
    const std::string& Path() const { return m_path; }

    // Every plug-in of both kinds, audio first, each ordered by key.
    std::vector<PluginEntry> List() const;

    // An audio plug-in by display name or key, case-insensitive. Throws
    // ZenfxError naming the closest plug-ins when none matches.
    PluginEntry FindAudioPlugin(const std::string& nameOrKey) const;
    // An audio or control plug-in the same way (audio first).
    PluginEntry FindPlugin(const std::string& nameOrKey) const;

    // A new instance; never null (throws ZenfxError).
    std::unique_ptr<zen::PluginInstance> Create(const PluginEntry& plugin);

private:
    void* m_handle = nullptr;
    zen::PluginInterface* m_interface = nullptr;
    std::string m_path;
};

// The instance's audio interface; throws if it has none.
AudioPlugin& AudioOf(zen::PluginInstance& instance);

// A factory preset of an audio or control plug-in by name, any case; throws
// ZenfxError naming the closest presets.
void LoadPresetByName(zen::PluginInstance& instance, const std::string& preset);

}  // namespace zenfx
