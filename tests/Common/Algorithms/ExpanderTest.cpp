// Expander: its law down to the floor set by the range, and attack, hold and
// release from level steps.
#include <gtest/gtest.h>

#include <cmath>

#include "Common/Algorithms/Expander.h"
#include "Support/Dynamics.h"
#include "Support/Signals.h"

namespace {

std::unique_ptr<Expander> Make(float threshold, float ratio, float range, float attack = 0.1f, float hold = 1.4f,
                               float release = 4000.0f) {
    auto e = std::make_unique<Expander>();
    e->SetChannelCount(1);
    e->Prepare(48000.0f, 512);
    for (const auto& [index, value] : {std::pair{Expander::kThreshold, threshold}, {Expander::kRatio, ratio},
                                       {Expander::kRange, range}, {Expander::kAttack, attack},
                                       {Expander::kHold, hold}, {Expander::kRelease, release}})
        e->SetParameter(index, value);
    e->Reset();
    return e;
}

// Gain (dB) on a steady 1 kHz sine at `levelDb` peak, once settled.
double SteadyGainDb(Expander& e, double levelDb) {
    const double amplitude = std::pow(10.0, levelDb / 20.0);
    std::vector<float> x = zentest::Sine(1000.0, 48000.0, 24000, amplitude);
    float* channels[] = {x.data()};
    e.Process(channels, x.size());
    return zentest::ToDb(zentest::Peak(x, 19200) / amplitude);
}

}  // namespace

TEST(Expander, StaticCurveFallsByTheRatioDownToTheRange) {
    // Threshold -30 dB, ratio 2, range 20 dB: the floor sits at -40 dB.
    for (const auto& [level, expected] : {std::pair{-10.0, 0.0}, {-30.0, 0.0}, {-35.0, -10.0}, {-39.0, -18.0},
                                         {-45.0, -20.0}, {-70.0, -20.0}}) {
        auto e = Make(-30.0f, 2.0f, 20.0f);
        EXPECT_NEAR(SteadyGainDb(*e, level), expected, 0.1) << level << " dB in";
        EXPECT_NEAR(e->GetMeter(Expander::kGainMeter), expected, 0.1) << level;
    }
    for (double level : {-60.0, -20.0}) {
        EXPECT_NEAR(SteadyGainDb(*Make(-30.0f, 4.0f, 0.0f), level), 0.0, 1e-4) << level;  // no range: a wire
        EXPECT_EQ(SteadyGainDb(*Make(-30.0f, 0.5f, 20.0f), level), SteadyGainDb(*Make(-30.0f, 1.0f, 20.0f), level));
    }
}

TEST(Expander, AttackHoldAndReleaseTimesFromLevelSteps) {
    // Threshold -40 dB, ratio 1, range 50 dB: floor at -90 dB. Silence, -20 dB,
    // then -120 dB, quiet enough to close fully yet still carry a gain to read.
    const float attack = 5.0f, hold = 40.0f, release = 100.0f;
    auto e = Make(-40.0f, 1.0f, 50.0f, attack, hold, release);
    const std::size_t up = 4800, down = 24000;
    std::vector<float> in = zentest::LevelSteps(48000, {{0, -200.0}, {up, -20.0}, {down, -120.0}}), out = in;
    for (std::size_t done = 0; done < out.size(); done += 128) {  // the hold spans 15 blocks
        float* channels[] = {out.data() + done};
        e->Process(channels, 128);
    }
    // Opening from the floor toward -20 dB: 63.2 % of the way (-45.8 dB) lies below
    // the threshold, so the attack shows in full, at a gain of -5.8 dB.
    EXPECT_NEAR(zentest::TimeConstantFrames(out, in, up, -50.0, -50.0 + 70.0), attack * 48.0, 1.0);
    EXPECT_NEAR(zentest::GainDb(out, in, down - 1), 0.0, 1e-4);
    EXPECT_NEAR(zentest::GainDb(out, in, down + static_cast<std::size_t>(hold * 48.0) - 1), 0.0, 1e-4);
    EXPECT_NEAR(zentest::TimeConstantFrames(out, in, down, 0.0, -50.0), (hold + release) * 48.0, 2.0);
}
