// "Meter" through the host interface: what its meters read for known
// signals, the channel weights and the LFE choice, "Reset", true peak, bad
// samples, and that it measures without touching the audio.
#include <gtest/gtest.h>

#include <cmath>
#include <limits>

#include "Support/AnalyserChecks.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"

using zentest::PluginHarness;

namespace {

constexpr double kRate = 48000.0;
const float kMinusTwentyThree = static_cast<float>(std::pow(10.0, -23.0 / 20.0));

// `seconds` of a 1 kHz tone at -23 dBFS on the channels in `toned`, silence on the others.
zentest::Channels Tone(std::uint32_t channels, std::vector<std::uint32_t> toned, double seconds) {
    const auto frames = static_cast<std::size_t>(seconds * kRate);
    zentest::Channels x(channels, std::vector<float>(frames, 0.0f));
    for (std::uint32_t c : toned) x[c] = zentest::Sine(1000.0, kRate, frames, kMinusTwentyThree);
    return x;
}

}  // namespace

TEST(ZenMeter, ReadsTheLoudnessAndLevelsOfAStereoTone) {
    PluginHarness plugin = zentest::Prepared("Meter", {}, 2);
    for (const char* name : {"Momentary", "Integrated", "Max Short-Term"}) EXPECT_EQ(plugin.Meter(name), -120.0f);
    zentest::Channels x = Tone(2, {0, 1}, 3.5);
    plugin.Process(x, 512);
    // EBU Tech 3341 case 1: -23 dBFS on both channels reads -23 LUFS.
    for (const char* name : {"Momentary", "Short-Term", "Integrated", "Max Momentary", "Max Short-Term"})
        EXPECT_NEAR(plugin.Meter(name), -23.0, 0.05) << name;
    EXPECT_NEAR(plugin.Meter("Loudness Range"), 0.0, 0.1);
    for (const char* name : {"True Peak 1", "Sample Peak 2", "Max True Peak"})
        EXPECT_NEAR(plugin.Meter(name), -23.0, 0.1) << name;
    // A sine's RMS lies 3.01 dB below its peak.
    for (const char* name : {"RMS 1", "Average RMS 2"}) EXPECT_NEAR(plugin.Meter(name), -26.01, 0.02) << name;
    EXPECT_EQ(plugin.Meter("Invalid Samples"), 0.0f);

    // One history record per 100 ms, the last one the readings now.
    const std::vector<float> last = zentest::LastRingRecord(plugin.Audio(), "Loudness History");
    ASSERT_EQ(last.size(), 3u);
    EXPECT_EQ(last[0], plugin.Meter("Momentary"));
    EXPECT_EQ(last[2], plugin.Meter("Integrated"));
}

TEST(ZenMeter, WeighsSurroundsAndLeavesOutTheLfeOfTheLayoutOrTheChosenChannel) {
    auto integrated = [](float lfeChoice, std::uint32_t channels, std::vector<std::uint32_t> toned) {
        PluginHarness plugin = zentest::Prepared("Meter", {{"LFE Channel", lfeChoice}}, channels);
        zentest::Channels x = Tone(channels, toned, 1.0);
        plugin.Process(x, 512);
        return plugin.Meter("Integrated");
    };
    constexpr float kAuto = 0.0f, kNone = 1.0f, kChannel1 = 2.0f;
    const float front = integrated(kAuto, 6, {0});
    EXPECT_NEAR(front, -26.0, 0.1);  // one channel at -23 dBFS
    // 5.1: the LFE is the fourth channel unless the choice says otherwise.
    EXPECT_EQ(integrated(kAuto, 6, {3}), -120.0f);
    EXPECT_NEAR(integrated(kNone, 6, {3}), front, 0.01);
    EXPECT_NEAR(integrated(kChannel1, 6, {3}), front, 0.01);
    EXPECT_EQ(integrated(kChannel1, 6, {0}), -120.0f);
    // Surrounds count 1.5 dB louder (a weight of 1.41), in 5.1 and 7.1.
    EXPECT_NEAR(integrated(kAuto, 6, {4}) - front, 10.0 * std::log10(1.41), 0.01);
    EXPECT_NEAR(integrated(kAuto, 8, {7}) - front, 10.0 * std::log10(1.41), 0.01);
    // Stereo has no LFE: "Auto" counts both channels.
    EXPECT_NEAR(integrated(kAuto, 2, {1}), front, 0.01);
}

