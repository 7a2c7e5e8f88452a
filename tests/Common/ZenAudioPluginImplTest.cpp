// The audio plug-in base as a host drives it, through the test-only
// "Test Delay" plug-in (latency, smoothed gain, a list parameter).
#include <gtest/gtest.h>

#include <cmath>
#include <thread>

#include "Support/PluginHarness.h"
#include "Support/Signals.h"
#include "TestPlugins/ZenTestDelay.h"

using zentest::PluginHarness;

TEST(ZenAudioPluginImpl, RefusesLayoutsRatesAndBlocksItCannotTake) {
    PluginHarness plugin("Test Delay");
    AudioPlugin& audio = plugin.Audio();
    EXPECT_EQ(audio.GetInputChannelCount(), 2u);
    EXPECT_EQ(audio.GetOutputChannelCount(), 2u);
    std::vector<float> x = {1.0f, 2.0f};
    float* channels[2] = {x.data(), x.data()};
    EXPECT_FALSE(audio.Process(channels, 1));  // before Prepare: untouched
    EXPECT_EQ(x[0], 1.0f);
    EXPECT_TRUE(audio.ConfigureChannels(1, 1));
    EXPECT_FALSE(audio.ConfigureChannels(3, 3));  // beyond the descriptor's limit
    EXPECT_FALSE(audio.ConfigureChannels(2, 1));  // outputs must match inputs
    EXPECT_FALSE(audio.ConfigureChannels(0, 0));
    EXPECT_EQ(audio.GetInputChannelCount(), 1u);
    for (float rate : {0.0f, NAN, 1e6f}) EXPECT_FALSE(audio.Prepare(rate, 512)) << rate;
    EXPECT_FALSE(audio.Prepare(48000.0f, 0));
    EXPECT_TRUE(audio.Prepare(22050.0f, 1));
}

TEST(ZenAudioPluginImpl, ParameterIndicesValuesAndClamping) {
    PluginHarness plugin("Test Delay");
    AudioPlugin& audio = plugin.Audio();
    ASSERT_EQ(audio.GetParameterCount(), 3u);
    EXPECT_FALSE(audio.SetParameter(3, 1.0f));  // index equal to the table length
    EXPECT_EQ(audio.GetParameter(3), 0.0f);
    EXPECT_FALSE(audio.SetParameter(1, NAN));
    EXPECT_EQ(audio.GetParameter(1), 0.0f);
    EXPECT_TRUE(audio.SetParameter(1, 100.0f));
    EXPECT_EQ(audio.GetParameter(1), 12.0f);
    EXPECT_TRUE(audio.SetParameter(2, 0.7f));  // list values land on an entry
    EXPECT_EQ(audio.GetParameter(2), 1.0f);

    zen::ParameterInfo info;
    EXPECT_FALSE(audio.GetParameterInfo(3, info));
    ASSERT_TRUE(audio.GetParameterInfo(2, info));
    EXPECT_EQ(info.identifier, "ZenTestDelay::MODE");
    EXPECT_EQ(info.kind, zen::ParameterKind::List);
    EXPECT_EQ(info.choices, (std::vector<std::string>{"Plain", "Inverted"}));
}

TEST(ZenAudioPluginImpl, PositionsThroughTheControlValueHost) {
    PluginHarness plugin("Test Delay");
    auto* controls = zen::InterfaceCast<ZenControlValueHost>(&plugin.Instance());
    EXPECT_EQ(controls->FindParameter("ZenTestDelay::GAIN"), 1);
    EXPECT_EQ(controls->FindParameter("Gain"), 1);
    EXPECT_EQ(controls->FindParameter("gain"), -1);
    EXPECT_FLOAT_EQ(controls->GetParameterPosition(1), 24.0f / 36.0f);
    EXPECT_TRUE(controls->SetParameterPosition(1, 1.0f));
    EXPECT_EQ(plugin.Audio().GetParameter(1), 12.0f);
    EXPECT_FALSE(controls->SetParameterPosition(9, 0.5f));
}

