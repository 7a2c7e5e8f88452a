// The fractional delay line: whole and fractional delays land where set, a
// fixed delay adds no noise, a swinging delay makes the sidebands phase
// modulation predicts, and bad samples never get in.
#include <gtest/gtest.h>

#include <cmath>

#include "Common/Algorithms/ModulatedDelayLine.h"
#include "Support/Modulation.h"
#include "Support/Signals.h"

namespace {

std::vector<float> Through(ModulatedDelayLine& line, const std::vector<float>& in, double delay) {
    std::vector<float> out(in.size());
    for (std::size_t n = 0; n < in.size(); ++n) {
        out[n] = line.Read(delay);
        line.Push(in[n]);
    }
    return out;
}

}  // namespace

TEST(ModulatedDelayLine, WholeDelaysAreExactAndFractionalOnesHaveTheirPhaseDelay) {
    ModulatedDelayLine line;
    line.Resize(3000.0);
    for (double delay : {2.0, 3.0, 17.0, 480.0, 2999.0, 3000.0}) {
        line.Clear();
        const std::vector<float> out = Through(line, zentest::Impulse(3100), delay);
        for (std::size_t n = 0; n < out.size(); ++n)
            ASSERT_EQ(out[n], n == static_cast<std::size_t>(delay) ? 1.0f : 0.0f) << delay << " at " << n;
    }
    for (double delay : {2.25, 10.5, 100.75, 1234.125}) {
        line.Clear();
        const std::vector<float> h = Through(line, zentest::Impulse(2048), delay);
        EXPECT_NEAR(zentest::PhaseDelay(h, 100.0, 48000.0), delay, 1e-3) << delay;
        // Flat to within a hundredth of a dB up to 2 kHz.
        EXPECT_NEAR(zentest::MagnitudeDb(h, 2000.0, 48000.0), 0.0, 0.01) << delay;
    }
    // Out of range delays are clamped to the line.
    line.Clear();
    EXPECT_EQ(zentest::ArgPeak(Through(line, zentest::Impulse(4000), 1e9)), 3000u);
    line.Clear();
    EXPECT_EQ(zentest::ArgPeak(Through(line, zentest::Impulse(100), 0.0)), 2u);
}

TEST(ModulatedDelayLine, AFixedFractionalDelayAddsNoNoiseAndASwingMakesTheBesselSidebands) {
    const double rate = 48000.0;
    const std::vector<float> sine = zentest::Sine(1000.0, rate, 26000, 0.5);
    ModulatedDelayLine line;
    line.Resize(2000.0);
    EXPECT_LT(zentest::ThdNDb(Through(line, sine, 480.37), 1000.0, rate, 2000, 24000), -100.0);

    // Delay 240 + A sin(2 pi fm t): a phase deviation of beta = 2 pi fc A / fs.
    const double swing = 4.8, fm = 10.0;
    const double beta = 2.0 * zentest::kPi * 1000.0 * swing / rate;
    line.Clear();
    std::vector<float> out(sine.size());
    for (std::size_t n = 0; n < sine.size(); ++n) {
        out[n] = line.Read(240.0 + swing * std::sin(2.0 * zentest::kPi * fm * static_cast<double>(n) / rate));
        line.Push(sine[n]);
    }
    const double carrier = std::abs(zentest::Tone(out, 1000.0, rate, 2000, 24000));
    EXPECT_NEAR(carrier, 0.5 * std::cyl_bessel_j(0.0, beta), 1e-3);
    for (double side : {1000.0 - fm, 1000.0 + fm}) {
        EXPECT_NEAR(std::abs(zentest::Tone(out, side, rate, 2000, 24000)), 0.5 * std::cyl_bessel_j(1.0, beta), 1e-3)
            << side;
    }
    EXPECT_NEAR(std::abs(zentest::Tone(out, 1000.0 + 2.0 * fm, rate, 2000, 24000)),
                0.5 * std::cyl_bessel_j(2.0, beta), 1e-3);
}

TEST(ModulatedDelayLine, NonFiniteSamplesAreStoredAsSilenceAndHugeOnesClamped) {
    ModulatedDelayLine line;
    line.Resize(10.0);
    for (float bad : {NAN, INFINITY, -INFINITY}) line.Push(bad);
    line.Push(3e38f);
    line.Push(-3e38f);
    for (double delay = 2.0; delay <= 10.0; delay += 0.125) ASSERT_TRUE(std::isfinite(line.Read(delay))) << delay;
    EXPECT_EQ(line.Read(2.0), ModulatedDelayLine::kCeiling);
    EXPECT_EQ(line.Read(3.0), 0.0f);
}
