// "Soft Clipper": its curve, drive, meters and smoothing, through the host
// interface.
#include <gtest/gtest.h>

#include <cmath>

#include "Plugins/ZenSoftClipper/ZenSoftClipper.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"

using zentest::PluginHarness;

namespace {

// The plug-in at settings applied before processing (no ramps).
PluginHarness Clipper(float thresholdDb, float shape, float outputDb, std::uint32_t channels = 1) {
    PluginHarness plugin("Soft Clipper");
    plugin.Set("Threshold", thresholdDb);
    plugin.Set("Shape", shape);
    plugin.Set("Output Level", outputDb);
    plugin.Prepare(channels);
    return plugin;
}

float ProcessOne(PluginHarness& plugin, float x) { return plugin.Run({x})[0][0]; }

}  // namespace

TEST(ZenSoftClipper, DescriptorAndParameters) {
    PluginHarness plugin("Soft Clipper");
    const zen::PluginDescriptor* d = plugin.Instance().GetDescriptor();
    EXPECT_STREQ(d->name, "Soft Clipper");
    EXPECT_EQ(d->code, 1517179747);
    EXPECT_EQ(d->inputChannelLimit, 32u);
    EXPECT_EQ(d->outputChannelLimit, 32u);
    EXPECT_EQ(d->version, 1.0);
    const char* identifiers[] = {"ZenSoftClipper::THRESHOLD", "ZenSoftClipper::SHAPE", "ZenSoftClipper::OUTPUT_GAIN"};
    const float ranges[][4] = {{-18, 18, 0, 0.1f}, {0, 1, 1, 0.01f}, {-18, 6, 0, 0.1f}};
    ASSERT_EQ(plugin.Audio().GetParameterCount(), 3u);
    for (std::uint32_t i = 0; i < 3; ++i) {
        zen::ParameterInfo info;
        plugin.Audio().GetParameterInfo(i, info);
        EXPECT_EQ(info.identifier, identifiers[i]);
        EXPECT_EQ(info.minimum, ranges[i][0]);
        EXPECT_EQ(info.maximum, ranges[i][1]);
        EXPECT_EQ(info.defaultValue, ranges[i][2]);
        EXPECT_EQ(info.step, ranges[i][3]);
    }
    EXPECT_EQ(plugin.Audio().GetLatency(), 0u);
}

TEST(ZenSoftClipper, DefaultsPassQuietSamplesAndRoundLoudOnes) {
    PluginHarness plugin = Clipper(0.0f, 1.0f, 0.0f);
    EXPECT_EQ(ProcessOne(plugin, 0.5f), 0.5f);
    EXPECT_NEAR(ProcessOne(plugin, 2.0f), 0.9640276f / 0.7615942f, 1e-5);  // 1.2658
    EXPECT_NEAR(ProcessOne(plugin, 1.0f), 1.0f, 1e-6);  // the curve meets the knee
}

TEST(ZenSoftClipper, ShapeZeroIsAHardClipAtTheKnee) {
    PluginHarness plugin = Clipper(-6.0f, 0.0f, 0.0f);
    const float knee = std::pow(10.0f, -6.0f / 20.0f);
    EXPECT_NEAR(knee, 0.501187f, 1e-6);
    for (float x : {0.6f, 1.0f, 5.0f, 1e9f}) EXPECT_NEAR(ProcessOne(plugin, x), knee, 1e-6) << x;
    for (float x : {-0.6f, -3.0f}) EXPECT_NEAR(ProcessOne(plugin, x), -knee, 1e-6) << x;
    EXPECT_EQ(ProcessOne(plugin, 0.5f), 0.5f);
}

TEST(ZenSoftClipper, ThresholdAboveZeroDrivesIntoFullScaleKnee) {
    PluginHarness plugin = Clipper(6.0f, 1.0f, 0.0f);
    const float drive = std::pow(10.0f, 6.0f / 20.0f);
    EXPECT_NEAR(ProcessOne(plugin, 0.25f), 0.4988f, 1e-4);
    const float driven = 0.6f * drive;  // 1.197, above the knee at 1.0
    EXPECT_NEAR(ProcessOne(plugin, 0.6f), std::tanh(driven) / std::tanh(1.0f), 1e-5);
}

TEST(ZenSoftClipper, CurveApproachesItsCeilingAndIsOddSymmetric) {
    for (float shape : {0.0f, 0.3f, 1.0f}) {
        PluginHarness plugin = Clipper(0.0f, shape, 0.0f);
        const float ceiling = 1.0f + shape * (1.0f / std::tanh(1.0f) - 1.0f);
        EXPECT_NEAR(ProcessOne(plugin, 1000.0f), ceiling, 1e-5) << shape;
        for (float x : {0.1f, 0.9f, 1.5f, 4.0f}) EXPECT_EQ(ProcessOne(plugin, -x), -ProcessOne(plugin, x)) << x;
    }
}

TEST(ZenSoftClipper, CurveIsContinuousAndMonotonic) {
    for (float shape : {0.0f, 0.5f, 1.0f}) {
        float previous = 0.0f;
        for (float x = 0.001f; x < 4.0f; x += 0.001f) {
            const float y = ZenSoftClipper::Clip(x, 0.7f, shape);
            EXPECT_GE(y, previous - 1e-6f) << x;
            EXPECT_LT(y - previous, 0.0011f) << x;  // no jump at the knee
            previous = y;
        }
    }
}

TEST(ZenSoftClipper, OutputLevelScalesTheResult) {
    PluginHarness plugin = Clipper(0.0f, 1.0f, -6.0f);
    EXPECT_NEAR(ProcessOne(plugin, 0.5f), 0.5f * std::pow(10.0f, -6.0f / 20.0f), 1e-6);
}

