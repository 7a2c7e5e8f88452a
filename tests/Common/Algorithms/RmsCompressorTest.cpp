// RmsCompressor: the quarter-sine soft knee and ratio line on steady RMS
// levels, automatic makeup, envelope times, and the channel limit.
#include <gtest/gtest.h>

#include <cmath>

#include "Common/Algorithms/RmsCompressor.h"
#include "Support/Signals.h"

namespace {

constexpr float kRate = 48000.0f;

std::unique_ptr<RmsCompressor> Make(std::initializer_list<std::pair<RmsCompressor::Parameter, float>> settings,
                                    std::uint64_t channels = 1) {
    auto c = std::make_unique<RmsCompressor>();
    c->SetChannelCount(channels);
    c->Prepare(kRate, 512);
    for (const auto& [index, value] : settings) c->SetParameter(index, value);
    c->Reset();
    return c;
}

// Output RMS in dB for a steady 1 kHz sine of `rmsDb` RMS.
double SteadyOutputDb(RmsCompressor& c, double rmsDb) {
    std::vector<float> x = zentest::Sine(1000.0, kRate, 48000, std::sqrt(2.0) * std::pow(10.0, rmsDb / 20.0));
    float* channels[] = {x.data()};
    c.Process(channels, x.size());
    return zentest::ToDb(zentest::Rms(x, 38400));
}

// The law written out: unity below the knee, the ratio line above it, and
// between them a quarter sine from (L, L) to (U, ratio line at U), in dB.
double Law(double in, double threshold, double ratio, double knee) {
    const double lower = threshold - knee, upper = threshold + knee;
    if (in <= lower) return in;
    if (in >= upper) return threshold + (in - threshold) / ratio;
    const double angle = std::acos(1.0 / ratio);
    const double rise = (threshold + knee / ratio) - lower;  // ratio line at U, above L
    return lower + rise * std::sin(angle * (in - lower) / (upper - lower)) / std::sin(angle);
}

}  // namespace

TEST(RmsCompressor, StaticCurveHasAQuarterSineKneeBetweenUnityAndTheRatioLine) {
    for (const auto& [ratio, knee] : {std::pair{4.0f, 6.0f}, {2.0f, 15.0f}, {8.0f, 0.0f}}) {
        double previous = -1e9;
        for (double level = -45.0; level <= -2.0; level += 1.5) {
            auto c = Make({{RmsCompressor::kThreshold, -20.0f}, {RmsCompressor::kRatio, ratio},
                           {RmsCompressor::kKnee, knee}});
            const double out = SteadyOutputDb(*c, level);
            EXPECT_NEAR(out, Law(level, -20.0, ratio, knee), 0.1) << "ratio " << ratio << " knee " << knee << " at "
                                                                   << level << " dB";
            EXPECT_GT(out, previous);  // more in, more out
            previous = out;
        }
    }
    // 50 dB of reduction at most: 20:1, 50 dB threshold and an impossible +20 dB RMS.
    auto c = Make({{RmsCompressor::kThreshold, -50.0f}, {RmsCompressor::kRatio, 20.0f}, {RmsCompressor::kKnee, 0.0f}});
    EXPECT_NEAR(SteadyOutputDb(*c, 20.0), -30.0, 0.1);
    EXPECT_NEAR(c->GetMeter(RmsCompressor::kGainReductionMeter), -50.0f, 0.01f);
}

TEST(RmsCompressor, MakeupAndAutomaticMakeup) {
    auto manual = Make({{RmsCompressor::kMakeup, 4.5f}});
    EXPECT_NEAR(SteadyOutputDb(*manual, -40.0), -35.5, 0.05);
    // Automatic: a signal at the reference level comes out at that level.
    auto automatic = Make({{RmsCompressor::kThreshold, -30.0f}, {RmsCompressor::kRatio, 4.0f},
                           {RmsCompressor::kKnee, 0.0f}, {RmsCompressor::kAutoMakeup, 1.0f},
                           {RmsCompressor::kMakeupReference, -10.0f}, {RmsCompressor::kMakeup, 20.0f}});
    EXPECT_NEAR(automatic->GetMakeup() * 20.0f, 15.0f, 1e-4f);
    EXPECT_NEAR(SteadyOutputDb(*automatic, -10.0), -10.0, 0.1);
    // A reference below the threshold needs none.
    auto none = Make({{RmsCompressor::kThreshold, -10.0f}, {RmsCompressor::kAutoMakeup, 1.0f},
                      {RmsCompressor::kMakeupReference, -20.0f}});
    EXPECT_EQ(none->GetMakeup(), 0.0f);
    EXPECT_NEAR(SteadyOutputDb(*none, -40.0), -40.0, 0.01);
}

TEST(RmsCompressor, AttackAndReleaseTimesFromLevelSteps) {
    // A near-instant RMS, a hard knee at -30 dB and 2:1: 30 dB of level change
    // moves the gain by 15 dB with the envelope's time constants.
    const float attack = 20.0f, release = 200.0f;
    auto c = Make({{RmsCompressor::kRmsSpeed, 0.1f}, {RmsCompressor::kThreshold, -30.0f},
                   {RmsCompressor::kKnee, 0.0f}, {RmsCompressor::kAttack, attack},
                   {RmsCompressor::kRelease, release}});
    const std::size_t up = 4800, down = 28800;
    std::vector<float> in(48000 * 2);
    for (std::size_t n = 0; n < in.size(); ++n) in[n] = (n % 2 ? 1.0f : -1.0f) * (n >= up && n < down ? 1.0f : 0.0316f);
    std::vector<float> out = in;
    float* channels[] = {out.data()};
    c->Process(channels, out.size());
    auto gainDb = [&](std::size_t n) { return zentest::ToDb(std::fabs(out[n] / in[n])); };
    std::size_t n = up;
    while (gainDb(n) > -15.0 * (1.0 - std::exp(-1.0))) ++n;
    EXPECT_NEAR(static_cast<double>(n - up), attack * 48.0, attack * 48.0 * 0.01 + 5.0);
    n = down;
    while (gainDb(n) < -15.0 * std::exp(-1.0)) ++n;
    EXPECT_NEAR(static_cast<double>(n - down), release * 48.0, release * 48.0 * 0.01 + 5.0);
}

TEST(RmsCompressor, LinksUpTo31ChannelsAndRefusesMore) {
    auto c = Make({{RmsCompressor::kThreshold, -20.0f}, {RmsCompressor::kRatio, 4.0f}, {RmsCompressor::kKnee, 0.0f}},
                  31);
    std::vector<std::vector<float>> buffers(32, std::vector<float>(24000, 0.001f));
    buffers[30] = zentest::Sine(1000.0, kRate, 24000, std::sqrt(2.0));  // 0 dB RMS on the last channel
    std::vector<float*> channels;
    for (auto& b : buffers) channels.push_back(b.data());
    ASSERT_TRUE(c->Process(channels.data(), 24000));
    EXPECT_NEAR(zentest::ToDb(buffers[0].back() / 0.001), -15.0, 0.1);  // follows the loud channel

    c->SetChannelCount(32);
    const std::vector<float> before = buffers[0];
    EXPECT_FALSE(c->Process(channels.data(), 24000));
    EXPECT_EQ(buffers[0], before);
}
