// The bundles as Debian's LV2 tools see them: sord_validate against the
// schemas Debian ships, and lv2apply processing a WAV file exactly as zenfx
// does.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <set>

#include "../zenfx/ZenfxRunner.h"
#include "Catalog.h"
#include "Library.h"
#include "LilvHost.h"

using zentest::RunProgram;

namespace {

constexpr const char* kSchemaFolder = "/usr/lib/lv2";

struct Bundle {
    const char* folder;
    const char* library;
};
const Bundle kShipped = {ZEN_LV2_BUNDLE, ZEN_LIBRARY_PATH};
const Bundle kTest = {ZEN_LV2_TEST_BUNDLE, ZEN_TEST_LIBRARY_PATH};

std::string Parent(const std::string& folder) { return folder.substr(0, folder.find_last_of('/')); }

void CollectTtl(const std::string& folder, std::vector<std::string>& files) {
    std::error_code missing;
    for (const auto& entry : std::filesystem::recursive_directory_iterator(folder, missing))
        if (entry.path().extension() == ".ttl") files.push_back(entry.path());
}

// The schemas only: bundles whose manifest declares a specification, not the
// plug-in bundles that happen to be installed beside them.
void CollectSchemas(std::vector<std::string>& files) {
    std::error_code missing;
    for (const auto& bundle : std::filesystem::directory_iterator(kSchemaFolder, missing)) {
        std::ifstream manifest(bundle.path() / "manifest.ttl");
        const std::string text{std::istreambuf_iterator<char>(manifest), std::istreambuf_iterator<char>()};
        if (text.find("lv2:Specification") != std::string::npos || text.find("owl:Ontology") != std::string::npos)
            CollectTtl(bundle.path(), files);
    }
}

// An LV2 tool with only `bundle` on its path. A sanitizer build's adapter
// needs its runtime in the (uninstrumented) tool.
zentest::ZenfxResult RunLv2Tool(const std::string& tool, const Bundle& bundle, const std::vector<std::string>& args) {
    std::vector<std::string> environment = {"LV2_PATH=" + Parent(bundle.folder)};
    if (*ZEN_SANITIZER_PRELOAD != '\0') {
        environment.push_back(std::string("LD_PRELOAD=") + ZEN_SANITIZER_PRELOAD);
        environment.push_back("ASAN_OPTIONS=detect_leaks=0");
    }
    return RunProgram(tool, args, environment);
}

std::string Format(float value) {
    char text[32];
    std::snprintf(text, sizeof(text), "%.9g", static_cast<double>(value));
    return text;
}

}  // namespace

TEST(Lv2Tools, SordValidateFindsNoErrorsAgainstDebiansSchemas) {
    for (const Bundle& bundle : {kShipped, kTest}) {
        std::vector<std::string> files;
        CollectSchemas(files);
        ASSERT_GT(files.size(), 20u) << "the LV2 schemas (lv2-dev) are missing";
        const std::size_t schemas = files.size();
        CollectTtl(bundle.folder, files);
        ASSERT_GT(files.size(), schemas + 1);
        const auto result = RunProgram("sord_validate", files);
        const std::string text = result.out + result.err;
        EXPECT_NE(text.find("Found 0 errors"), std::string::npos) << bundle.folder << "\n" << text;
    }
}

