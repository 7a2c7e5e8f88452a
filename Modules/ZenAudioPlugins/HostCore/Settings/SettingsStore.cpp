#include "SettingsStore.h"

#include <sys/stat.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <sstream>

#include "AtomicFile.h"
#include "HostCore/HostError.h"

namespace zen::host {

namespace {

void MakeFolders(const std::string& folder) {
    for (std::size_t slash = folder.find('/', 1);; slash = folder.find('/', slash + 1)) {
        const std::string part = folder.substr(0, slash);
        if (mkdir(part.c_str(), 0777) != 0 && errno != EEXIST)
            throw HostError("cannot create the folder '" + part + "': " + std::strerror(errno));
        if (slash == std::string::npos) break;
    }
}

}  // namespace

SettingsStore::SettingsStore(const std::string& folder) : m_folder(folder.empty() ? DefaultFolder() : folder) {
    while (m_folder.size() > 1 && m_folder.back() == '/') m_folder.pop_back();
}

std::string SettingsStore::DefaultFolder() {
    if (const char* xdg = std::getenv("XDG_CONFIG_HOME"); xdg != nullptr && xdg[0] == '/')
        return std::string(xdg) + "/" + kFolderName;
    const char* home = std::getenv("HOME");
    return std::string(home != nullptr && home[0] != '\0' ? home : ".") + "/.config/" + kFolderName;
}

std::string SettingsStore::PathOf(const DocumentSchema& schema) const { return m_folder + "/" + schema.root + ".xml"; }

bool SettingsStore::Read(const DocumentSchema& schema, std::string& text) const {
    const std::string path = PathOf(schema);
    struct stat status {};
    if (stat(path.c_str(), &status) != 0) {
        if (errno == ENOENT) return false;
        throw HostError("cannot read '" + path + "': " + std::strerror(errno));
    }
    std::ifstream in(path, std::ios::binary);
    if (!in) throw HostError("cannot read '" + path + "': " + std::strerror(errno));
    std::ostringstream contents;
    contents << in.rdbuf();
    if (in.bad()) throw HostError("cannot read '" + path + "'");
    text = contents.str();
    return true;
}

SettingsDocument SettingsStore::Load(const DocumentSchema& schema) const {
    std::string text;
    if (!Read(schema, text)) return SettingsDocument(schema);
    return SettingsDocument::Parse(schema, text, PathOf(schema));
}

void SettingsStore::Write(const DocumentSchema& schema, const std::string& xml) const {
    SettingsDocument::Parse(schema, xml, PathOf(schema) + " (new)");
    MakeFolders(m_folder);
    AtomicFile::Replace(PathOf(schema), xml);
}

}  // namespace zen::host
