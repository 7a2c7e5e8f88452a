// Expander: its law with floor and range, the envelope that never opens past
// the threshold, and attack, hold and release from level steps.
#include <gtest/gtest.h>

#include <cmath>

#include "Common/Algorithms/Expander.h"
#include "Support/Signals.h"

namespace {

constexpr float kRate = 48000.0f;

std::unique_ptr<Expander> Make(float threshold, float ratio, float range, float hold = 1.4f, float release = 4000.0f,
                               float attack = 0.1f) {
    auto e = std::make_unique<Expander>();
    e->SetChannelCount(1);
    e->Prepare(kRate, 512);
    e->SetParameter(Expander::kThreshold, threshold);
    e->SetParameter(Expander::kRatio, ratio);
    e->SetParameter(Expander::kRange, range);
    e->SetParameter(Expander::kAttack, attack);
    e->SetParameter(Expander::kHold, hold);
    e->SetParameter(Expander::kRelease, release);
    e->Reset();
    return e;
}

// Gain in dB applied to a steady 1 kHz sine at `levelDb` peak, once settled.
double SteadyGainDb(Expander& e, double levelDb) {
    const double amplitude = std::pow(10.0, levelDb / 20.0);
    std::vector<float> x = zentest::Sine(1000.0, kRate, 24000, amplitude);
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
        auto open = Make(-30.0f, 4.0f, 0.0f);  // no range: a wire
        EXPECT_NEAR(SteadyGainDb(*open, level), 0.0, 1e-4) << level;
        auto belowOne = Make(-30.0f, 0.5f, 20.0f);  // counts as ratio 1
        auto one = Make(-30.0f, 1.0f, 20.0f);
        EXPECT_EQ(SteadyGainDb(*belowOne, level), SteadyGainDb(*one, level)) << level;
    }
    auto silent = Make(-30.0f, 2.0f, 20.0f);
    std::vector<float> zeros(4800, 0.0f);
    float* channels[] = {zeros.data()};
    silent->Process(channels, zeros.size());
    EXPECT_NEAR(silent->GetMeter(Expander::kGainMeter), -20.0f, 1e-4f);
}

TEST(Expander, AttackHoldAndReleaseTimesFromLevelSteps) {
    // Threshold -40 dB, ratio 1, range 50 dB: floor at -90 dB. Levels are
    // square waves, so the detector sees them without ripple.
    const float attack = 5.0f, hold = 40.0f, release = 100.0f;
    auto e = Make(-40.0f, 1.0f, 50.0f, hold, release, attack);
    const std::size_t up = 4800, down = 24000, frames = 48000;
    std::vector<float> in(frames), out;
    for (std::size_t n = 0; n < frames; ++n) {
        const float level = n < up ? 0.0f : (n < down ? 0.1f : 0.0f);
        in[n] = n % 2 ? level : -level;
    }
    // Far below the floor, yet enough to read the gain from.
    for (std::size_t n = down; n < frames; ++n) in[n] = n % 2 ? 1e-6f : -1e-6f;
    out = in;
    for (std::size_t done = 0; done < frames; done += 128) {  // the hold spans 15 blocks
        float* channels[] = {out.data() + done};
        e->Process(channels, 128);
    }
    auto gainDb = [&](std::size_t n) { return zentest::ToDb(std::fabs(out[n] / in[n])); };
    // Opening from the floor (-4.5 log units) toward -20 dB (-1): 63.2 % of
    // the way, -2.29, lies below the threshold (-2), so the attack shows in full.
    const double target = 20.0 * (-4.5 + (1.0 - std::exp(-1.0)) * 3.5 + 2.0);
    std::size_t n = up;
    while (gainDb(n) < target) ++n;
    EXPECT_NEAR(static_cast<double>(n + 1 - up), attack * 48.0, 1.0);
    EXPECT_NEAR(gainDb(down - 1), 0.0, 1e-4);  // fully open at -20 dB
    // Closing: unity for the hold, then toward -50 dB with the release.
    EXPECT_NEAR(gainDb(down + static_cast<std::size_t>(hold * 48.0) - 1), 0.0, 1e-4);
    n = down;
    while (gainDb(n) > -50.0 * (1.0 - std::exp(-1.0))) ++n;
    EXPECT_NEAR(static_cast<double>(n + 1 - down), (hold + release) * 48.0, 2.0);
}
