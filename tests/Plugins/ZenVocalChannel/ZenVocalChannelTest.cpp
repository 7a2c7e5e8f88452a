// "Vocal Channel" through the host interface: each stage's law as its
// controls set it, the meters, clean switching and gliding, splits,
// layouts, latency, tail and bad input.
#include <gtest/gtest.h>

#include <cmath>
#include <string>
#include <utility>
#include <vector>

#include "Common/Algorithms/NoiseGate.h"
#include "Support/Dynamics.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"
#include "Support/Speech.h"

using zentest::PluginHarness;
using Settings = std::vector<std::pair<std::string, float>>;

namespace {

constexpr float kRate = 48000.0f;
const char* const kSwitches[] = {"Low Cut", "Gate", "Compressor", "De-Ess"};

// Every switched stage out but `stage`, the EQ flat, then `more`.
PluginHarness Only(const char* stage, Settings more = {}, std::uint32_t channels = 1) {
    Settings settings;
    for (const char* s : kSwitches) settings.push_back({s, std::string(s) == stage ? 1.0f : 0.0f});
    settings.insert(settings.end(), more.begin(), more.end());
    return zentest::Prepared("Vocal Channel", settings, channels);
}

std::vector<float> Through(PluginHarness plugin, const std::vector<float>& in) { return plugin.Run(in, 1, 512)[0]; }

double SteadyGainDb(const std::vector<float>& out, const std::vector<float>& in) {
    return zentest::ToDb(zentest::Rms(out, in.size() / 2) / zentest::Rms(in, in.size() / 2));
}

}  // namespace