TEST(ZenAudioPluginImpl, StateRestoresEveryParameterAndBypass) {
    PluginHarness source("Test Delay");
    source.Set("Delay", 17.0f);
    source.Set("Gain", -3.5f);
    source.Set("Mode", 1.0f);
    source.Audio().SetBypass(true);
    const std::string state = source.Audio().SaveState();

    PluginHarness target("Test Delay");
    ASSERT_TRUE(target.Audio().LoadState(state));
    for (std::uint32_t i = 0; i < 3; ++i) EXPECT_EQ(target.Audio().GetParameter(i), source.Audio().GetParameter(i));
    EXPECT_TRUE(target.Audio().IsBypassed());
}

TEST(ZenAudioPluginImpl, MalformedOrForeignStateChangesNothing) {
    PluginHarness plugin("Test Delay");
    plugin.Set("Gain", -3.0f);
    for (const char* bad : {"", "not json", "[]", "{\"parameters\": 3}",
                            "{\"class\": \"ZenSoftClipper\", \"parameters\": {}}",
                            "{\"parameters\": {\"ZenTestDelay::GAIN\": \"loud\"}}"}) {
        EXPECT_FALSE(plugin.Audio().LoadState(bad)) << bad;
        EXPECT_EQ(plugin.Get("Gain"), -3.0f) << bad;
    }
    // Unknown identifiers are ignored, missing ones keep their values.
    EXPECT_TRUE(plugin.Audio().LoadState("{\"parameters\": {\"ZenTestDelay::DELAY\": 5, \"Other::X\": 1}}"));
    EXPECT_EQ(plugin.Get("Delay"), 5.0f);
    EXPECT_EQ(plugin.Get("Gain"), -3.0f);
}

TEST(ZenAudioPluginImpl, ReportsLatencyAndKeepsItWhenBypassed) {
    PluginHarness plugin("Test Delay");
    plugin.Set("Delay", 100.0f);
    plugin.Prepare(1);
    EXPECT_EQ(plugin.Audio().GetLatency(), 100u);
    plugin.Audio().SetBypass(true);
    plugin.Audio().Reset();
    auto out = plugin.Run(zentest::Impulse(1000, 10), 1, 64);
    EXPECT_EQ(zentest::ArgPeak(out[0]), 110u);
    EXPECT_EQ(out[0][110], 1.0f);  // bypassed: the input itself, delayed
    EXPECT_EQ(plugin.Audio().GetLatency(), 100u);
}

TEST(ZenAudioPluginImpl, BypassSwitchesWithoutAClick) {
    PluginHarness plugin("Test Delay");
    plugin.Set("Delay", 0.0f);
    plugin.Set("Mode", 1.0f);  // inverted: the worst case for a hard switch
    plugin.Prepare(1, 48000.0f, 256);
    constexpr int kBlocks = 188;
    const std::vector<float> sine = zentest::Sine(100.0, 48000.0, kBlocks * 256, 0.5);
    zentest::Channels buffer(1, sine);
    std::vector<float*> pointers(1);
    std::size_t done = 0;
    for (int block = 0; block < kBlocks; ++block, done += 256) {
        if (block == 40) plugin.Audio().SetBypass(true);
        if (block == 120) plugin.Audio().SetBypass(false);
        pointers[0] = buffer[0].data() + done;
        plugin.Audio().Process(pointers.data(), 256);
    }
    // A hard switch between x and -x would jump by up to 1.0.
    const float sineStep = zentest::LargestStep(sine);
    EXPECT_LT(zentest::LargestStep(buffer[0]), 3.0f * sineStep + 0.01f);
    EXPECT_EQ(buffer[0][100 * 256], sine[100 * 256]);    // bypassed
    EXPECT_EQ(buffer[0][180 * 256], -sine[180 * 256]);   // processing again
}

