// "Delay" through the host interface: times to the sample at every rate
// (free, synced, linked), repeats that decay by the feedback and never blow
// up, ping-pong's sides, glides without clicks, bad input and the tail.
#include <gtest/gtest.h>

#include <cmath>

#include "Plugins/ZenStereoDelay/ZenStereoDelay.h"
#include "Support/Modulation.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"

using zentest::PluginHarness;

namespace {

const char* kName = "Delay";

// Wet only, no repeats, cuts wide open.
const std::vector<std::pair<std::string, float>> kEchoOnly = {
    {"Mix", 100.0f}, {"Feedback", 0.0f}, {"Low Cut", 20.0f}, {"High Cut", 20000.0f}};

std::vector<std::pair<std::string, float>> With(std::vector<std::pair<std::string, float>> settings,
                                                const std::vector<std::pair<std::string, float>>& more) {
    settings.insert(settings.end(), more.begin(), more.end());
    return settings;
}

// Level in dB at 1 kHz of the 10 ms of an impulse response around `at`.
double RepeatDb(const std::vector<float>& h, std::size_t at) {
    return zentest::MagnitudeDb(std::vector<float>(h.begin() + long(at) - 240, h.begin() + long(at) + 240), 1000.0,
                                48000.0);
}

}  // namespace

TEST(ZenStereoDelay, TheImpulseArrivesAtTheSetTimeAtEveryRate) {
    for (float rate : {44100.0f, 48000.0f, 88200.0f, 96000.0f, 176400.0f, 192000.0f})
        for (float ms : {10.0f, 12.34f, 375.0f, 1999.99f}) {
            PluginHarness plugin = zentest::Prepared(kName, With(kEchoOnly, {{"Time L", ms}}), 1, rate);
            const double samples = double{ms} * rate / 1000.0;
            const std::vector<float> h =
                plugin.Run(zentest::Impulse(static_cast<std::size_t>(samples) + 256), 1, 512)[0];
            if (samples == std::floor(samples)) {
                EXPECT_EQ(zentest::ArgPeak(h), static_cast<std::size_t>(samples)) << ms << " ms at " << rate;
                EXPECT_EQ(h[static_cast<std::size_t>(samples)], 1.0f);
                EXPECT_EQ(zentest::Peak(h, static_cast<std::size_t>(samples) + 1), 0.0f);
            } else {
                EXPECT_NEAR(zentest::PhaseDelay(h, 100.0, rate), samples, 1e-3) << ms << " ms at " << rate;
            }
        }
    // Synced to a dotted eighth at 100 BPM (450 ms) on the left, linked right.
    PluginHarness plugin = zentest::Prepared(
        kName, With(kEchoOnly, {{"Sync L", 8.0f}, {"Tempo", 100.0f}, {"Link", 1.0f}, {"Time R", 20.0f}}), 2);
    const zentest::Channels out = plugin.Run(zentest::Impulse(24000), 2, 512);
    EXPECT_EQ(zentest::ArgPeak(out[0]), 21600u);
    EXPECT_EQ(zentest::ArgPeak(out[1]), 21600u);
    EXPECT_DOUBLE_EQ(ZenStereoDelay::SideTimeMs(100.0f, 16.0f, 40.0f), ZenStereoDelay::kMaxTimeMs);
}

TEST(ZenStereoDelay, RepeatsFallByTheFeedbackAndFullFeedbackStaysBounded) {
    PluginHarness half = zentest::Prepared(kName, With(kEchoOnly, {{"Time L", 10.0f}, {"Feedback", 50.0f}}), 1);
    const std::vector<float> h = half.Run(zentest::Impulse(4800), 1, 512)[0];
    // Each repeat's level at 1 kHz, where the wide-open cuts are flat.
    for (std::size_t k = 1; k < 8; ++k)
        EXPECT_NEAR(RepeatDb(h, k * 480), -6.02 * static_cast<double>(k - 1), 0.1) << "repeat " << k;

    // 99 %: slow, but down and never up.
    PluginHarness slow = zentest::Prepared(kName, With(kEchoOnly, {{"Time L", 5.0f}, {"Feedback", 99.0f}}), 1);
    const std::vector<float> g = slow.Run(zentest::Impulse(48000), 1, 512)[0];
    EXPECT_LT(zentest::Peak(g, 40000), 0.5f * zentest::Peak(g, 200, 1000));

    // 100 % on full-scale noise: the limiter holds the loop.
    PluginHarness full = zentest::Prepared(kName, {{"Feedback", 100.0f}, {"Time L", 3.0f}, {"Mix", 100.0f}}, 2);
    const zentest::Channels out = full.Run(zentest::Noise(48000, 1.0, 4), 2, 512);
    EXPECT_LE(zentest::Peak(out[0]), 1.0f + FeedbackPath::kCeiling);
    EXPECT_EQ(full.Audio().GetTailLength(), 30u * 48000u);
}

