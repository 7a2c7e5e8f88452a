// "De-Esser" through the host interface: what it does to speech, "Ess Only",
// its meters, layouts and latency.
#include <gtest/gtest.h>

#include <cmath>

#include "Support/PluginHarness.h"
#include "Support/Signals.h"
#include "Support/Speech.h"

using zentest::PluginHarness;

namespace {

double EnergyChangeDb(const std::vector<float>& out, const std::vector<float>& in, double rate, double low, double high,
                      const std::vector<zentest::Region>& regions) {
    return 10.0 * std::log10(zentest::BandEnergy(out, rate, low, high, regions) /
                             zentest::BandEnergy(in, rate, low, high, regions));
}

}  // namespace

TEST(ZenDeesser, ReducesSibilantsAndLeavesTheRestOfTheSpectrum) {
    for (float rate : {44100.0f, 48000.0f, 96000.0f}) {
        const zentest::SpeechLike speech = zentest::MakeSpeechLike(rate);
        PluginHarness plugin = zentest::Prepared("De-Esser", {}, 1, rate, 512);  // defaults: 7 kHz, narrow, 50 %
        const std::vector<float> out = plugin.Run(speech.samples, 1, 512)[0];
        EXPECT_LT(EnergyChangeDb(out, speech.samples, rate, 5000, 9000, speech.sibilants), -3.0) << rate;
        for (const auto& [low, high] : {std::pair{80, 500}, {500, 1500}, {1500, 3500}, {3500, 5000}})
            EXPECT_NEAR(EnergyChangeDb(out, speech.samples, rate, low, high, speech.vowels), 0.0, 0.5)
                << rate << " Hz, band " << low << " to " << high;
    }
}

TEST(ZenDeesser, AmountZeroIsTransparentAndMoreAmountReducesMore) {
    const zentest::SpeechLike speech = zentest::MakeSpeechLike(48000.0);
    double previous = 0.0;
    for (float amount : {0.0f, 25.0f, 50.0f, 100.0f}) {
        PluginHarness plugin = zentest::Prepared("De-Esser", {{"Amount", amount}}, 2);
        const zentest::Channels out = plugin.Run(speech.samples, 2, 512);
        for (std::size_t n = 0; amount == 0.0f && n < out[0].size(); ++n)
            ASSERT_NEAR(out[1][n], speech.samples[n], 1e-6) << n;
        const double change = EnergyChangeDb(out[0], speech.samples, 48000.0, 5000, 9000, speech.sibilants);
        if (amount == 0.0f) {
            EXPECT_NEAR(change, 0.0, 1e-3);
        } else {
            EXPECT_LT(change, previous - 1.0) << amount;
        }
        previous = change;
    }
}

TEST(ZenDeesser, EssOnlyPlaysTheDetectedBand) {
    const zentest::SpeechLike speech = zentest::MakeSpeechLike(48000.0);
    PluginHarness plugin = zentest::Prepared("De-Esser", {{"Ess Only", 1.0f}, {"Frequency", 6500.0f}}, 1);
    const std::vector<float> out = plugin.Run(speech.samples, 1, 512)[0];
    // The band at its own level, the voice below it down by the band's boost (8.3 dB).
    EXPECT_NEAR(EnergyChangeDb(out, speech.samples, 48000.0, 6000, 7000, speech.sibilants), 0.0, 1.0);
    EXPECT_LT(EnergyChangeDb(out, speech.samples, 48000.0, 80, 1500, speech.vowels), -7.0);
}

TEST(ZenDeesser, ReductionMeterReadsTheGainAppliedNow) {
    PluginHarness plugin = zentest::Prepared("De-Esser", {}, 2);
    EXPECT_EQ(plugin.Meter("Reduction"), 0.0f);
    const zentest::Channels in = {zentest::Sine(7000.0, 48000.0, 480, 0.5), zentest::Sine(200.0, 48000.0, 480, 0.2)};
    for (int block = 0; block < 20; ++block) {
        zentest::Channels io = in;
        plugin.Process(io);
        // Linked: the tone on the right carries the gain of the ess on the left.
        EXPECT_NEAR(plugin.Meter("Reduction"), zentest::ToDb(io[1].back() / in[1].back()), 0.01) << block;
    }
    EXPECT_LT(plugin.Meter("Reduction"), -6.0f);  // a pure ess at 7 kHz: close to the 8.3 dB boost
    EXPECT_NEAR(plugin.Meter("Output"), zentest::ToDb(0.5) + plugin.Meter("Reduction"), 0.5);
}

TEST(ZenDeesser, NoLatencyMonoOrStereoAndSplitsDoNotMatter) {
    const std::vector<float> speech = zentest::MakeSpeechLike(48000.0, 3).samples;
    auto run = [&](std::uint32_t channels, std::size_t block) {
        PluginHarness plugin = zentest::Prepared("De-Esser", {{"Range", 1.0f}}, channels, 48000.0f, 512);  // "Wide"
        EXPECT_EQ(plugin.Audio().GetLatency(), 0u);
        return plugin.Run(speech, channels, block);
    };
    const zentest::Channels stereo = run(2, 512);
    EXPECT_EQ(stereo[0], stereo[1]);
    EXPECT_EQ(run(1, 512)[0], stereo[0]);
    EXPECT_EQ(run(2, 7)[0], stereo[0]);
    EXPECT_EQ(run(2, 5000)[0], stereo[0]);  // host blocks beyond the prepared size

    PluginHarness plugin = zentest::Prepared("De-Esser", {}, 1);
    EXPECT_EQ(zentest::ArgPeak(plugin.Run(zentest::Impulse(2048, 300, 0.5f))[0]), 300u);
    EXPECT_FALSE(plugin.Audio().ConfigureChannels(3, 3));
    EXPECT_FALSE(plugin.Audio().ConfigureChannels(1, 2));
}

TEST(ZenDeesser, NonFiniteAndHugeInputGiveFiniteOutputAndLeaveNoTrace) {
    const zentest::SpeechLike speech = zentest::MakeSpeechLike(48000.0, 4);
    PluginHarness reference = zentest::Prepared("De-Esser", {}, 1);
    const std::vector<float> clean = reference.Run(speech.samples)[0];
    for (float bad : {NAN, INFINITY, -INFINITY, 1e19f}) {
        std::vector<float> input = speech.samples;
        const std::size_t at = speech.sibilants[1].first + 500;
        input[at] = bad;
        PluginHarness plugin = zentest::Prepared("De-Esser", {}, 1);
        const std::vector<float> out = plugin.Run(input, 1, 512)[0];
        for (std::size_t n = 0; n < out.size(); ++n) ASSERT_TRUE(std::isfinite(out[n])) << n << " after " << bad;
        const std::size_t later = speech.vowels[2].first;
        EXPECT_NEAR(zentest::ToDb(zentest::Rms(out, later) / zentest::Rms(clean, later)), 0.0, 0.1) << bad;
    }
}
