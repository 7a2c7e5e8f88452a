// NoiseGate: opening, hysteresis, hold and release read from level steps,
// exact gains open and closed, linking and bad input.
#include <gtest/gtest.h>

#include <cmath>

#include "Common/Algorithms/NoiseGate.h"
#include "Support/Dynamics.h"
#include "Support/Signals.h"

namespace {

constexpr float kRate = 48000.0f;
constexpr std::size_t Ms(double ms) { return static_cast<std::size_t>(ms * 48.0); }

std::unique_ptr<NoiseGate> Gate(std::uint64_t channels = 1) {
    auto gate = std::make_unique<NoiseGate>();
    gate->SetChannelCount(channels);
    gate->Prepare(kRate, 512);
    gate->SetParameter(NoiseGate::kThreshold, -40.0f);
    gate->SetParameter(NoiseGate::kHysteresis, 6.0f);
    gate->SetParameter(NoiseGate::kRange, 30.0f);
    gate->SetParameter(NoiseGate::kHold, 50.0f);
    gate->SetParameter(NoiseGate::kRelease, 20.0f);
    return gate;
}

void Gated(NoiseGate& gate, std::vector<std::vector<float>>& x, std::size_t block = 512) {
    for (std::size_t done = 0; done < x[0].size(); done += block) {
        float* channels[2] = {x[0].data() + done, x.size() > 1 ? x[1].data() + done : nullptr};
        ASSERT_TRUE(gate.Process(channels, std::min(block, x[0].size() - done)));
    }
}

}  // namespace

TEST(NoiseGate, OpensAtTheThresholdHoldsThenClosesToTheRange) {
    // Closed at -60, open at -30, still open at -43 (inside the hysteresis), closing at -60.
    const std::size_t open = Ms(200), inside = Ms(500), drop = Ms(800);
    const std::vector<float> in = zentest::LevelSteps(Ms(1200), {{0, -60.0}, {open, -30.0}, {inside, -43.0}, {drop, -60.0}});
    auto gate = Gate();
    std::vector<std::vector<float>> out = {in};
    Gated(*gate, out);
    EXPECT_NEAR(zentest::GainDb(out[0], in, open - 1), -30.0, 1e-3);
    for (std::size_t n = open + Ms(10); n < drop; ++n) ASSERT_EQ(out[0][n], in[n]) << n;  // an exact wire
    // The detector falls below -46 dB 3.5 ms after the drop; then the hold, then one release time constant.
    const double detector = 10.0 * std::log(std::pow(10.0, 3.0 / 20.0));
    EXPECT_NEAR(zentest::TimeConstantFrames(out[0], in, drop, 0.0, -30.0), static_cast<double>(Ms(detector + 50.0 + 20.0)), 48.0);
    EXPECT_NEAR(zentest::GainDb(out[0], in, in.size() - 1), -30.0, 1e-3);
    EXPECT_NEAR(gate->GetMeter(NoiseGate::kGainMeter), -30.0f, 1e-3f);
    EXPECT_EQ(gate->GetMeter(NoiseGate::kOpenMeter), 0.0f);

    // From closed, -43 dB is not enough to open it.
    const std::vector<float> between = zentest::LevelSteps(Ms(100), {{0, -43.0}});
    auto closed = Gate();
    std::vector<std::vector<float>> quiet = {between};
    Gated(*closed, quiet);
    EXPECT_NEAR(zentest::GainDb(quiet[0], between, Ms(100) - 1), -30.0, 1e-3);
}

TEST(NoiseGate, LinksChannelsAndShrugsOffBadInput) {
    auto gate = Gate(2);
    const std::vector<float> loud = zentest::LevelSteps(Ms(100), {{0, -20.0}}), soft = zentest::LevelSteps(Ms(100), {{0, -70.0}});
    std::vector<std::vector<float>> x = {loud, soft};
    Gated(*gate, x);
    EXPECT_EQ(x[1].back(), soft.back());  // opened by the other channel

    auto poisoned = Gate();
    std::vector<std::vector<float>> y = {zentest::LevelSteps(Ms(800), {{0, -60.0}})};
    const std::vector<float> in = y[0];
    y[0][Ms(10)] = NAN;           // a NaN does not open it
    y[0][Ms(100)] = INFINITY;     // an infinity does, for a while
    Gated(*poisoned, y, 100);
    EXPECT_NEAR(zentest::GainDb(y[0], in, Ms(50)), -30.0, 1e-3);
    for (std::size_t n = Ms(100) + 1; n < y[0].size(); ++n) ASSERT_TRUE(std::isfinite(y[0][n])) << n;
    EXPECT_NEAR(zentest::GainDb(y[0], in, y[0].size() - 1), -30.0, 1e-3);
}
