// "Surround Analyzer" through the host interface: the image of signals
// whose place is known, the channels' shares, the front pairs' correlation,
// and that it measures without touching the audio.
#include <gtest/gtest.h>

#include <cmath>

#include "Support/AnalyserChecks.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"

using zentest::PluginHarness;

namespace {

// Half a second of noise on the channels in `fed` of a layout of `channels`.
PluginHarness Analyse(std::uint32_t channels, std::vector<std::uint32_t> fed, float lfeChoice = 0.0f) {
    PluginHarness plugin = zentest::Prepared("Surround Analyzer", {{"LFE Channel", lfeChoice}}, channels);
    const std::vector<float> noise = zentest::Noise(24000, 0.3, 11);
    zentest::Channels x(channels, std::vector<float>(noise.size(), 0.0f));
    for (std::uint32_t c : fed) x[c] = noise;
    plugin.Process(x, 512);
    return plugin;
}

}  // namespace

TEST(ZenPlumeFish, TheImageSitsWhereTheSoundIs) {
    PluginHarness left = Analyse(6, {0});
    EXPECT_NEAR(left.Meter("Direction"), -30.0, 0.01);
    EXPECT_NEAR(left.Meter("Spread"), 0.0, 0.01);
    EXPECT_NEAR(left.Meter("Share 1"), 100.0, 1e-3);

    PluginHarness pair = Analyse(6, {0, 1});
    EXPECT_NEAR(pair.Meter("Direction"), 0.0, 0.01);
    EXPECT_NEAR(pair.Meter("Spread"), 60.0, 0.05);  // an equal pair at +-30
    EXPECT_NEAR(pair.Meter("Correlation L/R"), 1.0, 1e-4);
    EXPECT_EQ(pair.Meter("Correlation L/C"), 0.0f);  // the centre is silent

    EXPECT_NEAR(Analyse(8, {7}).Meter("Direction"), 90.0, 0.01);   // 7.1's right side
    EXPECT_NEAR(Analyse(6, {5}).Meter("Direction"), 110.0, 0.01);  // 5.1's right surround
    // The LFE takes no part in the image.
    EXPECT_NEAR(Analyse(6, {0, 3}).Meter("Direction"), -30.0, 0.01);
    // No known layout: no image.
    PluginHarness many = Analyse(12, {0});
    EXPECT_EQ(many.Meter("Direction"), 0.0f);
    EXPECT_EQ(many.Meter("Spread"), 0.0f);
}

TEST(ZenPlumeFish, SharesFollowTheLoudnessWeights) {
    // Left and left surround alike: the surround weighs 1.41.
    PluginHarness plugin = Analyse(6, {0, 4});
    EXPECT_NEAR(plugin.Meter("Share 1"), 100.0 / 2.41, 0.01);
    EXPECT_NEAR(plugin.Meter("Share 5"), 141.0 / 2.41, 0.01);
    EXPECT_NEAR(plugin.Meter("Loudness 5"), plugin.Meter("Loudness 1"), 1e-3);  // each alone, unweighted
    EXPECT_NEAR(plugin.Meter("Loudness"), plugin.Meter("Loudness 1") + 10.0 * std::log10(2.41), 0.01);

    // The LFE has no share unless "None" counts it.
    EXPECT_EQ(Analyse(6, {0, 3}).Meter("Share 4"), 0.0f);
    EXPECT_NEAR(Analyse(6, {0, 3}, 1.0f).Meter("Share 4"), 50.0, 0.01);
}

TEST(ZenPlumeFish, CorrelatesTheFrontPairsOfTheLayout) {
    PluginHarness plugin = zentest::Prepared("Surround Analyzer", {}, 6);
    const std::vector<float> noise = zentest::Noise(24000, 0.3, 12);
    std::vector<float> inverted = noise;
    for (float& v : inverted) v = -v;
    zentest::Channels x(6, std::vector<float>(noise.size(), 0.0f));
    x[0] = noise;
    x[1] = zentest::Noise(24000, 0.3, 13);
    x[2] = inverted;
    plugin.Process(x, 512);
    EXPECT_NEAR(plugin.Meter("Correlation L/R"), 0.0, 0.05);
    EXPECT_NEAR(plugin.Meter("Correlation L/C"), -1.0, 1e-4);
    EXPECT_NEAR(plugin.Meter("Correlation C/R"), 0.0, 0.05);
    // Four channels are L R Ls Rs: no centre.
    EXPECT_EQ(Analyse(4, {0, 1, 2}).Meter("Correlation L/C"), 0.0f);
}

TEST(ZenPlumeFish, PassesAudioUntouchedAndReadsTheSameForAnyBlockSplit) {
    for (std::uint32_t channels : {2u, 6u, 8u})
        zentest::ExpectTransparentAndSplitInvariant("Surround Analyzer", channels, {}, 6000);
}
