// The shared library from outside: what it exports and that a host can use
// it through the public headers alone.
#include <dlfcn.h>
#include <gtest/gtest.h>

#include <cstdio>
#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include "zen/Zen.h"

namespace {

std::vector<std::string> DefinedDynamicSymbols(const std::string& library) {
    std::vector<std::string> symbols;
    const std::string command = "nm -D --defined-only '" + library + "'";
    FILE* pipe = popen(command.c_str(), "r");
    if (pipe == nullptr) return symbols;
    char line[4096];
    while (std::fgets(line, sizeof(line), pipe) != nullptr) {
        std::istringstream fields(line);
        std::string address, type, name;
        if (fields >> address >> type >> name) symbols.push_back(name);
    }
    pclose(pipe);
    return symbols;
}

}  // namespace

TEST(SharedLibrary, ExportsOnlyItsEntryAndTheVoiceActivityFunctions) {
    const std::vector<std::string> symbols = DefinedDynamicSymbols(ZEN_LIBRARY_PATH);
    ASSERT_FALSE(symbols.empty()) << "nm found nothing in " << ZEN_LIBRARY_PATH;
    bool hasEntry = false;
    for (const std::string& name : symbols) {
        hasEntry |= name == "GetZenPluginInterface";
        EXPECT_TRUE(name == "GetZenPluginInterface" || name.rfind("fvad_", 0) == 0) << "unexpected export " << name;
    }
    EXPECT_TRUE(hasEntry);
}

TEST(SharedLibrary, HostsCreateAndRunPluginsThroughTheEntry) {
    void* handle = dlopen(ZEN_LIBRARY_PATH, RTLD_NOW | RTLD_LOCAL);
    ASSERT_NE(handle, nullptr) << dlerror();
    auto entry = reinterpret_cast<GetZenPluginInterfaceFunction>(dlsym(handle, "GetZenPluginInterface"));
    ASSERT_NE(entry, nullptr);
    zen::PluginInterface* library = entry();
    ASSERT_NE(library, nullptr);
    EXPECT_EQ(library->GetInterfaceVersion(), 100);
    const auto list = library->GetPluginList(zen::kAudioPluginKind);
    ASSERT_EQ(list.count("Soft Clipper:1517179747"), 1u);
    for (const auto& [key, row] : list) {
        std::unique_ptr<zen::PluginInstance> instance(library->CreatePlugin(zen::kAudioPluginKind, key));
        ASSERT_NE(instance, nullptr) << key;
        AudioPlugin* audio = zen::InterfaceCast<AudioPlugin>(instance.get());
        ASSERT_NE(audio, nullptr) << key;
        ASSERT_TRUE(audio->Prepare(44100.0f, 64)) << key;
        std::vector<float> left(64, 0.25f), right(64, -0.25f);
        float* channels[2] = {left.data(), right.data()};
        EXPECT_TRUE(audio->Process(channels, 64)) << key;
    }
    // Static objects of the library may outlive this test; it stays loaded.
}