TEST(ZenVocalChannel, EachStageFollowsItsControls) {
    // Low cut: -3 dB at its corner, 12 or 24 dB per octave below.
    for (float slope : {0.0f, 1.0f}) {
        const Settings cut = {{"Low Cut Freq", 120.0f}, {"Low Cut Slope", slope}};
        const std::vector<float> corner = zentest::Sine(120.0, kRate, 48000, 0.5), octave = zentest::Sine(60.0, kRate, 48000, 0.5);
        EXPECT_NEAR(SteadyGainDb(Through(Only("Low Cut", cut), corner), corner), -3.01, 0.05) << slope;
        EXPECT_NEAR(SteadyGainDb(Through(Only("Low Cut", cut), octave), octave), slope == 0.0f ? -12.3 : -24.1, 0.1) << slope;
    }
    // Gate: -45 dB opens it at a threshold of -50 and not at -40; closed, it takes its range.
    const std::vector<float> quiet = zentest::LevelSteps(24000, {{0, -45.0}});
    EXPECT_EQ(Through(Only("Gate", {{"Gate Threshold", -50.0f}}), quiet).back(), quiet.back());
    EXPECT_NEAR(zentest::GainDb(Through(Only("Gate", {{"Gate Threshold", -40.0f}, {"Gate Range", 24.0f}}), quiet), quiet,
                                quiet.size() - 1),
                -24.0, 1e-3);
    const std::vector<float> drop = zentest::LevelSteps(48000, {{0, -20.0}, {24000, -70.0}});
    const std::vector<float> gated = Through(Only("Gate", {{"Gate Hold", 0.0f}, {"Gate Release", 100.0f}}), drop);
    // The gate's detector falls 36 dB to the closing level (-50 less 6 dB), then the release.
    const double closing = NoiseGate::kDetectorReleaseMs * std::log(std::pow(10.0, 36.0 / 20.0)) + 100.0;
    EXPECT_NEAR(zentest::TimeConstantFrames(gated, drop, 24000, 0.0, -30.0), closing * kRate / 1000.0, 0.002 * kRate);

    // EQ: the bell at its centre, the high shelf far above its corner.
    const std::vector<float> mid = zentest::Sine(1000.0, kRate, 24000, 0.25), top = zentest::Sine(20000.0, kRate, 24000, 0.25);
    EXPECT_NEAR(SteadyGainDb(Through(Only("", {{"Mid Gain", 6.0f}, {"Mid Freq", 1000.0f}}), mid), mid), 6.0, 0.05);
    EXPECT_NEAR(SteadyGainDb(Through(Only("", {{"High Gain", -6.0f}, {"High Freq", 4000.0f}}), top), top), -6.0, 0.3);

    // Compressor: a steady sine of -9 dB RMS meets the ratio line; the makeup comes on top.
    const std::vector<float> tone = zentest::Sine(1000.0, kRate, 24000, 0.5);
    PluginHarness compressor = Only("Compressor", {{"Comp Threshold", -30.0f}, {"Comp Ratio", 4.0f}, {"Comp Makeup", 5.0f}});
    const std::vector<float> compressed = compressor.Run(tone, 1, 512)[0];
    const double reduction = (zentest::ToDb(0.5 / std::sqrt(2.0)) + 30.0) * (1.0 / 4.0 - 1.0);
    EXPECT_NEAR(compressor.Meter("Comp Reduction"), reduction, 0.3);
    EXPECT_NEAR(SteadyGainDb(compressed, tone), reduction + 5.0, 0.3);

    // De-esser: sibilants down, vowels kept.
    const zentest::SpeechLike speech = zentest::MakeSpeechLike(kRate, 4);
    const std::vector<float> deessed = Through(Only("De-Ess", {{"De-Ess Amount", 60.0f}}), speech.samples);
    auto change = [&](double low, double high, const std::vector<zentest::Region>& regions) {
        return 10.0 * std::log10(zentest::BandEnergy(deessed, kRate, low, high, regions) /
                                 zentest::BandEnergy(speech.samples, kRate, low, high, regions));
    };
    EXPECT_LT(change(5000, 9000, speech.sibilants), -3.0);
    EXPECT_NEAR(change(200, 4000, speech.vowels), 0.0, 0.5);

    // Output level, and the neutral setting: a wire.
    EXPECT_NEAR(SteadyGainDb(Through(Only("", {{"Output Level", -6.0f}}), mid), mid), -6.0, 1e-4);
    PluginHarness neutral("Vocal Channel");
    ASSERT_TRUE(neutral.Audio().ApplyNeutralSetting());
    neutral.Prepare(1);
    EXPECT_EQ(neutral.Run(speech.samples)[0], speech.samples);
}

TEST(ZenVocalChannel, MetersReadEachStage) {
    const std::vector<float> x = zentest::Sine(50.0, kRate, 24000, 0.5);
    PluginHarness plugin = Only("Low Cut", {{"Gate", 1.0f}, {"Gate Threshold", -10.0f}, {"Gate Range", 40.0f},
                                            {"Mid Gain", 6.0f}, {"Mid Freq", 50.0f}, {"Output Level", -6.0f}});
    plugin.Run(x, 1, 512);
    // The low cut takes most of a 50 Hz tone; the gate, shut, takes its range; the EQ lifts what is left.
    EXPECT_GT(plugin.Meter("Low Cut Removed"), -8.0f);
    EXPECT_NEAR(plugin.Meter("Gate Gain"), -40.0f, 1e-3f);
    EXPECT_NEAR(plugin.Meter("EQ Peak"), plugin.Meter("Output Peak 1") + 6.0f, 0.01f);
    EXPECT_EQ(plugin.Meter("Comp Reduction"), 0.0f);  // out of the chain
    EXPECT_NEAR(plugin.Meter("Input Peak 1"), zentest::ToDb(0.5), 0.01);
}