TEST(ZenStereoDelay, PingPongAlternatesTheSides) {
    PluginHarness plugin = zentest::Prepared(
        kName, With(kEchoOnly, {{"Ping-Pong", 1.0f}, {"Feedback", 50.0f}, {"Time L", 10.0f}, {"Time R", 20.0f}}), 2);
    zentest::Channels io = {zentest::Impulse(4000), std::vector<float>(4000, 0.0f)};
    plugin.Process(io, 512);
    // Left at 10 ms (the two inputs' mean), right 20 ms later, left 10 ms after that.
    EXPECT_NEAR(io[0][480], 0.5f, 1e-6f);
    EXPECT_NEAR(RepeatDb(io[1], 1440), -12.04, 0.1);
    EXPECT_NEAR(RepeatDb(io[0], 1920), -18.06, 0.1);
    EXPECT_LT(zentest::Peak(io[1], 0, 1400), 1e-6f);
    EXPECT_LT(zentest::Peak(io[0], 500, 1900), 1e-3f);
}

TEST(ZenStereoDelay, ATimeChangeGlidesWithoutAClickTheSameInAnyBlockSplit) {
    const std::vector<float> sine = zentest::Sine(200.0, 48000.0, 48000, 0.5);
    auto run = [&](std::size_t block, float to) {
        PluginHarness plugin = zentest::Prepared(kName, With(kEchoOnly, {{"Time L", 300.0f}}), 1);
        zentest::Channels head = {std::vector<float>(sine.begin(), sine.begin() + 24000)};
        plugin.Process(head, block);
        plugin.Set("Time L", to);
        zentest::Channels tail = {std::vector<float>(sine.begin() + 24000, sine.end())};
        plugin.Process(tail, block);
        head[0].insert(head[0].end(), tail[0].begin(), tail[0].end());
        return head[0];
    };
    const std::vector<float> whole = run(512, 310.0f);
    EXPECT_EQ(run(1, 310.0f), whole);
    EXPECT_EQ(run(333, 310.0f), whole);
    const float steady = zentest::LargestSecondDifference(whole, 15000, 24000);
    EXPECT_LT(zentest::LargestSecondDifference(whole, 24000), 1.25f * steady);
    // A long jump bends the pitch a long way, but nothing jumps.
    const std::vector<float> far = run(512, 1000.0f);
    EXPECT_LT(zentest::LargestStep(far), 0.5f);
}

TEST(ZenStereoDelay, BadSamplesLeaveTheLoopWithinABlockAndHugeInputStaysFinite) {
    for (float bad : {NAN, INFINITY, -INFINITY}) {
        std::vector<float> in = zentest::Noise(24000, 0.5, 2);
        in[1000] = bad;
        PluginHarness plugin = zentest::Prepared(kName, {{"Feedback", 90.0f}, {"Time L", 5.0f}}, 1);
        const std::vector<float> out = plugin.Run(in, 1, 512)[0];
        for (std::size_t n = 1001; n < out.size(); ++n) ASSERT_TRUE(std::isfinite(out[n])) << bad << " at " << n;
    }
    std::vector<float> huge(4000, 3e38f);
    for (std::size_t n = 1; n < huge.size(); n += 2) huge[n] = -3e38f;
    PluginHarness plugin = zentest::Prepared(kName, {{"Feedback", 100.0f}, {"Time L", 1.0f}}, 2);
    const zentest::Channels out = plugin.Run(huge, 2, 512);
    for (const auto& channel : out)
        for (float y : channel) ASSERT_TRUE(std::isfinite(y));
}

TEST(ZenStereoDelay, NeutralPassesTheInputAndTheTailCoversTheRepeats) {
    PluginHarness plugin(kName);
    ASSERT_TRUE(plugin.Audio().ApplyNeutralSetting());
    plugin.Prepare(2);
    const std::vector<float> noise = zentest::Noise(4096, 0.5, 3);
    const zentest::Channels out = plugin.Run(noise, 2, 512);
    EXPECT_EQ(out[0], noise);
    EXPECT_EQ(out[1], noise);
    EXPECT_EQ(plugin.Audio().GetLatency(), 0u);

    // 25 % feedback and 100 ms: 12 dB a repeat, 10 repeats to -110 dB, plus the low cut's ringing.
    PluginHarness tail = zentest::Prepared(kName, {{"Feedback", 25.0f}, {"Time L", 100.0f}, {"Time R", 50.0f}}, 2);
    const double ringing = 110.0 * std::log(10.0) / 20.0 * std::sqrt(2.0) / (2.0 * zentest::kPi * 80.0);
    EXPECT_EQ(tail.Audio().GetTailLength(), static_cast<std::uint32_t>(std::ceil((1.0 + ringing) * 48000.0)));
}