TEST(ZenSoftClipper, MetersReadPeaksAndClippingInDecibels) {
    PluginHarness plugin = Clipper(6.0f, 1.0f, -6.0f, 2);
    zentest::Channels buffers = {zentest::Sine(1000.0, 48000.0, 480, 0.8), zentest::Sine(1000.0, 48000.0, 480, 0.1)};
    plugin.Process(buffers);
    EXPECT_NEAR(plugin.Meter("Input Peak 1"), 20.0f * std::log10(0.8f), 0.01f);
    EXPECT_NEAR(plugin.Meter("Input Peak 2"), 20.0f * std::log10(0.1f), 0.01f);
    EXPECT_NEAR(plugin.Meter("Output Peak 1"), zentest::ToDb(zentest::Peak(buffers[0])), 0.01f);
    EXPECT_NEAR(plugin.Meter("Output Peak 2"), zentest::ToDb(0.1 * std::pow(10.0, 0.3) * std::pow(10.0, -0.3)), 0.01f);
    // Clipping shows the largest driven magnitude that reached the knee: 0.8 driven by +6 dB.
    EXPECT_NEAR(plugin.Meter("Clipping"), 20.0f * std::log10(0.8f) + 6.0f, 0.01f);
    EXPECT_EQ(plugin.Audio().GetMeterCount(), 5u);

    zentest::Channels quiet = {zentest::Sine(1000.0, 48000.0, 480, 0.2), zentest::Sine(1000.0, 48000.0, 480, 0.2)};
    plugin.Process(quiet);  // meters hold the last block only
    EXPECT_EQ(plugin.Meter("Clipping"), -120.0f);
    EXPECT_NEAR(plugin.Meter("Input Peak 1"), 20.0f * std::log10(0.2f), 0.01f);
}

TEST(ZenSoftClipper, ThresholdChangesWhileRunningGlideWithoutAJump) {
    PluginHarness plugin = Clipper(0.0f, 0.0f, 0.0f);
    plugin.Run(std::vector<float>(512, 0.9f));
    plugin.Set("Threshold", -12.0f);
    auto out = plugin.Run(std::vector<float>(4800, 0.9f))[0];
    EXPECT_GT(out[0], 0.85f);  // starts where it was
    EXPECT_LT(zentest::LargestStep(out), 0.01f);
    auto later = plugin.Run(std::vector<float>(48000, 0.9f))[0];
    EXPECT_NEAR(later.back(), std::pow(10.0f, -12.0f / 20.0f), 1e-4);  // arrives at the new knee
}

TEST(ZenSoftClipper, BlockSplitDoesNotChangeTheOutput) {
    const std::vector<float> input = zentest::Noise(5000, 2.0);
    auto reference = [&](std::size_t block) {
        PluginHarness plugin = Clipper(3.0f, 0.6f, -2.0f, 2);
        plugin.Run(std::vector<float>(64, 0.0f), 2);  // running: later changes ramp
        plugin.Set("Threshold", -9.0f);
        return plugin.Run(input, 2, block);
    };
    const auto whole = reference(0);
    for (std::size_t block : {1u, 7u, 512u}) EXPECT_EQ(reference(block), whole) << block;
}

TEST(ZenSoftClipper, EveryChannelOfAWideLayout) {
    PluginHarness plugin = Clipper(0.0f, 0.0f, 0.0f, 32);
    auto out = plugin.Run({2.0f, -2.0f, 0.25f}, 32);
    for (const auto& channel : out) EXPECT_EQ(channel, (std::vector<float>{1.0f, -1.0f, 0.25f}));
    EXPECT_EQ(plugin.Audio().GetMeterCount(), 65u);
}

TEST(ZenSoftClipper, NonFiniteInputDoesNotPoisonLaterSamples) {
    PluginHarness plugin = Clipper(0.0f, 1.0f, 0.0f);
    auto out = plugin.Run({NAN, INFINITY, -INFINITY, 0.5f})[0];
    EXPECT_TRUE(std::isnan(out[0]));
    EXPECT_NEAR(out[1], 1.0f / std::tanh(1.0f), 1e-5);
    EXPECT_NEAR(out[2], -1.0f / std::tanh(1.0f), 1e-5);
    EXPECT_EQ(out[3], 0.5f);
}

TEST(ZenSoftClipper, SampleBySampleWithoutTailLockOrLatency) {
    PluginHarness plugin = Clipper(12.0f, 0.0f, -6.0f, 2);
    AudioPlugin& audio = plugin.Audio();
    EXPECT_EQ(audio.GetTailLength(), 0u);
    EXPECT_FALSE(audio.IsBlockBased());
    EXPECT_FALSE(audio.LocksAudioPath());
    EXPECT_EQ(audio.GetLatency(), 0u);
}

TEST(ZenSoftClipper, NeutralSettingPassesMinusSixDecibelsUnchanged) {
    PluginHarness plugin("Soft Clipper");
    plugin.Set("Threshold", 12.0f);
    plugin.Set("Shape", 0.2f);
    plugin.Set("Output Level", -10.0f);
    ASSERT_TRUE(plugin.Audio().ApplyNeutralSetting());
    EXPECT_EQ(plugin.Get("Threshold"), 0.0f);
    EXPECT_EQ(plugin.Get("Shape"), 1.0f);
    EXPECT_EQ(plugin.Get("Output Level"), 0.0f);
    plugin.Prepare(1);
    const auto input = zentest::Sine(997.0, 48000.0, 4800, 0.5);
    const auto output = plugin.Run(input);
    for (std::size_t i = 0; i < input.size(); ++i) ASSERT_EQ(output[0][i], input[i]) << "at " << i;
}