TEST(ZenVocalChannel, SwitchesAndControlsMoveWithoutClicks) {
    const std::vector<float> tone = zentest::Sine(110.0, kRate, 48128, 0.3);
    PluginHarness plugin = Only("None");
    zentest::Channels io = {tone};
    for (std::size_t done = 0; done < tone.size(); done += 512) {
        if (done == 12288 || done == 30720)
            for (const char* stage : kSwitches) plugin.Set(stage, done == 12288 ? 1.0f : 0.0f);
        if (done == 20480)
            // Moves that lower the level, so the tone's own steps stay the yardstick.
            for (const auto& [name, value] : Settings{{"Low Cut Freq", 300.0f}, {"Low Gain", -12.0f}, {"Mid Gain", -12.0f},
                                                      {"Comp Threshold", -30.0f}, {"Output Level", -6.0f}})
                plugin.Set(name, value);
        zentest::Channels block = {std::vector<float>(io[0].begin() + static_cast<std::ptrdiff_t>(done),
                                                      io[0].begin() + static_cast<std::ptrdiff_t>(done + 512))};
        plugin.Process(block);
        std::copy(block[0].begin(), block[0].end(), io[0].begin() + static_cast<std::ptrdiff_t>(done));
    }
    EXPECT_LT(zentest::LargestStep(io[0]), 1.5f * zentest::LargestStep(tone));
}

TEST(ZenVocalChannel, SplitsLayoutsLatencyTailAndBadInput) {
    const zentest::SpeechLike speech = zentest::MakeSpeechLike(kRate, 3);
    const Settings moves = {{"Gate", 1.0f}, {"Mid Gain", 5.0f}, {"Comp Threshold", -30.0f}, {"Low Cut", 0.0f}};
    auto run = [&](std::uint32_t channels, std::size_t block) {
        PluginHarness plugin = zentest::Prepared("Vocal Channel", {}, channels);
        zentest::Channels head(channels, std::vector<float>(speech.samples.begin(), speech.samples.begin() + 512));
        plugin.Process(head);
        for (const auto& [name, value] : moves) plugin.Set(name, value);
        zentest::Channels rest(channels, std::vector<float>(speech.samples.begin() + 512, speech.samples.end()));
        plugin.Process(rest, block);
        return rest;
    };
    const zentest::Channels stereo = run(2, 512);
    EXPECT_EQ(stereo[0], stereo[1]);
    EXPECT_EQ(run(1, 512)[0], stereo[0]);
    EXPECT_EQ(run(1, 13)[0], stereo[0]);
    EXPECT_EQ(run(1, 3000)[0], stereo[0]);

    PluginHarness plugin = zentest::Prepared("Vocal Channel", {{"Mid Gain", 18.0f}, {"Mid Freq", 200.0f}, {"Mid Q", 6.0f}}, 1);
    EXPECT_EQ(plugin.Audio().GetLatency(), 0u);
    EXPECT_FALSE(plugin.Audio().ConfigureChannels(3, 3));
    EXPECT_FALSE(plugin.Audio().ConfigureChannels(2, 1));
    const std::uint32_t tail = plugin.Audio().GetTailLength();
    std::vector<float> burst = zentest::Noise(4800 + tail, 0.5);
    std::fill(burst.begin() + 4800, burst.end(), 0.0f);
    EXPECT_LT(zentest::Peak(plugin.Run(burst)[0], 4800 + tail), 1e-5f);

    for (float bad : {NAN, -INFINITY}) {
        std::vector<float> input = speech.samples;
        input[speech.vowels[0].first + 10] = bad;
        const std::vector<float> out = zentest::Prepared("Vocal Channel", moves, 1).Run(input, 1, 512)[0];
        const std::vector<float> clean = zentest::Prepared("Vocal Channel", moves, 1).Run(speech.samples, 1, 512)[0];
        for (std::size_t n = speech.vowels[0].first + 1024; n < out.size(); ++n) ASSERT_TRUE(std::isfinite(out[n])) << n;
        EXPECT_NEAR(zentest::ToDb(zentest::Rms(out, speech.vowels[2].first, speech.vowels[2].second) /
                                  zentest::Rms(clean, speech.vowels[2].first, speech.vowels[2].second)),
                    0.0, 0.1)
            << bad;
    }
}
