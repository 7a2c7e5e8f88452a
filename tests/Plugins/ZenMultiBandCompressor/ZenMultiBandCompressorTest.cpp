// "Multiband Compressor" through the host interface: the bands at unity sum
// flat, a band compresses by the Compressor's law, solo, bypass, the key
// channels, look-ahead latency, layouts, automation and bad input.
#include <gtest/gtest.h>

#include <cmath>
#include <string>

#include "Common/Algorithms/Compressor.h"
#include "Common/Algorithms/LinkwitzRileyCrossover.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"

using zentest::PluginHarness;

namespace {

const char* kName = "Multiband Compressor";
using Settings = std::vector<std::pair<std::string, float>>;

std::string Band(int band, const char* what) { return "Band " + std::to_string(band) + " " + what; }

// Every band at unity gain: ratio 1 leaves the level alone whatever it is.
Settings Unity(int bands) {
    Settings s = {{"Bands", static_cast<float>(bands)}};
    for (int b = 1; b <= 5; ++b) s.push_back({Band(b, "Ratio"), 1.0f});
    return s;
}

std::vector<float> Programme(std::size_t frames) {
    std::vector<float> x = zentest::Noise(frames, 0.4, 11);
    const std::vector<float> low = zentest::Sine(70.0, 48000.0, frames, 0.5);
    for (std::size_t n = 0; n < frames; ++n) x[n] = x[n] * (n / 6000 % 2 ? 1.0f : 0.1f) + low[n];
    return x;
}

}  // namespace

TEST(ZenMultiBandCompressor, BandsAtUnitySumFlatFrom20HzTo20kHz) {
    for (float rate : {44100.0f, 48000.0f, 96000.0f})
        for (int bands : {2, 4, 5}) {
            PluginHarness plugin = zentest::Prepared(kName, Unity(bands), 1, rate, 512);
            const std::vector<float> h = plugin.Run(zentest::Impulse(16384, 0, 0.5f), 1, 512)[0];
            double worst = 0.0;
            for (double f = 20.0; f <= 20000.0; f *= 1.05)
                worst = std::max(worst, std::fabs(zentest::MagnitudeDb(h, f, rate) - zentest::ToDb(0.5)));
            EXPECT_LT(worst, 0.1) << rate << " Hz, " << bands << " bands";
            EXPECT_LT(worst, 0.01) << rate << " Hz, " << bands << " bands";
        }
}

TEST(ZenMultiBandCompressor, ABandsGainReductionFollowsTheCompressorLaw) {
    // Band 2 of 3 alone, hard knee: the Compressor on that band's signal.
    const Settings settings = {{"Bands", 3.0f},          {"Crossover 1", 200.0f},     {"Crossover 2", 2000.0f},
                               {Band(2, "Threshold"), -30.0f}, {Band(2, "Ratio"), 4.0f}, {Band(2, "Knee"), 0.0f},
                               {Band(2, "Attack"), 2.0f},     {Band(2, "Release"), 80.0f}, {Band(2, "Makeup"), 3.0f},
                               {Band(2, "Solo"), 1.0f}};
    const std::vector<float> in = Programme(48000);
    PluginHarness plugin = zentest::Prepared(kName, settings, 1);

    LinkwitzRileyCrossover split;
    split.SetChannelCount(1);
    split.Prepare(48000.0f, 512);
    split.SetParameter(LinkwitzRileyCrossover::kBands, 3.0f);
    split.SetParameter(LinkwitzRileyCrossover::kFrequency1, 200.0f);
    split.SetParameter(LinkwitzRileyCrossover::kFrequency2, 2000.0f);
    Compressor law;
    law.SetChannelCount(1);
    law.Prepare(48000.0f, 512);
    for (const auto& [index, value] : std::vector<std::pair<Compressor::Parameter, float>>{
             {Compressor::kThreshold, -30.0f}, {Compressor::kRatio, 4.0f}, {Compressor::kAttack, 2.0f},
             {Compressor::kRelease, 80.0f}, {Compressor::kMakeup, 3.0f}})
        law.SetParameter(index, value);
    law.Reset();

    double worst = 0.0;
    for (std::size_t done = 0; done + 512 <= in.size(); done += 512) {
        zentest::Channels io = {std::vector<float>(in.begin() + done, in.begin() + done + 512)};
        const float* x[] = {io[0].data()};
        split.Split(x, 512);
        std::vector<float> want(split.Band(1)[0], split.Band(1)[0] + 512);
        float* w[] = {want.data()};
        law.Process(w, 512);
        plugin.Process(io);
        for (std::size_t i = 0; i < 512; ++i)
            worst = std::max(worst, static_cast<double>(std::fabs(io[0][i] - want[i])));
        const float reduction = plugin.Meter("Band 2 Gain Reduction");
        ASSERT_NEAR(reduction, law.GetMeter(Compressor::kGainReductionMeter), 0.1) << done;
    }
    EXPECT_LT(worst, 1e-6);
    EXPECT_LT(plugin.Meter("Band 2 Gain Reduction"), -3.0f);  // it did compress
}

