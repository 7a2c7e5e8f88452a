// "Phase Meter" through the host interface: correlation, balance, mid and
// side for signals whose image is known, the goniometer's points, and that
// it measures without touching the audio.
#include <gtest/gtest.h>

#include <cmath>

#include "Support/AnalyserChecks.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"

using zentest::PluginHarness;

namespace {

struct Image {
    float correlation, overall, balance, mid, side;
};

Image Measure(const std::vector<float>& left, const std::vector<float>& right) {
    PluginHarness plugin = zentest::Prepared("Phase Meter", {}, 2);
    zentest::Channels x = {left, right};
    plugin.Process(x, 512);
    return {plugin.Meter("Correlation"), plugin.Meter("Overall Correlation"), plugin.Meter("Balance"),
            plugin.Meter("Mid"), plugin.Meter("Side")};
}

std::vector<float> Scaled(std::vector<float> x, float gain) {
    for (float& v : x) v *= gain;
    return x;
}

}  // namespace

TEST(ZenPhaseMeter, ReadsTheImageOfKnownPairs) {
    const std::vector<float> tone = zentest::Sine(440.0, 48000.0, 144000, 0.5);  // ten times "Time"
    const std::vector<float> silence(tone.size(), 0.0f);

    const Image mono = Measure(tone, tone);
    EXPECT_NEAR(mono.correlation, 1.0, 1e-4);
    EXPECT_NEAR(mono.overall, 1.0, 1e-4);
    EXPECT_NEAR(mono.balance, 0.0, 1e-4);
    EXPECT_NEAR(mono.mid, zentest::ToDb(0.5 / std::sqrt(2.0)), 0.05);  // the RMS of (L + R) / 2
    EXPECT_EQ(mono.side, -120.0f);

    const Image inverted = Measure(tone, Scaled(tone, -1.0f));
    EXPECT_NEAR(inverted.correlation, -1.0, 1e-4);
    EXPECT_EQ(inverted.mid, -120.0f);

    const Image unrelated = Measure(zentest::Noise(144000, 0.5, 1), zentest::Noise(144000, 0.5, 2));
    EXPECT_NEAR(unrelated.overall, 0.0, 0.03);

    const Image left = Measure(tone, silence);
    EXPECT_NEAR(left.balance, -1.0, 1e-4);
    EXPECT_EQ(left.correlation, 0.0f);  // nothing to correlate with
    // Right 6 dB down: balance by power, (1/4 - 1) / (1/4 + 1).
    EXPECT_NEAR(Measure(tone, Scaled(tone, 0.5f)).balance, -0.6, 1e-3);
}

TEST(ZenPhaseMeter, CorrelationFollowsTheTime) {
    // Correlated, then opposite: the reading crosses zero after a time in proportion to "Time".
    const std::vector<float> noise = zentest::Noise(48000, 0.5, 3);
    std::vector<float> right = noise;
    for (std::size_t n = 24000; n < right.size(); ++n) right[n] = -right[n];
    auto crossing = [&](float ms) {
        PluginHarness plugin = zentest::Prepared("Phase Meter", {{"Time", ms}}, 2);
        for (std::size_t at = 0; at < noise.size(); at += 48) {
            zentest::Channels x = {std::vector<float>(noise.begin() + at, noise.begin() + at + 48),
                                   std::vector<float>(right.begin() + at, right.begin() + at + 48)};
            plugin.Process(x);
            if (at >= 24000 && plugin.Meter("Correlation") < 0.0f) return (at + 48 - 24000) / 48.0;
        }
        return 1e9;
    };
    // Products averaged over T: they cancel after about T ln 2.
    EXPECT_NEAR(crossing(20.0f), 20.0 * std::log(2.0), 3.0);
    EXPECT_NEAR(crossing(200.0f), 200.0 * std::log(2.0), 15.0);
}

TEST(ZenPhaseMeter, GoniometerPointsAreTheSamplesTurnedBy45Degrees) {
    for (float rate : {48000.0f, 96000.0f}) {
        PluginHarness plugin = zentest::Prepared("Phase Meter", {}, 2, rate);
        zentest::Channels x = {zentest::Noise(1000, 0.5, 4), zentest::Noise(1000, 0.5, 5)};
        const zentest::Channels in = x;
        plugin.Process(x, 100);
        zen::MeterInfo info;
        const std::uint32_t index = plugin.Audio().GetMeterCount() - 1;
        ASSERT_TRUE(plugin.Audio().GetMeterInfo(index, info));
        ASSERT_EQ(info.size, 2u);
        std::vector<float> points(2 * info.capacity);
        std::uint64_t cursor = 0;
        const zen::MeterRingRead read = plugin.Audio().ReadMeterRing(index, cursor, points.data(), info.capacity);
        const std::size_t step = rate > 48000.0f ? 2 : 1;  // at most 48000 points a second
        ASSERT_EQ(read.records, 1000 / step) << rate;
        for (std::size_t p = 0; p < read.records; ++p) {
            const float l = in[0][p * step], r = in[1][p * step];
            EXPECT_NEAR(points[2 * p], (r - l) / std::sqrt(2.0f), 1e-6) << p;
            EXPECT_NEAR(points[2 * p + 1], (l + r) / std::sqrt(2.0f), 1e-6) << p;
        }
    }
}

TEST(ZenPhaseMeter, TakesStereoOnlyAndPassesAudioUntouched) {
    PluginHarness plugin("Phase Meter");
    EXPECT_FALSE(plugin.Audio().ConfigureChannels(1, 1));
    EXPECT_FALSE(plugin.Audio().ConfigureChannels(2, 1));
    zentest::ExpectTransparentAndSplitInvariant("Phase Meter", 2);
    zentest::ExpectTransparentAndSplitInvariant("Phase Meter", 2, {{"Time", 10.0f}}, 5000);
}
