// The plug-in library as the LV2 side sees it: loaded with dlopen and used
// through its public headers only. Never throws; failures leave an error text.
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "zen/Zen.h"

namespace zenlv2 {

class Library {
public:
    // Loads the first of `candidates` (paths, or bare file names for the
    // system search path) that dlopen accepts.
    explicit Library(const std::vector<std::string>& candidates);
    ~Library();
    Library(const Library&) = delete;
    Library& operator=(const Library&) = delete;

    bool IsLoaded() const { return m_interface != nullptr; }
    const std::string& Error() const { return m_error; }
    const std::string& Path() const { return m_path; }

    zen::PluginInterface& Interface() { return *m_interface; }

    // A new audio instance with its audio interface, or null.
    std::unique_ptr<zen::PluginInstance> Create(const std::string& key);

private:
    void* m_handle = nullptr;
    zen::PluginInterface* m_interface = nullptr;
    std::string m_path;
    std::string m_error;
};

}  // namespace zenlv2