TEST(ZenMultiBandCompressor, SoloPlaysItsBandAndBypassPassesBandsUntouched) {
    const std::vector<float> low = zentest::Sine(60.0, 48000.0, 24000, 0.5);  // band 1
    const std::vector<float> high = zentest::Sine(14000.0, 48000.0, 24000, 0.5);
    std::vector<float> mix(low.size());
    for (std::size_t n = 0; n < mix.size(); ++n) mix[n] = low[n] + high[n];

    PluginHarness solo = zentest::Prepared(kName, {{Band(4, "Solo"), 1.0f}, {Band(4, "Ratio"), 1.0f}}, 1);
    const std::vector<float> top = solo.Run(mix, 1, 512)[0];
    EXPECT_NEAR(zentest::ToDb(zentest::Rms(top, 12000) / zentest::Rms(high, 12000)), 0.0, 0.1);

    Settings bypassAll = {{"Bands", 5.0f}};
    for (int b = 1; b <= 5; ++b) bypassAll.push_back({Band(b, "Bypass"), 1.0f});
    PluginHarness bypassed = zentest::Prepared(kName, bypassAll, 1);
    const std::vector<float> flat = bypassed.Run(mix, 1, 512)[0];
    EXPECT_NEAR(zentest::ToDb(zentest::Rms(flat, 12000) / zentest::Rms(mix, 12000)), 0.0, 0.05);
    for (int b = 1; b <= 5; ++b) EXPECT_EQ(bypassed.Meter(Band(b, "Gain Reduction")), 0.0f);

    // Soloing the top band fades the bass out instead of cutting it.
    PluginHarness fading = zentest::Prepared(kName, {}, 1);
    zentest::Channels io = {low};
    fading.Process(io, 512);
    fading.Set(Band(4, "Solo"), 1.0f);
    io = {low};
    fading.Process(io, 512);
    EXPECT_LT(zentest::LargestStep(io[0]), 0.02f);
    EXPECT_LT(zentest::Rms(io[0], 12000), 0.01);
}

TEST(ZenMultiBandCompressor, TheKeyChannelsDriveTheBandsAndPassUnchanged) {
    // Three channels keyed: stereo compressed, the third the key.
    const std::vector<float> quiet = zentest::Sine(50.0, 48000.0, 24000, 0.01);
    const std::vector<float> loudKey = zentest::Sine(50.0, 48000.0, 24000, 0.9);
    const Settings keyed = {{"Side-Chain", 1.0f}, {Band(1, "Threshold"), -30.0f}, {Band(1, "Ratio"), 4.0f}};
    PluginHarness plugin = zentest::Prepared(kName, keyed, 3);
    zentest::Channels io = {quiet, quiet, loudKey};
    plugin.Process(io, 512);
    EXPECT_EQ(io[2], loudKey);
    EXPECT_LT(plugin.Meter("Band 1 Gain Reduction"), -15.0f);
    EXPECT_LT(zentest::ToDb(zentest::Rms(io[0], 12000) / zentest::Rms(quiet, 12000)), -15.0);
    EXPECT_EQ(io[0], io[1]);

    // Without the side-chain the same three channels are all compressed, linked.
    PluginHarness plain = zentest::Prepared(kName, {{Band(1, "Threshold"), -30.0f}, {Band(1, "Ratio"), 4.0f}}, 3);
    io = {quiet, quiet, loudKey};
    plain.Process(io, 512);
    EXPECT_LT(zentest::ToDb(zentest::Rms(io[2], 12000) / zentest::Rms(loudKey, 12000)), -10.0);
}

