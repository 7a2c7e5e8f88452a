// The built library from outside: what it exports, that a host can use it
// through the public headers alone, and that code compiled for AVX, FMA or
// SSE4.1 stays private to its object file (an inline function emitted there
// as a weak symbol could be the copy the linker keeps for every caller, and a
// baseline processor would then run instructions it does not have).
#include <dlfcn.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>
#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include "zen/Zen.h"

namespace {

// Object files of the archive compiled for an extended instruction set.
constexpr const char* kExtendedForms[] = {"_m256", "_avx2", "_fma", "_sse41"};

// The lines `nm` prints for `file`.
std::vector<std::string> Nm(const std::string& options, const std::string& file) {
    std::vector<std::string> lines;
    FILE* pipe = popen(("nm " + options + " '" + file + "' 2>/dev/null").c_str(), "r");
    if (pipe == nullptr) return lines;
    char line[8192];
    while (std::fgets(line, sizeof(line), pipe) != nullptr) {
        lines.emplace_back(line);
        if (lines.back().back() == '\n') lines.back().pop_back();
    }
    pclose(pipe);
    return lines;
}

}  // namespace

TEST(SharedLibrary, ExportsOnlyItsEntryAndTheVoiceActivityFunctions) {
    const std::vector<std::string> lines = Nm("-D --defined-only", ZEN_LIBRARY_PATH);
    ASSERT_FALSE(lines.empty()) << "nm found nothing in " << ZEN_LIBRARY_PATH;
    bool hasEntry = false;
    for (const std::string& line : lines) {
        const std::string name = line.substr(line.find_last_of(' ') + 1);  // "address type name"
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
    // The console's control plug-ins, exactly these six.
    std::vector<std::string> controls;
    for (const auto& [key, row] : library->GetPluginList(zen::kControlPluginKind)) controls.push_back(key);
    EXPECT_EQ(controls, (std::vector<std::string>{"B-Chain Control", "I/O Interface Settings", "Performance Testing",
                                                  "Remote Control Settings", "TalkbackSettings", "Test Tones Settings"}));
    // Static objects of the library may outlive this test; it stays loaded.
}

TEST(InstructionSetIsolation, VectorFormsDefineNoSharedInlineCode) {
    const std::vector<std::string> lines = Nm("-A -C --defined-only", ZEN_ALGORITHMS_ARCHIVE_PATH);
    ASSERT_FALSE(lines.empty()) << "nm found nothing in " << ZEN_ALGORITHMS_ARCHIVE_PATH;
    int extendedMembers = 0;
    for (const std::string& line : lines) {
        // "archive:member.o:address type name"
        const std::size_t first = line.find(':'), second = line.find(':', first + 1);
        if (second == std::string::npos) continue;
        const std::string member = line.substr(first + 1, second - first - 1);
        if (std::none_of(std::begin(kExtendedForms), std::end(kExtendedForms),
                         [&](const char* form) { return member.find(form) != std::string::npos; }))
            continue;
        ++extendedMembers;
        std::istringstream fields(line.substr(second + 1));
        std::string address, type, name;
        fields >> address >> type >> std::ws;
        std::getline(fields, name);
        // 'W' is weak code; weak data ('V', e.g. the personality reference) holds no instructions.
        EXPECT_NE(type, "W") << member << " defines shared code " << name;
    }
    EXPECT_GT(extendedMembers, 0) << "no vector forms found: the member names changed?";
}
