// "Noise Reduction" through the host interface: the reduction law, what it
// does to speech, "Listen to Removed Noise", learning and the profile in the
// state, meters, latency, splits and bad input. The denoiser's quality on
// its own is tested with the noise-reduction stages.
#include <gtest/gtest.h>

#include <cmath>

#include "Support/PluginHarness.h"
#include "Support/Signals.h"
#include "Support/SpeechQuality.h"
#include "Support/SpokenSpeech.h"

using zentest::PluginHarness;

namespace {

constexpr float kRate = 48000.0f;
constexpr std::uint32_t kLatency = 1023;  // the 1024-sample frame at 48 kHz

// The output shifted back by the latency, as long as the input.
std::vector<float> Aligned(const std::vector<float>& out, std::size_t latency, std::size_t length) {
    std::vector<float> y(length, 0.0f);
    for (std::size_t n = 0; n < length && n + latency < out.size(); ++n) y[n] = out[n + latency];
    return y;
}

std::vector<float> WithTail(std::vector<float> x) {
    x.resize(x.size() + kLatency, 0.0f);
    return x;
}

// Noise alone for `lead` seconds, then a spoken phrase, mixed at `snrDb`.
struct NoisySpeech {
    std::vector<float> clean, noisy;
};

NoisySpeech MakeNoisySpeech(double snrDb, double lead = 0.5) {
    NoisySpeech s;
    s.clean = zentest::SpeakPhrases({"Noise reduction should keep the voice natural."}, kRate, lead);
    if (s.clean.empty()) return s;
    const std::vector<float> noise = zentest::MakeNoise(zentest::NoiseKind::Pink, s.clean.size(), kRate);
    s.noisy = zentest::MixAtSnr(s.clean, noise, snrDb);
    return s;
}

}  // namespace

// On noise alone the gain rests at the floor: the power removed is the
// "Reduction" set, and the meters say so.
TEST(ZenNoiseReduction, NoiseAloneFallsByTheReduction) {
    const std::vector<float> noise = zentest::Noise(static_cast<std::size_t>(kRate), 0.1, 5);
    for (float reduction : {6.0f, 12.0f, 20.0f, 30.0f}) {
        PluginHarness plugin = zentest::Prepared("Noise Reduction", {{"Reduction", reduction}}, 1);
        const std::vector<float> out = plugin.Run(noise, 1, 512)[0];
        const std::size_t settled = noise.size() / 2;
        // A few bins of noise pass as speech would: a little less than the floor.
        const double change = zentest::ToDb(zentest::Rms(out, settled) / zentest::Rms(noise, settled));
        EXPECT_GE(change, -reduction - 0.5) << reduction;
        EXPECT_LE(change, -reduction + 3.0) << reduction;
        EXPECT_NEAR(plugin.Meter("Reduction 1"), change, 1.0) << reduction;
        const std::vector<float> gains = plugin.MeterArray("Gain Spectrum");
        ASSERT_EQ(gains.size(), 513u);
        double mean = 0.0;
        for (float g : gains) mean += g / static_cast<double>(gains.size());
        EXPECT_GE(mean, -reduction - 0.5) << reduction;
        EXPECT_LE(mean, -reduction + 3.0) << reduction;
    }
}

// White noise of RMS r reads 20 log10 r at every point of the noise spectrum.
TEST(ZenNoiseReduction, NoiseSpectrumReadsTheNoiseLevelPerBin) {
    PluginHarness plugin = zentest::Prepared("Noise Reduction", {}, 2);
    EXPECT_EQ(plugin.MeterArray("Noise Spectrum")[100], -150.0f);  // at rest
    const std::vector<float> noise = zentest::Noise(static_cast<std::size_t>(kRate), 0.1, 6);
    plugin.Run(noise, 2, 512);
    const double level = zentest::ToDb(zentest::Rms(noise));
    const std::vector<float> spectrum = plugin.MeterArray("Noise Spectrum");
    for (std::size_t p = 20; p < 500; p += 40) EXPECT_NEAR(spectrum[p], level, 2.0) << p;
    EXPECT_EQ(plugin.Meter("Profile Learnt"), 0.0f);
}

