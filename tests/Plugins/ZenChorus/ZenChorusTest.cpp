// "Chorus" through the host interface: a still voice is a clean delay, a
// swinging one makes the sidebands of its rate and depth, voices and spread
// do what they say, switches do not click, and the edges: split invariance, neutral.
#include <gtest/gtest.h>

#include <cmath>

#include "Plugins/ZenChorus/ZenChorus.h"
#include "Support/Modulation.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"

using zentest::PluginHarness;

namespace {

const char* kName = "Chorus";
constexpr double kRate = 48000.0;

}  // namespace

TEST(ZenChorus, AStillVoiceIsACleanDelayAndASwingingOneMakesItsSidebands) {
    const std::vector<float> sine = zentest::Sine(1000.0, kRate, 24000, 0.5);
    PluginHarness still =
        zentest::Prepared(kName, {{"Voices", 0.0f}, {"Depth", 0.0f}, {"Delay", 10.01f}, {"Mix", 100.0f}}, 1);
    const std::vector<float> clean = still.Run(sine, 1, 512)[0];
    const double thdn = zentest::ThdNDb(clean, 1000.0, kRate, 4800, 19200);
    EXPECT_LT(thdn, -80.0);
    std::printf("static voice, 1 kHz: THD+N %.1f dB\n", thdn);

    // 5 Hz, +-0.1 ms: phase modulation of beta = 2 pi 1 kHz 0.1 ms.
    for (double depthMs : {0.1, 0.3}) {
        PluginHarness swinging = zentest::Prepared(
            kName, {{"Voices", 0.0f}, {"Rate", 5.0f}, {"Depth", float(depthMs)}, {"Mix", 100.0f}}, 1);
        const std::vector<float> out = swinging.Run(zentest::Sine(1000.0, kRate, 24000, 0.5), 1, 512)[0];
        const double beta = 2.0 * zentest::kPi * 1000.0 * depthMs / 1000.0;
        const double carrier = std::abs(zentest::Tone(out, 1000.0, kRate, 4800, 19200));
        EXPECT_NEAR(carrier, 0.5 * std::cyl_bessel_j(0.0, beta), 2e-3) << depthMs;
        for (double f : {995.0, 1005.0})
            EXPECT_NEAR(std::abs(zentest::Tone(out, f, kRate, 4800, 19200)), 0.5 * std::cyl_bessel_j(1.0, beta), 2e-3)
                << depthMs << " ms at " << f << " Hz";
        EXPECT_NEAR(std::abs(zentest::Tone(out, 1010.0, kRate, 4800, 19200)), 0.5 * std::cyl_bessel_j(2.0, beta), 2e-3);
        // Nothing between the sidebands: the rate is the set one.
        EXPECT_LT(std::abs(zentest::Tone(out, 1002.5, kRate, 4800, 19200)), 2e-3);
    }
}

TEST(ZenChorus, SpreadMovesTheSidesApartAndVoicesThinTheCarrier) {
    // A low tone: the sides' phase difference follows their delay difference.
    const std::vector<float> low = zentest::Sine(100.0, kRate, 24000, 0.5);
    auto run = [&](float voices, float spread) {
        PluginHarness plugin = zentest::Prepared(
            kName, {{"Voices", voices}, {"Spread", spread}, {"Depth", 1.0f}, {"Mix", 100.0f}, {"Rate", 2.0f}}, 2);
        return plugin.Run(low, 2, 512);
    };
    auto correlation = [](const zentest::Channels& x) {
        double lr = 0.0, ll = 0.0, rr = 0.0;
        for (std::size_t n = 4800; n < x[0].size(); ++n) {
            lr += double{x[0][n]} * x[1][n];
            ll += double{x[0][n]} * x[0][n];
            rr += double{x[1][n]} * x[1][n];
        }
        return lr / std::sqrt(ll * rr);
    };
    const zentest::Channels narrow = run(0.0f, 0.0f);
    EXPECT_EQ(narrow[0], narrow[1]);
    const double some = correlation(run(0.0f, 25.0f));
    const double wide = correlation(run(0.0f, 100.0f));
    EXPECT_LT(some, 0.99);
    EXPECT_LT(wide, some - 0.2);

    // Four voices at different phases average to less of a sine's carrier than one.
    const std::vector<float> sine = zentest::Sine(1000.0, kRate, 24000, 0.5);
    PluginHarness one = zentest::Prepared(kName, {{"Voices", 0.0f}, {"Depth", 0.2f}, {"Mix", 100.0f}}, 1);
    PluginHarness four = zentest::Prepared(kName, {{"Voices", 3.0f}, {"Depth", 0.2f}, {"Mix", 100.0f}}, 1);
    EXPECT_LT(std::abs(zentest::Tone(four.Run(sine, 1, 512)[0], 1000.0, kRate, 4800, 19200)),
              0.95 * std::abs(zentest::Tone(one.Run(sine, 1, 512)[0], 1000.0, kRate, 4800, 19200)));
}

TEST(ZenChorus, AnyBlockSplitAndNeutral) {
    const std::vector<float> noise = zentest::Noise(6000, 0.5, 7);
    auto run = [&](std::size_t block) {
        PluginHarness plugin = zentest::Prepared(kName, {{"Voices", 3.0f}, {"Shape", 2.0f}}, 2);
        zentest::Channels io = {noise, noise};
        plugin.Process(io, block);
        plugin.Set("Delay", 20.0f);
        zentest::Channels more = {noise, noise};
        plugin.Process(more, block);
        return more;
    };
    const zentest::Channels whole = run(512);
    EXPECT_EQ(run(1), whole);
    EXPECT_EQ(run(77), whole);

    PluginHarness neutral(kName);
    ASSERT_TRUE(neutral.Audio().ApplyNeutralSetting());
    neutral.Prepare(2);
    EXPECT_EQ(neutral.Run(noise, 2, 512)[1], noise);
    EXPECT_EQ(neutral.Audio().GetLatency(), 0u);
    EXPECT_EQ(neutral.Audio().GetTailLength(), 14u * 48u + 4u);
}

TEST(ZenChorus, VoicesSpreadAndShapeSwitchWithoutAClick) {
    const std::size_t frames = 19200, at = 4900, window = 4800;
    const std::vector<float> sine = zentest::Sine(1000.0, kRate, frames, 0.5);
    const std::vector<std::pair<std::string, float>> changes[] = {
        {{"Voices", 3.0f}}, {{"Spread", 100.0f}}, {{"Shape", 1.0f}}, {{"Voices", 0.0f}, {"Shape", 2.0f}}};
    for (const auto& change : changes) {
        PluginHarness plugin = zentest::Prepared(kName, {{"Depth", 3.0f}, {"Mix", 100.0f}, {"Rate", 5.0f}}, 2);
        zentest::Channels out = {sine, sine};
        plugin.ProcessSwitched(out, at, change);
        for (int c = 0; c < 2; ++c)
            EXPECT_LT(zentest::SwitchCurvature(out[c], at, window), 1.1) << change[0].first << " " << c;
    }
}
