// zenfx render end to end: a trigger list played by the "Foley Sampler",
// each trigger on the sample it names; and the sampler held to the real-time
// rules while 64 voices overlap.
#include <gtest/gtest.h>

#include <fstream>

#include "PluginLibrary.h"
#include "RealtimeMonitor.h"
#include "ZenfxRunner.h"

using zentest::ReadAudio;
using zentest::RunZenfx;
using zentest::TempFolder;

namespace {

constexpr const char* kThud = "11";

std::vector<float> Render(const TempFolder& folder, const std::string& triggers, std::vector<std::string> extra = {}) {
    std::ofstream(folder / "list.txt") << triggers;
    std::vector<std::string> arguments = {"render",     "Foley Sampler", "--triggers", folder / "list.txt",
                                          "-o",         folder / "out.wav", "--set",  "Variation=0"};
    arguments.insert(arguments.end(), extra.begin(), extra.end());
    const auto result = RunZenfx(arguments);
    EXPECT_EQ(result.exitCode, 0) << result.err;
    return ReadAudio(folder / "out.wav").Channel(0);
}

}  // namespace

TEST(ZenfxRender, TriggersLandOnTheSampleTheListNames) {
    TempFolder folder;
    const std::vector<float> one = Render(folder, std::string("0 ") + kThud + "\n");
    ASSERT_GT(one.size(), 4800u);
    // 10.1 ms is 484.8 samples: rounded to 485; overlapping voices add.
    for (const char* block : {"512", "7"}) {
        const std::vector<float> two =
            Render(folder, std::string("# two thuds\n0.0101 ") + kThud + "\n\n0.05 " + kThud + "  # second\n",
                   {"--block", block});
        ASSERT_GE(two.size(), 2400 + one.size());
        for (std::size_t i = 0; i < 485; ++i) ASSERT_EQ(two[i], 0.0f) << i;
        for (std::size_t i = 485; i < 2400 + one.size(); ++i) {
            const float first = i - 485 < one.size() ? one[i - 485] : 0.0f;
            const float second = i >= 2400 && i - 2400 < one.size() ? one[i - 2400] : 0.0f;
            ASSERT_EQ(two[i], first + second) << "sample " << i << ", block " << block;
        }
    }
}

TEST(ZenfxRender, LoadsAFolderThroughTheStateAndNamesUnreadableFiles) {
    TempFolder folder;
    zentest::WriteAudio(folder / "clip.wav", {{0.25f, -0.5f, 0.75f}}, 48000);
    std::ofstream(folder / "broken.wav") << "not audio";
    std::ofstream(folder / "list.txt") << "0.001 12\n";
    const auto result = RunZenfx({"render", "Foley Sampler", "--triggers", folder / "list.txt", "-o",
                                  folder / "out.wav", "--state-set", "folder=" + folder / "", "--set", "Variation=0"});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    EXPECT_NE(result.err.find("skipped broken.wav: "), std::string::npos) << result.err;
    const std::vector<float> out = ReadAudio(folder / "out.wav").Channel(1);
    ASSERT_GE(out.size(), 52u);
    EXPECT_EQ(out[47], 0.0f);
    EXPECT_EQ(out[48], 0.25f);
    EXPECT_EQ(out[49], -0.5f);
    EXPECT_EQ(out[50], 0.75f);
    EXPECT_EQ(out[51], 0.0f);
}

TEST(ZenfxRender, RefusesBadListsAndPluginsWithInputs) {
    TempFolder folder;
    const struct {
        std::string list, plugin, message;
    } cases[] = {
        {"0 1\nsoon 2\n", "Foley Sampler", ":2: the time 'soon' is not seconds"},
        {"0.5 0\n", "Foley Sampler", ":1: the pad '0' is not a whole number"},
        {"0.5\n", "Foley Sampler", ":1: expected TIME PAD"},
        {"0 1\n", "Soft Clipper", "render is for plug-ins without input"},
    };
    for (const auto& c : cases) {
        std::ofstream(folder / "list.txt") << c.list;
        const auto result = RunZenfx({"render", c.plugin, "--triggers", folder / "list.txt", "-o", folder / "x.wav"});
        EXPECT_NE(result.exitCode, 0) << c.list;
        EXPECT_NE(result.err.find(c.message), std::string::npos) << result.err;
    }
}

TEST(FoleySamplerRealtime, SixtyFourOverlappingTriggersNeverAllocate) {
    ASSERT_TRUE(zenfx::RealtimeWatch::SeesAllocations());
    zenfx::PluginLibrary library(ZEN_LIBRARY_PATH);
    auto instance = library.Create(library.FindAudioPlugin("Foley Sampler"));
    AudioPlugin& audio = zenfx::AudioOf(*instance);
    ASSERT_TRUE(audio.ConfigureChannels(0, 2));
    const auto find = [&](const char* label) {
        for (std::uint32_t i = 0; i < audio.GetParameterCount(); ++i) {
            zen::ParameterInfo info;
            if (audio.GetParameterInfo(i, info) && info.label == std::string(label)) return i;
        }
        throw std::runtime_error(label);
    };
    audio.SetParameter(find("Voices"), 64.0f);
    ASSERT_TRUE(audio.Prepare(48000.0f, 64));
    std::vector<float> left(64), right(64);
    float* channels[] = {left.data(), right.data()};
    zenfx::RealtimeCounts counts;
    for (int t = 0; t < 80; ++t) {
        audio.SetParameter(find("Pad"), static_cast<float>(1 + t % 11));
        audio.SetParameter(find("Trigger"), 1.0f);
        zenfx::RealtimeWatch rising;
        audio.Process(channels, 64);
        counts += rising.Stop();
        audio.SetParameter(find("Trigger"), 0.0f);
        zenfx::RealtimeWatch falling;
        audio.Process(channels, 64);
        counts += falling.Stop();
    }
    EXPECT_EQ(counts.allocations, 0u);
    EXPECT_EQ(counts.frees, 0u);
    EXPECT_EQ(counts.locks, 0u);
    std::uint32_t voices = 0;
    for (std::uint32_t m = 0; m < audio.GetMeterCount(); ++m) {
        zen::MeterInfo info;
        if (audio.GetMeterInfo(m, info) && info.name == std::string("Active Voices")) voices = m;
    }
    EXPECT_GE(audio.GetMeter(voices), 64.0f);
}
