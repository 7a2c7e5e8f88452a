// Where the console's settings documents live: one file per document,
// "<root>.xml" (BChainSettings.xml, ...), in the user's XDG config folder
// ($XDG_CONFIG_HOME/ZenAudioPlugins, else ~/.config/ZenAudioPlugins) unless
// a folder is given. Files are replaced atomically and only with documents
// that pass their schema, so the previous document is never lost.
#pragma once

#include <string>

#include "SettingsDocument.h"

namespace zen::host {

class SettingsStore {
public:
    static constexpr const char* kFolderName = "ZenAudioPlugins";

    // An empty folder means the XDG default.
    explicit SettingsStore(const std::string& folder = {});
    static std::string DefaultFolder();

    const std::string& Folder() const { return m_folder; }
    std::string PathOf(const DocumentSchema& schema) const;

    // The stored text; false when there is no file yet. Throws HostError when
    // the file exists but cannot be read.
    bool Read(const DocumentSchema& schema, std::string& text) const;
    // The stored document, or the defaults when there is none. Throws
    // HostError naming the file, line and fault of an invalid one.
    SettingsDocument Load(const DocumentSchema& schema) const;
    // Checks the text against the schema, creates the folder if needed and
    // replaces the file atomically. Throws HostError, leaving the old file.
    void Write(const DocumentSchema& schema, const std::string& xml) const;

private:
    std::string m_folder;
};

}  // namespace zen::host
