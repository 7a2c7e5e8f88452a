// RmsCompressor: the quarter-sine soft knee and ratio line on steady RMS
// levels, makeup, envelope times, and the channel limit.
#include <gtest/gtest.h>

#include <cmath>

#include "Common/Algorithms/RmsCompressor.h"
#include "Support/Dynamics.h"
#include "Support/Signals.h"

namespace {

using Settings = std::vector<std::pair<RmsCompressor::Parameter, float>>;

std::unique_ptr<RmsCompressor> Make(const Settings& settings, std::uint64_t channels = 1) {
    auto c = std::make_unique<RmsCompressor>();
    c->SetChannelCount(channels);
    c->Prepare(48000.0f, 512);
    for (const auto& [index, value] : settings) c->SetParameter(index, value);
    c->Reset();
    return c;
}

// Output RMS (dB) for a steady 1 kHz sine of `rmsDb` RMS.
double SteadyOutputDb(RmsCompressor& c, double rmsDb) {
    std::vector<float> x = zentest::Sine(1000.0, 48000.0, 24000, std::sqrt(2.0) * std::pow(10.0, rmsDb / 20.0));
    float* channels[] = {x.data()};
    c.Process(channels, x.size());
    return zentest::ToDb(zentest::Rms(x, 19200));
}

// The law in dB: unity below the knee, the ratio line above it, and between
// them a quarter sine from the unity line at T - K to the ratio line at T + K.
double Law(double in, double threshold, double ratio, double knee) {
    const double lower = threshold - knee;
    if (in <= lower) return in;
    if (in >= threshold + knee) return threshold + (in - threshold) / ratio;
    const double angle = std::acos(1.0 / ratio);
    return lower + (knee + knee / ratio) * std::sin(angle * (in - lower) / (2.0 * knee)) / std::sin(angle);
}

}  // namespace

TEST(RmsCompressor, StaticCurveHasAQuarterSineKneeBetweenUnityAndTheRatioLine) {
    for (const auto& [ratio, knee] : {std::pair{4.0f, 6.0f}, {2.0f, 15.0f}, {8.0f, 0.0f}})
        for (double level = -44.0; level <= -2.0; level += 3.0) {
            auto c = Make({{RmsCompressor::kThreshold, -20.0f}, {RmsCompressor::kRatio, ratio},
                           {RmsCompressor::kKnee, knee}});
            EXPECT_NEAR(SteadyOutputDb(*c, level), Law(level, -20.0, ratio, knee), 0.1)
                << "ratio " << ratio << " knee " << knee << " at " << level << " dB";
        }
    // Never more than 50 dB of reduction.
    auto c = Make({{RmsCompressor::kThreshold, -50.0f}, {RmsCompressor::kRatio, 20.0f}, {RmsCompressor::kKnee, 0.0f}});
    EXPECT_NEAR(SteadyOutputDb(*c, 20.0), -30.0, 0.1);
    EXPECT_NEAR(c->GetMeter(RmsCompressor::kGainReductionMeter), -50.0f, 0.01f);
}

TEST(RmsCompressor, MakeupAndAutomaticMakeup) {
    EXPECT_NEAR(SteadyOutputDb(*Make({{RmsCompressor::kMakeup, 4.5f}}), -40.0), -35.5, 0.05);
    // Automatic: a signal at the reference level comes out at that level.
    auto automatic = Make({{RmsCompressor::kThreshold, -30.0f}, {RmsCompressor::kRatio, 4.0f},
                           {RmsCompressor::kKnee, 0.0f}, {RmsCompressor::kAutoMakeup, 1.0f},
                           {RmsCompressor::kMakeupReference, -10.0f}, {RmsCompressor::kMakeup, 20.0f}});
    EXPECT_NEAR(SteadyOutputDb(*automatic, -10.0), -10.0, 0.1);
    // A reference below the threshold needs none.
    auto none = Make({{RmsCompressor::kThreshold, -10.0f}, {RmsCompressor::kAutoMakeup, 1.0f},
                      {RmsCompressor::kMakeupReference, -20.0f}});
    EXPECT_EQ(none->GetMakeup(), 0.0f);
}

TEST(RmsCompressor, RefusesMoreThan31Channels) {
    auto c = Make({}, 32);
    std::vector<float> x(64, 1.0f);
    std::vector<float*> channels(32, x.data());
    EXPECT_FALSE(c->Process(channels.data(), 64));
    EXPECT_EQ(x, std::vector<float>(64, 1.0f));
    c->SetChannelCount(31);
    EXPECT_TRUE(c->Process(channels.data(), 64));
}

TEST(RmsCompressor, AttackAndReleaseTimesFromLevelSteps) {
    // A near-instant RMS, a hard knee at -30 dB, 2:1: a 30 dB step moves the gain 15 dB.
    const float attack = 20.0f, release = 200.0f;
    auto c = Make({{RmsCompressor::kRmsSpeed, 0.1f}, {RmsCompressor::kThreshold, -30.0f}, {RmsCompressor::kKnee, 0.0f},
                   {RmsCompressor::kAttack, attack}, {RmsCompressor::kRelease, release}});
    const std::size_t up = 4800, down = 28800;
    const std::vector<float> in = zentest::LevelSteps(96000, {{0, -30.0}, {up, 0.0}, {down, -30.0}});
    std::vector<float> out = in;
    float* channels[] = {out.data()};
    c->Process(channels, out.size());
    // The RMS detector itself takes a few samples.
    EXPECT_NEAR(zentest::TimeConstantFrames(out, in, up, 0.0, -15.0), attack * 48.0, 0.01 * attack * 48.0 + 5.0);
    EXPECT_NEAR(zentest::TimeConstantFrames(out, in, down, -15.0, 0.0), release * 48.0, 0.01 * release * 48.0 + 5.0);
}
