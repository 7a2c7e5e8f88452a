// "Flanger" through the host interface: the comb of a still delay with
// positive, negative and no feedback against its analytic response, the
// sweep's law from its sidebands, the descriptor's flags, and the edges.
#include <gtest/gtest.h>

#include <cmath>
#include <complex>

#include "Plugins/ZenFlanger/ZenFlanger.h"
#include "Support/Modulation.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"

using zentest::PluginHarness;

namespace {

const char* kName = "Flanger";
constexpr double kRate = 48000.0;

// |(1 - m) + m z^-D / (1 - g L z^-D)| in dB at f, L the loop's low cut
// (bilinear Butterworth: s^2 / (s^2 + sqrt2 s + 1) at the prewarped s).
double CombDb(double f, double delaySamples, double g, double m) {
    const std::complex<double> z = std::polar(1.0, -2.0 * zentest::kPi * f * delaySamples / kRate);
    const std::complex<double> s(0.0, std::tan(zentest::kPi * f / kRate) /
                                          std::tan(zentest::kPi * ZenFlanger::kLoopLowCut / kRate));
    const std::complex<double> lowCut = s * s / (s * s + std::sqrt(2.0) * s + 1.0);
    return 20.0 * std::log10(std::abs((1.0 - m) + m * z / (1.0 - g * lowCut * z)));
}

}  // namespace

TEST(ZenFlanger, AStillDelayIsTheCombOfItsFeedback) {
    for (float feedback : {-70.0f, 0.0f, 70.0f}) {
        PluginHarness plugin = zentest::Prepared(
            kName, {{"Depth", 0.0f}, {"Manual", 1.0f}, {"Feedback", feedback}, {"Mix", 50.0f}}, 1);
        const std::vector<float> h = plugin.Run(zentest::Impulse(8192), 1, 512)[0];
        for (double f = 250.0; f < 20000.0; f += 250.0) {
            const double want = CombDb(f, 48.0, feedback / 100.0, 0.5);
            if (want < -40.0) continue;
            EXPECT_NEAR(zentest::MagnitudeDb(h, f, kRate), want, 0.05) << feedback << " % at " << f << " Hz";
        }
    }
}

TEST(ZenFlanger, TheSweepRunsFromManualUpByDepthAtTheRate) {
    // A sine sweep is a swing of Depth/2 around Manual + Depth/2: sidebands of
    // beta = 2 pi f Depth/2 at the rate.
    PluginHarness plugin = zentest::Prepared(kName, {{"Depth", 0.2f},
                                                     {"Manual", 1.0f},
                                                     {"Rate", 5.0f},
                                                     {"Shape", 0.0f},
                                                     {"Feedback", 0.0f},
                                                     {"Mix", 100.0f}},
                                             1);
    const std::vector<float> out = plugin.Run(zentest::Sine(1000.0, kRate, 24000, 0.5), 1, 512)[0];
    const double beta = 2.0 * zentest::kPi * 1000.0 * 0.1e-3;
    EXPECT_NEAR(std::abs(zentest::Tone(out, 1000.0, kRate, 4800, 19200)), 0.5 * std::cyl_bessel_j(0.0, beta), 2e-3);
    EXPECT_NEAR(std::abs(zentest::Tone(out, 1005.0, kRate, 4800, 19200)), 0.5 * std::cyl_bessel_j(1.0, beta), 2e-3);
    // The mean delay, Manual + Depth/2 = 1.1 ms, in the carrier's phase (cos(wt) was delayed by 52.8 samples).
    const std::complex<double> carrier = zentest::Tone(out, 1000.0, kRate, 4800, 19200);
    const double expected = std::arg(std::polar(1.0, -zentest::kPi / 2.0 - 2.0 * zentest::kPi * 1000.0 * 52.8 / kRate +
                                                         2.0 * zentest::kPi * 1000.0 * 4800.0 / kRate));
    EXPECT_NEAR(std::arg(carrier), expected, 1e-2);
}

TEST(ZenFlanger, CarriesFlags0x80AndStaysBoundedAtFullFeedbackEitherWay) {
    EXPECT_EQ(ZenFlanger::kDescriptor.flags, 0x80u);
    for (float feedback : {-95.0f, 95.0f}) {
        PluginHarness plugin = zentest::Prepared(kName, {{"Feedback", feedback}, {"Mix", 100.0f}}, 2);
        std::vector<float> in(24000, 0.5f);  // DC, the worst case for positive feedback
        const std::vector<float> noise = zentest::Noise(12000, 1.0, 3);
        std::copy(noise.begin(), noise.end(), in.begin());
        const zentest::Channels out = plugin.Run(in, 2, 512);
        EXPECT_LE(zentest::Peak(out[0]), 1.0f + FeedbackPath::kCeiling) << feedback;
    }
}

TEST(ZenFlanger, AnyBlockSplitBadInputNeutralAndTail) {
    const std::vector<float> noise = zentest::Noise(6000, 0.5, 7);
    auto run = [&](std::size_t block) {
        PluginHarness plugin = zentest::Prepared(kName, {{"Shape", 2.0f}, {"Feedback", -60.0f}}, 2);
        zentest::Channels io = {noise, noise};
        plugin.Process(io, block);
        plugin.Set("Manual", 3.0f);
        plugin.Process(io, block);
        return io;
    };
    const zentest::Channels whole = run(512);
    EXPECT_EQ(run(1), whole);
    EXPECT_EQ(run(100), whole);

    for (float bad : {NAN, -INFINITY}) {
        std::vector<float> in = noise;
        in[700] = bad;
        PluginHarness plugin = zentest::Prepared(kName, {{"Feedback", 95.0f}}, 1);
        const std::vector<float> out = plugin.Run(in, 1, 512)[0];
        for (std::size_t n = 701; n < out.size(); ++n) ASSERT_TRUE(std::isfinite(out[n])) << bad << " at " << n;
    }

    PluginHarness neutral(kName);
    ASSERT_TRUE(neutral.Audio().ApplyNeutralSetting());
    neutral.Prepare(2);
    EXPECT_EQ(neutral.Run(noise, 2, 512)[0], noise);
    EXPECT_EQ(neutral.Audio().GetLatency(), 0u);
    // No feedback: the longest delay.
    PluginHarness dry = zentest::Prepared(kName, {{"Feedback", 0.0f}, {"Manual", 2.0f}, {"Depth", 4.0f}}, 1);
    EXPECT_EQ(dry.Audio().GetTailLength(), 6u * 48u + 4u);
}

TEST(ZenFlanger, AShapeChangeGlidesWithoutAClick) {
    const std::size_t frames = 19200, at = 4900, window = 4800;
    const std::vector<float> sine = zentest::Sine(1000.0, 48000.0, frames, 0.5);
    for (float shape : {0.0f, 2.0f}) {
        PluginHarness plugin = zentest::Prepared(kName, {}, 2);
        zentest::Channels out = {sine, sine};
        plugin.ProcessSwitched(out, at, {{"Shape", shape}});
        for (int c = 0; c < 2; ++c) EXPECT_LT(zentest::SwitchCurvature(out[c], at, window), 1.1) << shape << " " << c;
    }
}