TEST(ZenMultiBandCompressor, LookaheadIsTheReportedLatencyAndLayoutsBeyondTenAreRefused) {
    for (float rate : {44100.0f, 96000.0f}) {
        PluginHarness plugin(kName);
        ASSERT_TRUE(plugin.Audio().ApplyNeutralSetting());
        plugin.Set("Lookahead", 5.0f);
        plugin.Prepare(2, rate, 512);
        const auto latency = static_cast<std::size_t>(std::lround(0.005 * rate));
        EXPECT_EQ(plugin.Audio().GetLatency(), latency);
        const zentest::Channels out = plugin.Run(zentest::Impulse(4096, 100, 0.5f), 2, 512);
        EXPECT_EQ(zentest::ArgPeak(out[1]), 100 + latency);
        EXPECT_FLOAT_EQ(out[1][100 + latency], 0.5f);  // the neutral setting is a wire
    }
    PluginHarness plugin(kName);
    for (std::uint32_t n = 1; n <= 10; ++n) EXPECT_TRUE(plugin.Audio().ConfigureChannels(n, n)) << n;
    EXPECT_FALSE(plugin.Audio().ConfigureChannels(11, 11));
    EXPECT_FALSE(plugin.Audio().ConfigureChannels(2, 1));
    EXPECT_FALSE(plugin.Audio().ConfigureChannels(0, 0));
}

TEST(ZenMultiBandCompressor, BlockSplitsDoNotMatterEvenWhileCrossoversGlide) {
    const std::vector<float> in = Programme(12000);
    auto run = [&](std::size_t block) {
        PluginHarness plugin = zentest::Prepared(kName, {{"Bands", 5.0f}}, 2, 48000.0f, 1024);
        zentest::Channels head = {std::vector<float>(in.begin(), in.begin() + 1000),
                                  std::vector<float>(in.begin(), in.begin() + 1000)};
        plugin.Process(head, block);
        plugin.Set("Crossover 2", 300.0f);  // glides from here
        plugin.Set(Band(3, "Threshold"), -40.0f);
        zentest::Channels tail = {std::vector<float>(in.begin() + 1000, in.end()),
                                  std::vector<float>(in.begin() + 1000, in.end())};
        plugin.Process(tail, block);
        head[0].insert(head[0].end(), tail[0].begin(), tail[0].end());
        return head[0];
    };
    const std::vector<float> whole = run(1000);
    EXPECT_EQ(run(37), whole);
    EXPECT_EQ(run(5000), whole);  // beyond the prepared block
}

TEST(ZenMultiBandCompressor, NonFiniteInputRecoversWithinABlock) {
    const std::vector<float> in = Programme(96000);
    PluginHarness reference = zentest::Prepared(kName, {}, 1);
    const std::vector<float> clean = reference.Run(in, 1, 512)[0];
    for (float bad : {NAN, INFINITY, -INFINITY}) {
        std::vector<float> poisoned = in;
        poisoned[5000] = bad;
        PluginHarness plugin = zentest::Prepared(kName, {}, 1);
        const std::vector<float> out = plugin.Run(poisoned, 1, 512)[0];
        for (std::size_t n = 5120; n < out.size(); ++n) ASSERT_TRUE(std::isfinite(out[n])) << bad << " at " << n;
        // Once the envelopes have let go, the sound is what it was.
        EXPECT_NEAR(zentest::ToDb(zentest::Rms(out, 86000) / zentest::Rms(clean, 86000)), 0.0, 0.1) << bad;
    }
}