// Every plug-in of the shipped bundle, and those only the test library has
// ("Test Delay", with latency), in its widest layout (the lilv test covers
// every layout): the same file, the same settings, one frame per block as
// lv2apply runs, and the delay kept.
TEST(Lv2Tools, Lv2applyProcessesAWavFileAsZenfxDoes) {
    zentest::TempFolder folder;
    std::set<std::string> done;
    for (const Bundle& bundle : {kShipped, kTest}) {
        zentest::LilvHost host(bundle.folder);
        zenlv2::Library library({bundle.library});
        const std::vector<zenlv2::Variant> variants = zenlv2::Catalog::Build(library);
        for (std::size_t v = 0; v < variants.size(); ++v) {
            const zenlv2::Variant& variant = variants[v];
            const bool widest = v + 1 == variants.size() || variants[v + 1].key != variant.key;
            if (!widest || !done.insert(variant.key).second) continue;
            // lv2apply filters a file: a plug-in without audio input has nothing to apply to.
            if (variant.inputs == 0) continue;
            SCOPED_TRACE(variant.uri);
            constexpr std::size_t kFrames = 2000;
            std::vector<std::vector<float>> channels;
            for (std::uint32_t c = 0; c < std::max(variant.inputs, 1u); ++c) {
                std::vector<float> x(kFrames);
                for (std::size_t n = 0; n < kFrames; ++n)
                    x[n] = 0.8f * std::sin(0.013f * static_cast<float>(n * (c + 1))) * (n % 700 < 350 ? 1.6f : 0.4f);
                channels.push_back(std::move(x));
            }
            const std::string input = folder / "in.wav";
            zentest::WriteAudio(input, channels, 48000);

            std::vector<std::string> lv2 = {"-i", input, "-o", folder / "lv2.wav"};
            std::vector<std::string> zenfx = {"--library", bundle.library, "process", input, "-o",
                                              folder / "zenfx.wav", "--block", "1", "--no-latency-compensation",
                                              "--plugin", variant.key};
            const auto instance = library.Create(variant.key);
            AudioPlugin& audio = *zen::InterfaceCast<AudioPlugin>(instance.get());
            const LilvPlugin* plugin = host.Find(variant.uri);
            ASSERT_NE(plugin, nullptr);
            for (std::uint32_t p = 0; p < audio.GetParameterCount(); ++p) {
                zen::ParameterInfo info;
                audio.GetParameterInfo(p, info);
                const std::string value = Format(zentest::ParameterValueAt(info, 0.3f));
                for (const zentest::Lv2Port& port : host.Ports(plugin))
                    if (port.input && !port.audio && port.name == info.label)
                        lv2.insert(lv2.end(), {"-c", port.symbol, value});
                // zenfx reads a list by its caption first ("Voices=2" is the caption
                // "2"), so a list value goes there as the caption it stands for.
                std::string typed = value;
                if (info.kind == zen::ParameterKind::List && !info.choices.empty())
                    typed = info.choices[static_cast<std::size_t>(
                        std::lround((zentest::ParameterValueAt(info, 0.3f) - info.minimum) / info.step))];
                zenfx.insert(zenfx.end(), {"--set", info.identifier + "=" + typed});
            }
            lv2.push_back(variant.uri);
            const auto applied = RunLv2Tool("lv2apply", bundle, lv2);
            ASSERT_EQ(applied.exitCode, 0) << applied.err;
            const auto processed = RunProgram(ZENFX_PATH, zenfx);
            ASSERT_EQ(processed.exitCode, 0) << processed.err;
            EXPECT_NE(processed.out.find("not compensated"), std::string::npos) << processed.out;

            const auto fromLv2 = zentest::ReadAudio(folder / "lv2.wav");
            const auto fromZenfx = zentest::ReadAudio(folder / "zenfx.wav");
            EXPECT_EQ(fromLv2.info.channels, static_cast<int>(variant.outputs));
            ASSERT_EQ(fromLv2.samples.size(), fromZenfx.samples.size());
            EXPECT_EQ(fromLv2.samples, fromZenfx.samples);
            if (variant.name == "Test Delay") {  // the delay both keep: 30 % of 4800 samples
                EXPECT_NE(processed.out.find("latency 1440 samples"), std::string::npos) << processed.out;
                const auto left = fromLv2.Channel(0);
                const auto first = std::find_if(left.begin(), left.end(), [](float x) { return x != 0.0f; });
                EXPECT_EQ(first - left.begin(), 1440 + 1);  // the input's first sample is 0
            }
        }
    }
    EXPECT_GE(done.size(), 2u);
}
