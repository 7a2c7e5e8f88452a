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
    return zentest::Prepared("Soft Clipper", {{"Threshold", thresholdDb}, {"Shape", shape}, {"Output Level", outputDb}},
                             channels);
}

float ProcessOne(PluginHarness& plugin, float x) { return plugin.Run({x})[0][0]; }

}  // namespace

TEST(ZenSoftClipper, CurveThroughTheKneeAtEachSetting) {
    const float tanh1 = std::tanh(1.0f);
    const struct {
        float thresholdDb, shape, outputDb, x, y, tolerance;
    } points[] = {
        {0, 1, 0, 0.5f, 0.5f, 0},                                   // below the knee: untouched
        {0, 1, 0, 1.0f, 1.0f, 1e-6f},                               // the curve meets the knee
        {0, 1, 0, 2.0f, std::tanh(2.0f) / tanh1, 1e-5f},            // tanh above it, scaled to meet it
        {-6, 0, 0, 0.6f, 0.5011872f, 1e-6f},                        // shape 0: a hard clip at the knee
        {-6, 0, 0, 1e9f, 0.5011872f, 1e-6f},
        {-6, 0, 0, 0.5f, 0.5f, 0},
        {6, 1, 0, 0.25f, 0.4988156f, 1e-6f},                        // above 0 dB: driven into a full-scale knee
        {6, 1, 0, 0.6f, std::tanh(0.6f * 1.9952623f) / tanh1, 1e-5f},
        {0, 1, -6, 0.5f, 0.2505936f, 1e-6f},                        // output level scales the result
    };
    for (const auto& p : points) {
        PluginHarness plugin = Clipper(p.thresholdDb, p.shape, p.outputDb);
        EXPECT_NEAR(ProcessOne(plugin, p.x), p.y, p.tolerance) << p.thresholdDb << " dB, " << p.shape << ", " << p.x;
        EXPECT_EQ(ProcessOne(plugin, -p.x), -ProcessOne(plugin, p.x)) << p.x;
    }
    // Every shape approaches its own ceiling.
    for (float shape : {0.0f, 0.3f, 1.0f}) {
        PluginHarness plugin = Clipper(0.0f, shape, 0.0f);
        EXPECT_NEAR(ProcessOne(plugin, 1000.0f), 1.0f + shape * (1.0f / tanh1 - 1.0f), 1e-5) << shape;
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

// NaN and infinities come out as silence, huge values at the curve's ceiling.
TEST(ZenSoftClipper, NonFiniteAndHugeInputGiveFiniteOutput) {
    PluginHarness plugin = Clipper(0.0f, 1.0f, 0.0f);
    auto out = plugin.Run({NAN, INFINITY, -INFINITY, 1e19f, -3e38f, 0.5f})[0];
    EXPECT_EQ(out[0], 0.0f);
    EXPECT_EQ(out[1], 0.0f);
    EXPECT_EQ(out[2], 0.0f);
    EXPECT_NEAR(out[3], 1.0f / std::tanh(1.0f), 1e-5);
    EXPECT_NEAR(out[4], -1.0f / std::tanh(1.0f), 1e-5);
    EXPECT_EQ(out[5], 0.5f);
}

TEST(ZenSoftClipper, NeutralSettingPassesMinusSixDecibelsUnchanged) {
    PluginHarness plugin("Soft Clipper");
    plugin.Set("Threshold", 12.0f);
    plugin.Set("Shape", 0.2f);
    plugin.Set("Output Level", -10.0f);
    ASSERT_TRUE(plugin.Audio().ApplyNeutralSetting());
    plugin.Prepare(1);
    const auto input = zentest::Sine(997.0, 48000.0, 4800, 0.5);
    const auto output = plugin.Run(input);
    for (std::size_t i = 0; i < input.size(); ++i) ASSERT_EQ(output[0][i], input[i]) << "at " << i;
}