TEST(ZenAudioPluginImpl, LongBlocksAreSplitAtThePreparedMaximum) {
    PluginHarness plugin("Test Delay");
    plugin.Set("Delay", 3.0f);
    plugin.Prepare(2, 48000.0f, 16);
    const std::vector<float> input = zentest::Noise(1000);
    auto out = plugin.Run(input, 2, 1000);  // one call, 1000 frames
    for (std::size_t n = 3; n < input.size(); ++n) ASSERT_EQ(out[1][n], input[n - 3]) << n;
}

TEST(ZenAudioPluginImpl, ChangesReachTheAudioThreadBeforeTheNextBlock) {
    PluginHarness plugin("Test Delay");
    plugin.Prepare(1, 48000.0f, 64);
    auto& impl = dynamic_cast<ZenTestDelay&>(plugin.Instance());
    plugin.Run(zentest::Noise(64), 1);
    EXPECT_EQ(impl.UpdatesSeen(), 3);  // every parameter once after Prepare
    plugin.Set("Mode", 1.0f);
    plugin.Set("Mode", 0.0f);
    plugin.Run(zentest::Noise(64), 1);
    EXPECT_EQ(impl.UpdatesSeen(), 4);  // coalesced: one update per changed parameter
    plugin.Run(zentest::Noise(64), 1);
    EXPECT_EQ(impl.UpdatesSeen(), 4);
}

TEST(ZenAudioPluginImpl, GainRampsWhileProcessingButNotBefore) {
    PluginHarness plugin("Test Delay");
    plugin.Set("Delay", 0.0f);
    plugin.Set("Gain", -6.0f);  // before processing: at once
    plugin.Prepare(1, 48000.0f, 256);
    auto out = plugin.Run(std::vector<float>(256, 1.0f), 1);
    EXPECT_NEAR(out[0][0], std::pow(10.0f, -6.0f / 20.0f), 1e-6);

    plugin.Set("Gain", 0.0f);  // while running: a ramp, no jump
    out = plugin.Run(std::vector<float>(256, 1.0f), 1);
    EXPECT_LT(out[0][0], 0.51f);
    EXPECT_GT(out[0][255], out[0][0]);
    EXPECT_LT(out[0][255], 0.99f);
}

TEST(ZenAudioPluginImpl, ParametersChangeSafelyFromAnotherThread) {
    PluginHarness plugin("Test Delay");
    plugin.Prepare(2, 48000.0f, 128);
    std::atomic<bool> stop{false};
    std::thread ui([&] {
        for (int i = 0; !stop.load(); ++i) {
            plugin.Audio().SetParameter(1, static_cast<float>(i % 24) - 12.0f);
            plugin.Audio().SetParameter(2, static_cast<float>(i % 2));
            plugin.Audio().SetBypass(i % 7 == 0);
        }
    });
    const std::vector<float> noise = zentest::Noise(128);
    bool finite = true;
    for (int block = 0; block < 2000 && finite; ++block) {
        zentest::Channels buffers(2, noise);
        plugin.Process(buffers, 128);
        for (float v : buffers[0]) finite &= std::isfinite(v) && std::fabs(v) <= 4.0f;
    }
    stop = true;
    ui.join();
    EXPECT_TRUE(finite);
}

TEST(ZenAudioPluginImpl, PresetsComeFromTheResourceTrees) {
    PluginHarness clipper("Soft Clipper");
    const auto names = clipper.Audio().GetPresetNames();
    ASSERT_FALSE(names.empty());
    EXPECT_NE(std::find(names.begin(), names.end(), "Warm Drive"), names.end());
    EXPECT_TRUE(clipper.Audio().LoadPreset("Warm Drive"));
    EXPECT_EQ(clipper.Get("Threshold"), 6.0f);
    EXPECT_FALSE(clipper.Audio().LoadPreset("No Such Preset"));
}