// Defaults on speech in pink noise: SNR and SI-SDR improve, and the speech
// passes; the learnt profile does at least as well on stationary noise.
TEST(ZenNoiseReduction, CleansSpeechAdaptiveAndLearnt) {
    const NoisySpeech s = MakeNoisySpeech(5.0);
    ASSERT_FALSE(s.clean.empty()) << "espeak-ng could not be run (scripts/install-deps.sh installs it)";
    const double inSi = zentest::SiSdrDb(s.noisy, s.clean), inSnr = zentest::SnrDb(s.noisy, s.clean);

    PluginHarness adaptive = zentest::Prepared("Noise Reduction", {}, 1);
    const std::vector<float> a = Aligned(adaptive.Run(WithTail(s.noisy), 1, 512)[0], kLatency, s.clean.size());
    EXPECT_GT(zentest::SiSdrDb(a, s.clean) - inSi, 4.0);
    EXPECT_GT(zentest::SnrDb(a, s.clean) - inSnr, 4.0);

    PluginHarness learnt = zentest::Prepared("Noise Reduction", {{"Learn", 1.0f}, {"Estimate", 1.0f}}, 1);
    std::vector<float> lead(s.noisy.begin(), s.noisy.begin() + static_cast<std::ptrdiff_t>(0.5 * kRate));
    learnt.Run(lead, 1, 512);
    learnt.Set("Learn", 0.0f);
    learnt.Audio().Reset();
    const std::vector<float> l = Aligned(learnt.Run(WithTail(s.noisy), 1, 512)[0], kLatency, s.clean.size());
    EXPECT_EQ(learnt.Meter("Profile Learnt"), 1.0f);
    EXPECT_GT(zentest::SiSdrDb(l, s.clean) - inSi, zentest::SiSdrDb(a, s.clean) - inSi - 0.5);
}

// What is removed and what is kept add up to the input, delayed.
TEST(ZenNoiseReduction, ListeningToTheRemovedNoiseIsTheComplement) {
    const NoisySpeech s = MakeNoisySpeech(0.0, 0.2);
    ASSERT_FALSE(s.noisy.empty());
    const std::vector<float> x(s.noisy.begin(), s.noisy.begin() + static_cast<std::ptrdiff_t>(kRate));
    PluginHarness kept = zentest::Prepared("Noise Reduction", {}, 1);
    PluginHarness removed = zentest::Prepared("Noise Reduction", {{"Listen to Removed Noise", 1.0f}}, 1);
    const std::vector<float> k = kept.Run(WithTail(x), 1, 512)[0], r = removed.Run(WithTail(x), 1, 512)[0];
    EXPECT_GT(zentest::Rms(r), 0.3 * zentest::Rms(x));
    for (std::size_t n = 0; n < x.size(); ++n) ASSERT_NEAR(k[n + kLatency] + r[n + kLatency], x[n], 1e-4) << n;
}

TEST(ZenNoiseReduction, LatencyIsTheFrameLessOneAndSplitsDoNotMatter) {
    for (const auto& [rate, latency] : {std::pair{44100.0f, 1023u}, {48000.0f, 1023u}, {96000.0f, 2047u}}) {
        PluginHarness plugin = zentest::Prepared("Noise Reduction", {{"Reduction", 0.0f}}, 1, rate);
        EXPECT_EQ(plugin.Audio().GetLatency(), latency) << rate;
        EXPECT_EQ(zentest::ArgPeak(plugin.Run(zentest::Impulse(4 * latency, 300, 0.5f))[0]), 300u + latency) << rate;
    }
    const std::vector<float> x = zentest::Noise(12000, 0.2, 8);
    auto run = [&](std::uint32_t channels, std::size_t block) {
        return zentest::Prepared("Noise Reduction", {}, channels, kRate, 512).Run(x, channels, block);
    };
    const zentest::Channels stereo = run(2, 512);
    EXPECT_EQ(stereo[0], stereo[1]);
    EXPECT_EQ(run(1, 512)[0], stereo[0]);
    EXPECT_EQ(run(2, 7)[0], stereo[0]);
    EXPECT_EQ(run(2, 5000)[0], stereo[0]);
}

TEST(ZenNoiseReduction, NeutralSettingPassesTheInputDelayed) {
    PluginHarness plugin("Noise Reduction");
    ASSERT_TRUE(plugin.Audio().ApplyNeutralSetting());
    plugin.Prepare(2);
    const std::vector<float> x = zentest::Noise(8000, 0.5, 9);
    const zentest::Channels out = plugin.Run(WithTail(x), 2);
    for (std::size_t n = 0; n < x.size(); ++n) ASSERT_NEAR(out[1][n + kLatency], x[n], 2e-6) << n;
}

