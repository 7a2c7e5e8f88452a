// Compressor: the hard-knee law with makeup and limit, envelope times from
// level steps, linked and sidechain detection, and the layouts it refuses.
#include <gtest/gtest.h>

#include <cmath>

#include "Common/Algorithms/Compressor.h"
#include "Support/Dynamics.h"
#include "Support/Signals.h"

namespace {

using Settings = std::vector<std::pair<Compressor::Parameter, float>>;

// Threshold -20 dB, 4:1, fast attack, slow release, then `settings`.
std::unique_ptr<Compressor> Make(const Settings& settings, std::uint64_t channels = 1, float rate = 48000.0f) {
    auto c = std::make_unique<Compressor>();
    c->SetChannelCount(channels);
    c->Prepare(rate, 256);
    for (const auto& [index, value] : Settings{{Compressor::kThreshold, -20.0f}, {Compressor::kRatio, 4.0f},
                                               {Compressor::kAttack, 0.1f}, {Compressor::kRelease, 4000.0f}})
        c->SetParameter(index, value);
    for (const auto& [index, value] : settings) c->SetParameter(index, value);
    c->Reset();
    return c;
}

// Output peak (dBFS) of a steady 1 kHz sine at `levelDb` peak.
double SteadyOutputDb(const Settings& settings, double levelDb) {
    std::vector<float> x = zentest::Sine(1000.0, 48000.0, 24000, std::pow(10.0, levelDb / 20.0));
    float* channels[] = {x.data()};
    Make(settings)->Process(channels, x.size());
    return zentest::ToDb(zentest::Peak(x, 19200));
}

}  // namespace

TEST(Compressor, StaticCurveFollowsTheHardKneeWithMakeupAndLimit) {
    for (double level : {-45.0, -20.0, -12.0, 0.0})
        EXPECT_NEAR(SteadyOutputDb({{Compressor::kMakeup, 3.0f}}, level),
                    (level <= -20.0 ? level : -20.0 + (level + 20.0) / 4.0) + 3.0, 0.05) << level << " dB in";
    // 20 dB over the threshold wants 15 dB of reduction: a 6 dB limit holds it there.
    EXPECT_NEAR(SteadyOutputDb({{Compressor::kGrLimit, 6.0f}}, 0.0), -6.0, 0.05);
    EXPECT_NEAR(SteadyOutputDb({{Compressor::kGrLimit, 6.0f}}, -16.0), -19.0, 0.05);
    EXPECT_NEAR(SteadyOutputDb({{Compressor::kGrLimit, 0.0f}}, 0.0), 0.0, 0.01);
    EXPECT_NEAR(SteadyOutputDb({{Compressor::kRatio, 20.0f}}, 0.0), -19.0, 0.05);  // slope 0.95
}

TEST(Compressor, AttackHoldAndReleaseTimesFromLevelSteps) {
    for (float rate : {48000.0f, 96000.0f})
        for (const auto& [attack, hold, release] : {std::tuple{1.4f, 0.0f, 150.0f}, {10.0f, 30.0f, 60.0f}}) {
            auto c = Make({{Compressor::kAttack, attack}, {Compressor::kHold, hold}, {Compressor::kRelease, release}},
                          1, rate);
            const auto up = static_cast<std::size_t>(0.05 * rate), down = static_cast<std::size_t>(0.5 * rate);
            const std::vector<float> in = zentest::LevelSteps(static_cast<std::size_t>(1.2 * rate),
                                                              {{0, -40.0}, {up, 0.0}, {down, -40.0}});
            std::vector<float> out = in;
            for (std::size_t done = 0; done < out.size(); done += 256) {  // the 30 ms hold spans blocks
                float* channels[] = {out.data() + done};
                c->Process(channels, std::min<std::size_t>(256, out.size() - done));
            }
            const double perMs = rate / 1000.0, reduced = -15.0;  // 20 dB over 4:1
            EXPECT_NEAR(zentest::TimeConstantFrames(out, in, up, 0.0, reduced), attack * perMs, 1.0) << rate;
            EXPECT_NEAR(zentest::GainDb(out, in, down + static_cast<std::size_t>(hold * perMs) - 1), reduced, 0.01);
            EXPECT_NEAR(zentest::TimeConstantFrames(out, in, down, reduced, 0.0), (hold + release) * perMs, 2.0)
                << rate << " hold " << hold;
        }
}

TEST(Compressor, DetectionIsLinkedOrFromTheSidechainAndOtherLayoutsAreRefused) {
    const std::vector<float> loud = zentest::Sine(1000.0, 48000.0, 9600), quiet(9600, 0.01f);
    std::vector<float> a = loud, b = quiet;
    float* stereo[] = {a.data(), b.data()};
    auto linked = Make({}, 2);
    ASSERT_TRUE(linked->Process(stereo, 9600));
    EXPECT_NEAR(zentest::ToDb(b.back() / 0.01), -15.0, 0.05);  // the quiet side follows the loud one
    EXPECT_NEAR(linked->GetMeter(Compressor::kGainReductionMeter), -15.0f, 0.05f);

    auto side = Make({{Compressor::kSidechainOn, 1.0f}, {Compressor::kMakeup, 6.0f}});
    a = quiet, b = loud;
    ASSERT_TRUE(side->Process(stereo, 9600));  // main, then sidechain
    EXPECT_NEAR(zentest::ToDb(a.back() / 0.01), -9.0, 0.05);
    EXPECT_NEAR(side->GetMeter(Compressor::kGainMeter), -9.0f, 0.05f);
    EXPECT_EQ(b, loud);  // the sidechain is only listened to

    // Two mains take one or two sidechains, not none or three; a refusal touches nothing.
    auto two = Make({{Compressor::kSidechainOn, 1.0f}}, 2);
    float* five[] = {a.data(), a.data(), b.data(), b.data(), b.data()};
    const std::vector<float> before = a;
    for (std::uint64_t sidechains : {0u, 3u}) {
        two->SetSidechainChannelCount(sidechains);
        EXPECT_FALSE(two->Process(five, 9600)) << sidechains;
    }
    EXPECT_EQ(a, before);
    two->SetSidechainChannelCount(2);
    EXPECT_TRUE(two->Process(five, 9600));
}
