// "Modulation" through the host interface: the phaser's static response
// against its allpass chain, tremolo's and auto-pan's gain laws, vibrato's
// sidebands, the LFO spread over channels, layouts and the edges.
#include <gtest/gtest.h>

#include <cmath>
#include <complex>

#include "Plugins/ZenModulation/ZenModulation.h"
#include "Support/Modulation.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"

using zentest::PluginHarness;

namespace {

const char* kName = "Modulation";
constexpr double kRate = 48000.0;

// 0.5 (1 + A^N / (1 - g z^-1 A^N)) in dB, A the first-order allpass at f.
double PhaserDb(double f, double breakFrequency, int stages, double g) {
    const double a = ZenModulation::AllpassCoefficient(breakFrequency, kRate);
    const std::complex<double> z1 = std::polar(1.0, -2.0 * zentest::kPi * f / kRate);
    const std::complex<double> chain = std::pow((a + z1) / (1.0 + a * z1), stages);
    return 20.0 * std::log10(std::abs(0.5 * (1.0 + chain / (1.0 - g * z1 * chain))));
}

}  // namespace

TEST(ZenModulation, AStillPhaserIsItsAllpassChainMixedWithTheDry) {
    EXPECT_NEAR(ZenModulation::AllpassCoefficient(kRate / 4.0, kRate), 0.0, 1e-12);
    for (float stages : {0.0f, 1.0f, 4.0f})
        for (float feedback : {-50.0f, 0.0f, 70.0f}) {
            PluginHarness plugin = zentest::Prepared(
                kName, {{"Depth", 0.0f}, {"Frequency", 1000.0f}, {"Stages", stages}, {"Feedback", feedback}}, 1);
            const std::vector<float> h = plugin.Run(zentest::Impulse(16384), 1, 512)[0];
            const int n = static_cast<int>(ZenModulation::kStageCounts[static_cast<int>(stages)]);
            for (double f = 100.0; f < 20000.0; f *= 1.2) {
                const double want = PhaserDb(f, 1000.0, n, feedback / 100.0);
                if (want < -40.0) continue;
                EXPECT_NEAR(zentest::MagnitudeDb(h, f, kRate), want, 0.05)
                    << n << " stages, " << feedback << " % at " << f << " Hz";
            }
        }
    // Two sections without feedback turn by 180 degrees at the break frequency: the notch.
    PluginHarness two = zentest::Prepared(kName, {{"Depth", 0.0f}, {"Stages", 0.0f}, {"Feedback", 0.0f}}, 1);
    EXPECT_LT(zentest::MagnitudeDb(two.Run(zentest::Impulse(16384), 1, 512)[0], 800.0, kRate), -60.0);
}

TEST(ZenModulation, TremoloAndAutoPanFollowTheirGainLaws) {
    const std::vector<float> dc(19200, 0.5f);
    PluginHarness tremolo =
        zentest::Prepared(kName, {{"Mode", 1.0f}, {"Depth", 80.0f}, {"Rate", 5.0f}, {"Mix", 100.0f}}, 1);
    const std::vector<float> t = tremolo.Run(dc, 1, 512)[0];
    EXPECT_NEAR(zentest::Peak(t), 0.5f, 1e-4f);
    EXPECT_NEAR(*std::min_element(t.begin(), t.end()), 0.5f * 0.2f, 1e-4f);
    // 5 Hz: a sine of 0.5 * 0.8 / 2 around its mean.
    EXPECT_NEAR(std::abs(zentest::Tone(t, 5.0, kRate, 0, 19200)), 0.2, 1e-3);

    PluginHarness pan =
        zentest::Prepared(kName, {{"Mode", 3.0f}, {"Depth", 100.0f}, {"Rate", 5.0f}, {"Mix", 100.0f}}, 3);
    zentest::Channels io = {dc, dc, dc};
    pan.Process(io, 512);
    for (std::size_t n = 0; n < dc.size(); ++n) {
        // Balance: one side whole, the other down by the position.
        ASSERT_NEAR(std::max(io[0][n], io[1][n]), 0.5f, 1e-6f) << n;
    }
    EXPECT_NEAR(*std::min_element(io[0].begin(), io[0].end()), 0.0f, 1e-4f);
    EXPECT_NEAR(*std::min_element(io[1].begin(), io[1].end()), 0.0f, 1e-4f);
    EXPECT_EQ(io[2], dc);  // no partner
}

TEST(ZenModulation, VibratoMakesTheSidebandsOfItsDepthAndSpreadSpacesTheChannels) {
    PluginHarness vibrato =
        zentest::Prepared(kName, {{"Mode", 2.0f}, {"Depth", 10.0f}, {"Rate", 5.0f}, {"Mix", 100.0f}}, 1);
    const std::vector<float> out = vibrato.Run(zentest::Sine(1000.0, kRate, 24000, 0.5), 1, 512)[0];
    const double beta = 2.0 * zentest::kPi * 1000.0 * 0.1 * ZenModulation::kVibratoMs / 1000.0;
    EXPECT_NEAR(std::abs(zentest::Tone(out, 1000.0, kRate, 4800, 19200)), 0.5 * std::cyl_bessel_j(0.0, beta), 2e-3);
    EXPECT_NEAR(std::abs(zentest::Tone(out, 1005.0, kRate, 4800, 19200)), 0.5 * std::cyl_bessel_j(1.0, beta), 2e-3);

    // Four channels, full spread: tremolos a quarter cycle apart.
    PluginHarness spread = zentest::Prepared(
        kName, {{"Mode", 1.0f}, {"Depth", 100.0f}, {"Rate", 5.0f}, {"Spread", 100.0f}, {"Mix", 100.0f}}, 4);
    const zentest::Channels t = spread.Run(std::vector<float>(9600, 1.0f), 4, 512);
    const double first = std::arg(zentest::Tone(t[0], 5.0, kRate, 0, 9600));
    for (std::size_t c = 1; c < 4; ++c) {
        const double lag =
            std::remainder(first - std::arg(zentest::Tone(t[c], 5.0, kRate, 0, 9600)), 2.0 * zentest::kPi);
        EXPECT_NEAR(std::fabs(lag), c == 2 ? zentest::kPi : zentest::kPi / 2.0, 1e-3) << c;
    }
}

TEST(ZenModulation, LayoutsSplitsAndNeutral) {
    PluginHarness layouts(kName);
    EXPECT_TRUE(layouts.Audio().ConfigureChannels(8, 8));
    EXPECT_FALSE(layouts.Audio().ConfigureChannels(9, 9));

    const std::vector<float> noise = zentest::Noise(6000, 0.5, 7);
    for (float mode : {0.0f, 1.0f, 2.0f, 3.0f}) {
        auto run = [&](std::size_t block) {
            PluginHarness plugin = zentest::Prepared(kName, {{"Mode", mode}, {"Shape", 2.0f}, {"Rate", 3.0f}}, 2);
            zentest::Channels io = {noise, noise};
            plugin.Process(io, block);
            plugin.Set("Depth", 90.0f);
            plugin.Process(io, block);
            return io;
        };
        const zentest::Channels whole = run(512);
        EXPECT_EQ(run(1), whole) << mode;
        EXPECT_EQ(run(123), whole) << mode;
    }

    PluginHarness neutral(kName);
    ASSERT_TRUE(neutral.Audio().ApplyNeutralSetting());
    neutral.Prepare(8);
    EXPECT_EQ(neutral.Run(noise, 8, 512)[7], noise);
    EXPECT_EQ(neutral.Audio().GetLatency(), 0u);
}