TEST(ZenMeter, ResetClearsOnItsRiseAndTruePeakCanBeTurnedOff) {
    PluginHarness plugin = zentest::Prepared("Meter", {}, 2);
    zentest::Channels x = Tone(2, {0, 1}, 1.0);
    plugin.Process(x, 512);
    plugin.Set("Reset", 1.0f);
    zentest::Channels quiet = Tone(2, {}, 0.01);
    plugin.Process(quiet, 512);
    for (const char* name : {"Integrated", "Max Momentary"}) EXPECT_EQ(plugin.Meter(name), -120.0f) << name;
    EXPECT_EQ(plugin.Meter("True Peak 1"), -120.0f);
    // Held On: nothing more is cleared until it rises again.
    x = Tone(2, {0, 1}, 1.0);
    plugin.Process(x, 512);
    plugin.Set("Reset", 1.0f);
    plugin.Process(quiet, 512);
    EXPECT_NEAR(plugin.Meter("Max Momentary"), -23.0, 0.05);
    plugin.Set("Reset", 0.0f);
    plugin.Process(quiet, 512);
    plugin.Set("Reset", 1.0f);
    plugin.Process(quiet, 512);
    EXPECT_EQ(plugin.Meter("Max Momentary"), -120.0f);

    // 12 kHz at 45 degrees: the samples lie 3 dB below the true peak of -1 dBTP.
    std::vector<float> tone(24000);
    for (std::size_t n = 0; n < tone.size(); ++n) {
        // Faded in: a sudden start overshoots between the samples.
        const double fade = n < 480 ? 0.5 - 0.5 * std::cos(M_PI * n / 480.0) : 1.0;
        tone[n] = static_cast<float>(fade * std::pow(10.0, -1.0 / 20.0) *
                                     std::sin(2.0 * M_PI * 12000.0 * n / kRate + M_PI / 4.0));
    }
    PluginHarness on = zentest::Prepared("Meter", {}, 1);
    on.Run(tone, 1, 512);
    EXPECT_NEAR(on.Meter("True Peak 1"), -1.0, 0.1);
    EXPECT_NEAR(on.Meter("Sample Peak 1"), -4.01, 0.02);
    PluginHarness off = zentest::Prepared("Meter", {{"True Peak", 0.0f}}, 1);
    off.Run(tone, 1, 512);
    EXPECT_EQ(off.Meter("True Peak 1"), off.Meter("Sample Peak 1"));
}

TEST(ZenMeter, CountsNonFiniteSamplesAsSilenceWithoutLosingTheMeasurement) {
    PluginHarness plugin = zentest::Prepared("Meter", {}, 2);
    zentest::Channels x = Tone(2, {0, 1}, 3.0);
    const float bad[] = {std::numeric_limits<float>::quiet_NaN(), std::numeric_limits<float>::infinity(),
                         -std::numeric_limits<float>::infinity()};
    for (std::size_t k = 0; k < 3; ++k) x[k % 2][1000 + 20000 * k] = bad[k];
    plugin.Process(x, 512);
    EXPECT_EQ(plugin.Meter("Invalid Samples"), 3.0f);
    EXPECT_NEAR(plugin.Meter("Integrated"), -23.0, 0.05);
    EXPECT_NEAR(plugin.Meter("Sample Peak 1"), -23.0, 0.01);
}

TEST(ZenMeter, PassesAudioUntouchedAndReadsTheSameForAnyBlockSplit) {
    for (std::uint32_t channels : {1u, 2u, 6u}) zentest::ExpectTransparentAndSplitInvariant("Meter", channels);
    zentest::ExpectTransparentAndSplitInvariant("Meter", 2, {{"True Peak", 0.0f}});
}