// The profile travels in the state: an instance given the state reduces
// exactly as the one that learnt; presets keep it, a bad profile is refused.
TEST(ZenNoiseReduction, LearntProfileIsSavedAndRestored) {
    const std::vector<float> hum = zentest::MakeNoise(zentest::NoiseKind::Hum, 24000, kRate);
    PluginHarness learner = zentest::Prepared("Noise Reduction", {{"Learn", 1.0f}, {"Estimate", 1.0f}}, 1);
    learner.Run(hum, 1, 512);
    EXPECT_EQ(learner.Meter("Profile Learnt"), 0.0f);  // still learning
    learner.Set("Learn", 0.0f);
    learner.Run(std::vector<float>(512, 0.0f), 1, 512);  // the learn ends on the audio thread
    EXPECT_EQ(learner.Meter("Profile Learnt"), 1.0f);
    const std::string state = learner.Audio().SaveState();
    EXPECT_NE(state.find("noise-profile 48000 513 1"), std::string::npos);

    PluginHarness restored("Noise Reduction");
    ASSERT_TRUE(restored.Audio().LoadState(state));
    EXPECT_EQ(restored.Audio().SaveState(), state);
    restored.Prepare(1);
    learner.Audio().Reset();
    // The text keeps hundredths of a dB: the same output within -60 dB.
    const std::vector<float> x = zentest::Noise(6000, 0.05, 10);
    const std::vector<float> a = restored.Run(x, 1, 512)[0], b = learner.Run(x, 1, 512)[0];
    std::vector<float> difference(a.size());
    for (std::size_t n = 0; n < a.size(); ++n) difference[n] = a[n] - b[n];
    EXPECT_LT(zentest::Rms(difference), 1e-3 * zentest::Rms(b));

    ASSERT_TRUE(restored.Audio().LoadPreset(restored.Audio().GetPresetNames().front()));
    EXPECT_NE(restored.Audio().SaveState().find("noise-profile 48000 513 1"), std::string::npos);
    const std::string before = restored.Audio().SaveState();
    for (const char* bad : {"noise-profile 48000 513", "noise-profile 48000 2 1 0 x", "hum"}) {
        std::string text = state;
        const std::size_t at = text.find("noise-profile");
        text.replace(at, text.find('"', at) - at, bad);
        EXPECT_FALSE(restored.Audio().LoadState(text)) << bad;
    }
    EXPECT_EQ(restored.Audio().SaveState(), before);
}

// A learn that heard no frame keeps the profile there was.
TEST(ZenNoiseReduction, EmptyLearnKeepsTheProfile) {
    PluginHarness plugin = zentest::Prepared("Noise Reduction", {{"Learn", 1.0f}}, 1);
    plugin.Run(zentest::Noise(8000, 0.1, 11), 1, 512);
    plugin.Set("Learn", 0.0f);
    plugin.Run(std::vector<float>(64, 0.0f));
    const std::string learnt = plugin.Audio().SaveState();
    plugin.Audio().Reset();
    plugin.Set("Learn", 1.0f);
    plugin.Run(std::vector<float>(64, 0.0f));  // less than a frame since the reset
    plugin.Set("Learn", 0.0f);
    plugin.Run(std::vector<float>(64, 0.0f));
    EXPECT_EQ(plugin.Audio().SaveState(), learnt);
    EXPECT_EQ(plugin.Meter("Profile Learnt"), 1.0f);
}

// Silence, DC, full-scale noise and non-finite samples give finite output,
// and the reduction is back to its law once the adaptive estimate's window
// (a second) has seen the new noise; huge finite samples give finite output.
TEST(ZenNoiseReduction, BadInputNeverSticks) {
    for (float bad : {NAN, INFINITY, 3e38f}) {
        PluginHarness plugin = zentest::Prepared("Noise Reduction", {}, 1);
        std::vector<float> x(static_cast<std::size_t>(kRate) / 4, 0.0f);
        const std::vector<float> loud = zentest::Noise(x.size(), 1.0, 12);
        x.insert(x.end(), x.size(), 0.5f);
        x.insert(x.end(), loud.begin(), loud.end());
        x.insert(x.end(), 300, bad);
        const std::vector<float> tail = zentest::Noise(static_cast<std::size_t>(2 * kRate), 0.1, 13);
        x.insert(x.end(), tail.begin(), tail.end());
        const std::vector<float> out = plugin.Run(x, 1, 512)[0];
        for (std::size_t n = 0; n < x.size(); ++n) ASSERT_TRUE(std::isfinite(out[n])) << bad << " " << n;
        if (std::isfinite(bad)) continue;
        EXPECT_NEAR(plugin.Meter("Reduction 1"), -20.0f, 2.0f) << bad;
    }
}
