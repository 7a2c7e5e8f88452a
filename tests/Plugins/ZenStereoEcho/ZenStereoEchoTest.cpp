// "Echo" through the host interface: the time on the sample, repeats that
// darken, the tape curve, flutter's sidebands, runaway feedback that stays
// bounded, and the edges.
#include <gtest/gtest.h>

#include <cmath>

#include "Plugins/ZenStereoEcho/ZenStereoEcho.h"
#include "Support/Modulation.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"

using zentest::PluginHarness;

namespace {

const char* kName = "Echo";
constexpr double kRate = 48000.0;

// A steady tape, a clean curve, repeats only.
const std::vector<std::pair<std::string, float>> kClean = {
    {"Wow", 0.0f}, {"Flutter", 0.0f}, {"Drive", 0.0f}, {"Mix", 100.0f}};

std::vector<std::pair<std::string, float>> With(std::vector<std::pair<std::string, float>> settings,
                                                const std::vector<std::pair<std::string, float>>& more) {
    settings.insert(settings.end(), more.begin(), more.end());
    return settings;
}

}  // namespace

TEST(ZenStereoEcho, TheCurveIsUnityForSmallSignalsAndSmoothUpToItsCeiling) {
    for (float k : {1.0f, 2.0f, 15.85f}) {
        EXPECT_NEAR(ZenStereoEcho::Saturate(1e-3f, k) / 1e-3f, 1.0f, 1e-4f) << k;
        EXPECT_FLOAT_EQ(ZenStereoEcho::Saturate(3.0f / k, k), 1.0f / k);
        EXPECT_FLOAT_EQ(ZenStereoEcho::Saturate(-1e30f, k), -1.0f / k);
        float last = 0.0f;
        for (float x = 0.01f; x < 4.0f / k; x += 0.01f) {
            const float y = ZenStereoEcho::Saturate(x, k);
            ASSERT_GE(y, last) << x;
            ASSERT_LE(y, x);
            last = y;
        }
    }
    EXPECT_EQ(ZenStereoEcho::Saturate(NAN, 1.0f), 0.0f);
}

TEST(ZenStereoEcho, TheEchoArrivesOnTimeAndEachRepeatIsDarker) {
    PluginHarness exact = zentest::Prepared(kName, With(kClean, {{"Time", 100.0f}, {"Feedback", 0.0f}}), 1, 44100.0f);
    const std::vector<float> h = exact.Run(zentest::Impulse(8000, 0, 0.01f), 1, 512)[0];
    EXPECT_EQ(zentest::ArgPeak(h), 4410u);
    EXPECT_NEAR(h[4410], 0.01f, 1e-6f);

    PluginHarness dark =
        zentest::Prepared(kName, With(kClean, {{"Time", 50.0f}, {"Feedback", 70.0f}, {"Tone", 3000.0f}}), 1);
    const std::vector<float> r = dark.Run(zentest::Impulse(6 * 2400, 0, 0.01f), 1, 512)[0];
    double lastTilt = 1e9;
    for (std::size_t k = 1; k <= 4; ++k) {
        const std::vector<float> window(r.begin() + long(k * 2400 - 1200), r.begin() + long(k * 2400 + 1200));
        const double tilt = zentest::MagnitudeDb(window, 6000.0, kRate) - zentest::MagnitudeDb(window, 500.0, kRate);
        EXPECT_LT(tilt, lastTilt - 8.0) << "repeat " << k;
        lastTilt = tilt;
    }
}

TEST(ZenStereoEcho, FlutterSwingsTheDelayAtItsRate) {
    PluginHarness plugin = zentest::Prepared(kName, With(kClean, {{"Flutter", 100.0f}, {"Feedback", 0.0f}}), 1);
    const std::vector<float> out = plugin.Run(zentest::Sine(1000.0, kRate, 67200, 0.05), 1, 512)[0];
    const double beta = 2.0 * zentest::kPi * 1000.0 * ZenStereoEcho::kFlutterMs / 1000.0;
    const double carrier = std::abs(zentest::Tone(out, 1000.0, kRate, 19200, 48000));
    for (double f : {1000.0 - ZenStereoEcho::kFlutterHz, 1000.0 + ZenStereoEcho::kFlutterHz})
        EXPECT_NEAR(std::abs(zentest::Tone(out, f, kRate, 19200, 48000)) / carrier,
                    std::cyl_bessel_j(1.0, beta) / std::cyl_bessel_j(0.0, beta), 0.02)
            << f;
}

TEST(ZenStereoEcho, RunawayFeedbackSustainsButStaysBoundedAndBelow100ItDies) {
    std::vector<float> in(72000, 0.0f);
    const std::vector<float> burst = zentest::Noise(12000, 1.0, 6);
    std::copy(burst.begin(), burst.end(), in.begin());
    PluginHarness runaway = zentest::Prepared(kName, {{"Feedback", 110.0f}, {"Time", 80.0f}, {"Mix", 100.0f}}, 2);
    const zentest::Channels loud = runaway.Run(in, 2, 512);
    EXPECT_LE(zentest::Peak(loud[0]), 1.0f);
    EXPECT_GT(zentest::Rms(loud[0], 60000), 0.01);
    EXPECT_EQ(runaway.Audio().GetTailLength(), 30u * 48000u);

    PluginHarness fading = zentest::Prepared(kName, {{"Feedback", 90.0f}, {"Time", 80.0f}, {"Mix", 100.0f}}, 2);
    const zentest::Channels quiet = fading.Run(in, 2, 512);
    EXPECT_LT(zentest::Rms(quiet[0], 60000), 0.5 * zentest::Rms(quiet[0], 12000, 24000));
}

TEST(ZenStereoEcho, AnyBlockSplitBadInputAndNeutral) {
    const std::vector<float> noise = zentest::Noise(6000, 0.5, 7);
    auto run = [&](std::size_t block) {
        PluginHarness plugin = zentest::Prepared(kName, {{"Time", 40.0f}, {"Wow", 100.0f}}, 2);
        zentest::Channels io = {noise, noise};
        plugin.Process(io, block);
        plugin.Set("Time", 60.0f);
        plugin.Process(io, block);
        return io;
    };
    const zentest::Channels whole = run(512);
    EXPECT_EQ(run(1), whole);
    EXPECT_EQ(run(99), whole);

    for (float bad : {NAN, INFINITY}) {
        std::vector<float> in = noise;
        in[700] = bad;
        PluginHarness plugin = zentest::Prepared(kName, {{"Feedback", 100.0f}, {"Time", 20.0f}}, 1);
        const std::vector<float> out = plugin.Run(in, 1, 512)[0];
        for (std::size_t n = 701; n < out.size(); ++n) ASSERT_TRUE(std::isfinite(out[n])) << bad << " at " << n;
    }

    PluginHarness neutral(kName);
    ASSERT_TRUE(neutral.Audio().ApplyNeutralSetting());
    neutral.Prepare(2);
    EXPECT_EQ(neutral.Run(noise, 2, 512)[0], noise);
    EXPECT_EQ(neutral.Audio().GetLatency(), 0u);
}
