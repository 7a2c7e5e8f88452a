// "Voice Isolation" through the host interface: the background law in
// pauses, what it does to speech, "Amount", the voice meter, latency,
// splits and bad input.
#include <gtest/gtest.h>

#include <cmath>

#include "Support/PluginHarness.h"
#include "Support/Signals.h"
#include "Support/SpeechQuality.h"
#include "Support/SpokenSpeech.h"

using zentest::PluginHarness;

namespace {

constexpr float kRate = 48000.0f;
constexpr std::size_t kLatency = 1023;

std::vector<float> Aligned(const std::vector<float>& out, std::size_t length) {
    std::vector<float> y(length, 0.0f);
    for (std::size_t n = 0; n < length && n + kLatency < out.size(); ++n) y[n] = out[n + kLatency];
    return y;
}

}  // namespace

// Noise alone is a pause: it falls to "Background", scaled by "Amount"
// (the gain 1 - amount (1 - floor)); the voice meter stays low.
TEST(ZenVoiceIsolationControl, PausesFallToTheBackgroundScaledByAmount) {
    const std::vector<float> noise = zentest::MakeNoise(zentest::NoiseKind::Pink, static_cast<std::size_t>(kRate), kRate);
    for (const auto& [background, amount] : {std::pair{-12.0f, 100.0f}, {-30.0f, 100.0f}, {-30.0f, 50.0f}}) {
        PluginHarness plugin =
            zentest::Prepared("Voice Isolation", {{"Background", background}, {"Amount", amount}}, 1);
        const std::vector<float> out = plugin.Run(noise, 1, 512)[0];
        const float floor = std::pow(10.0f, background / 20.0f);
        const double expected = zentest::ToDb(1.0 - amount / 100.0 * (1.0 - floor));
        const std::size_t settled = noise.size() / 2;
        const double change = zentest::ToDb(zentest::Rms(out, settled) / zentest::Rms(noise, settled));
        EXPECT_GE(change, expected - 0.5) << background << " dB, " << amount << " %";
        EXPECT_LE(change, expected + 3.0) << background << " dB, " << amount << " %";
        EXPECT_LT(plugin.Meter("Voice"), 10.0f);
    }
}

// Speech in pink noise: SI-SDR and SNR improve; the pauses lose
// more than the speech does, and the voice meter follows the words.
TEST(ZenVoiceIsolationControl, KeepsSpeechAndLowersThePauses) {
    const double lead = 0.8;
    const std::vector<float> clean = zentest::SpeakPhrases({"Keep the dialogue, lose the room."}, kRate, lead);
    ASSERT_FALSE(clean.empty()) << "espeak-ng could not be run (scripts/install-deps.sh installs it)";
    const std::vector<float> noise = zentest::MakeNoise(zentest::NoiseKind::Pink, clean.size(), kRate);
    const std::vector<float> noisy = zentest::MixAtSnr(clean, noise, 5.0);
    std::vector<float> input = noisy;
    input.resize(noisy.size() + kLatency, 0.0f);

    PluginHarness plugin = zentest::Prepared("Voice Isolation", {}, 2);
    const auto leadEnd = static_cast<std::size_t>(lead * kRate);
    zentest::Channels head = {std::vector<float>(input.begin(), input.begin() + leadEnd),
                              std::vector<float>(input.begin(), input.begin() + leadEnd)};
    plugin.Process(head, 512);
    EXPECT_LT(plugin.Meter("Voice"), 50.0f);
    zentest::Channels rest = {std::vector<float>(input.begin() + leadEnd, input.end()),
                              std::vector<float>(input.begin() + leadEnd, input.end())};
    float loudestVoice = 0.0f;
    for (std::size_t at = 0; at < rest[0].size(); at += 4800) {
        const std::size_t n = std::min<std::size_t>(4800, rest[0].size() - at);
        zentest::Channels part = {std::vector<float>(rest[0].begin() + at, rest[0].begin() + at + n),
                                  std::vector<float>(rest[1].begin() + at, rest[1].begin() + at + n)};
        plugin.Process(part, 512);
        loudestVoice = std::max(loudestVoice, plugin.Meter("Voice"));
        std::copy(part[0].begin(), part[0].end(), rest[0].begin() + at);
    }
    EXPECT_GT(loudestVoice, 90.0f);
    std::vector<float> out = head[0];
    out.insert(out.end(), rest[0].begin(), rest[0].end());
    const std::vector<float> y = Aligned(out, clean.size());
    EXPECT_GT(zentest::SiSdrDb(y, clean) - zentest::SiSdrDb(noisy, clean), 3.0);
    EXPECT_GT(zentest::SnrDb(y, clean) - zentest::SnrDb(noisy, clean), 3.0);
    // The second half of the lead-in is a settled pause.
    const double pause = zentest::ToDb(zentest::Rms(y, leadEnd / 2, leadEnd) / zentest::Rms(noisy, leadEnd / 2, leadEnd));
    const double speech = zentest::ToDb(zentest::Rms(y, leadEnd) / zentest::Rms(noisy, leadEnd));
    EXPECT_LT(pause, -20.0);
    EXPECT_GT(speech, pause + 10.0);
}

TEST(ZenVoiceIsolationControl, LatencyNeutralSettingAndSplits) {
    PluginHarness neutral("Voice Isolation");
    ASSERT_TRUE(neutral.Audio().ApplyNeutralSetting());
    neutral.Prepare(2);
    EXPECT_EQ(neutral.Audio().GetLatency(), kLatency);
    std::vector<float> x = zentest::Noise(6000, 0.5, 3);
    x.resize(x.size() + kLatency, 0.0f);
    const zentest::Channels passed = neutral.Run(x, 2);
    for (std::size_t n = 0; n + kLatency < x.size(); ++n) ASSERT_NEAR(passed[1][n + kLatency], x[n], 2e-6) << n;

    const std::vector<float> speechLike = zentest::MusicLike(kRate, 12000);
    auto run = [&](std::uint32_t channels, std::size_t block) {
        return zentest::Prepared("Voice Isolation", {}, channels, kRate, 512).Run(speechLike, channels, block);
    };
    const zentest::Channels stereo = run(2, 512);
    EXPECT_EQ(stereo[0], stereo[1]);
    EXPECT_EQ(run(1, 512)[0], stereo[0]);
    EXPECT_EQ(run(2, 7)[0], stereo[0]);
    EXPECT_EQ(run(2, 5000)[0], stereo[0]);
    EXPECT_FALSE(neutral.Audio().ConfigureChannels(3, 3));
}

TEST(ZenVoiceIsolationControl, BadInputGivesFiniteOutput) {
    for (float bad : {NAN, INFINITY, 3e38f}) {
        PluginHarness plugin = zentest::Prepared("Voice Isolation", {}, 2);
        std::vector<float> x = zentest::Noise(12000, 1.0, 4);
        x.insert(x.end(), 300, bad);
        x.insert(x.end(), 12000, 0.5f);
        const zentest::Channels out = plugin.Run(x, 2, 512);
        for (std::size_t n = 0; n < x.size(); ++n) ASSERT_TRUE(std::isfinite(out[0][n])) << bad << " " << n;
        EXPECT_TRUE(std::isfinite(plugin.Meter("Voice")));
    }
}
