// "Reverb" from zenfx as a user runs it: its parameters with units and
// ranges, a wet run at 96 kHz, and a room too small to be taken.
#include <gtest/gtest.h>

#include <cmath>
#include <nlohmann/json.hpp>

#include "ZenfxRunner.h"

using zentest::ReadAudio;
using zentest::RunZenfx;
using zentest::TempFolder;
using zentest::WriteAudio;

TEST(ZenfxReverb, InfoShowsEveryParameterWithItsUnitAndRange) {
    auto text = RunZenfx({"info", "Reverb"});
    ASSERT_EQ(text.exitCode, 0) << text.err;
    for (const char* line : {"Reverb:1517179490", "ZnRb", "T@-60dB", "0.1 to 20 s", "0 to 200 ms", "1 to 100 m",
                             "20 to 2000 Hz", "-18 to 18 dB", "0 to 100 %", "Late Rev. Gain"})
        EXPECT_NE(text.out.find(line), std::string::npos) << line;

    auto json = RunZenfx({"info", "Reverb", "--json"});
    ASSERT_EQ(json.exitCode, 0);
    const auto info = nlohmann::json::parse(json.out);
    ASSERT_EQ(info["parameters"].size(), 22u);
    EXPECT_EQ(info["parameters"][6]["label"], "T@-60dB");
    EXPECT_EQ(info["parameters"][6]["unit"], "s");
    EXPECT_EQ(info["parameters"][5]["unit"], "ms");
    EXPECT_EQ(info["latency"], 0);
}

TEST(ZenfxReverb, ProcessesAStereoFileAt96kWithATail) {
    TempFolder folder;
    std::vector<float> click(96000, 0.0f);
    click[100] = 0.9f;
    WriteAudio(folder / "in.wav", {click, click}, 96000);
    auto result = RunZenfx({"process", folder / "in.wav", "-o", folder / "out.wav", "--plugin", "Reverb", "--set",
                            "T@-60dB=2s", "--set", "Pre-Delay=20ms", "--set", "Dry/Wet=100%"});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    const auto out = ReadAudio(folder / "out.wav");
    EXPECT_EQ(out.info.samplerate, 96000);
    EXPECT_EQ(out.info.channels, 2);
    EXPECT_EQ(out.info.frames, 96000);
    const auto left = out.Channel(0);
    float before = 0.0f, late = 0.0f;
    for (std::size_t i = 0; i < 100 + 96000 / 50; ++i) before = std::max(before, std::fabs(left[i]));
    for (std::size_t i = 48000; i < 96000; ++i) late = std::max(late, std::fabs(left[i]));
    EXPECT_LT(before, 1e-4f);  // nothing before the pre-delay
    EXPECT_GT(late, 1e-4f);    // still ringing half a second later
}

TEST(ZenfxReverb, ARoomTooSmallIsRefusedWithItsRange) {
    TempFolder folder;
    auto result = RunZenfx({"process", "-o", folder / "out.wav", "--plugin", "Reverb", "--set", "Room Height=0.05"});
    EXPECT_NE(result.exitCode, 0);
    EXPECT_NE(result.err.find("1 to 30 m"), std::string::npos) << result.err;
    EXPECT_TRUE(folder.Files().empty());
}
