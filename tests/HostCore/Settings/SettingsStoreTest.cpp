// Settings files: where they live, and that the previous document survives
// a refused document.
#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>

#include "HostCore/HostError.h"
#include "HostCore/Settings/Documents/TalkbackDocument.h"
#include "HostCore/Settings/SettingsStore.h"

namespace fs = std::filesystem;
using zen::host::SettingsDocument;
using zen::host::SettingsStore;

namespace {

struct Folder {
    fs::path path;
    Folder() {
        char pattern[] = "/tmp/zen-settings-XXXXXX";
        path = mkdtemp(pattern);
    }
    ~Folder() { fs::remove_all(path); }
};

std::string ReadFile(const fs::path& path) {
    std::ifstream in(path, std::ios::binary);
    std::ostringstream text;
    text << in.rdbuf();
    return text.str();
}

// Restores an environment variable at the end of a test.
struct ScopedEnv {
    std::string name;
    std::string old;
    bool had;
    ScopedEnv(const char* n, const char* value) : name(n), had(std::getenv(n) != nullptr) {
        if (had) old = std::getenv(n);
        if (value)
            setenv(n, value, 1);
        else
            unsetenv(n);
    }
    ~ScopedEnv() {
        if (had)
            setenv(name.c_str(), old.c_str(), 1);
        else
            unsetenv(name.c_str());
    }
};

}  // namespace

TEST(SettingsStore, LivesInTheXdgConfigFolderUnlessGivenOne) {
    {
        ScopedEnv xdg("XDG_CONFIG_HOME", "/somewhere/config");
        EXPECT_EQ(SettingsStore().Folder(), "/somewhere/config/ZenAudioPlugins");
    }
    {
        ScopedEnv xdg("XDG_CONFIG_HOME", nullptr);
        ScopedEnv home("HOME", "/home/engineer");
        EXPECT_EQ(SettingsStore().Folder(), "/home/engineer/.config/ZenAudioPlugins");
    }
    EXPECT_EQ(SettingsStore("/tmp/x/").PathOf(zen::host::TalkbackDocument::Schema()), "/tmp/x/TalkbackSettings.xml");
}

TEST(SettingsStore, WritesCreateTheFolderAndARefusedDocumentLeavesTheOldOne) {
    Folder folder;
    const SettingsStore store((folder.path / "a" / "b").string());
    const auto& schema = zen::host::TalkbackDocument::Schema();
    EXPECT_EQ(store.Load(schema), SettingsDocument(schema));  // nothing stored yet: the defaults
    SettingsDocument d(schema);
    d.Set("dim", "-12");
    store.Write(schema, d.ToXml());
    EXPECT_EQ(store.Load(schema), d);
    const std::string stored = ReadFile(store.PathOf(schema));
    for (const std::string& bad : {std::string("<TalkbackSettings><Talkback dim=\"5\"/></TalkbackSettings>"),
                                   d.ToXml().substr(0, 60), std::string("<BChainSettings/>")}) {
        EXPECT_THROW(store.Write(schema, bad), zen::host::HostError);
        EXPECT_EQ(ReadFile(store.PathOf(schema)), stored);
    }
    EXPECT_EQ(std::distance(fs::directory_iterator(folder.path / "a" / "b"), fs::directory_iterator()), 1);

    std::ofstream(store.PathOf(schema)) << "<TalkbackSettings><Talkback dim=\"5\"/>";
    try {
        store.Load(schema);
        FAIL() << "a truncated document was read";
    } catch (const zen::host::HostError& e) {
        EXPECT_EQ(std::string(e.what()).rfind(store.PathOf(schema) + ":1:", 0), 0u) << e.what();
    }
    EXPECT_THROW(SettingsStore("/proc/no-such/folder").Write(schema, d.ToXml()), zen::host::HostError);
}
