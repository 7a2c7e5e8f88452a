// K-weighting: the published 48 kHz coefficients, and the same response at
// every other rate up to where the bilinear transform bends it.
#include <gtest/gtest.h>

#include <cmath>
#include <complex>

#include "Common/Algorithms/KWeightingFilter.h"
#include "Support/Signals.h"

namespace {

using zen::KWeightingFilter;

// Magnitude of the design in dB at `f`, from its transfer function.
double ResponseDb(const KWeightingFilter::Design& design, double rate, double f) {
    const std::complex<double> z1 = std::polar(1.0, -2.0 * zentest::kPi * f / rate);
    std::complex<double> h = 1.0;
    for (const auto& s : design) h *= (s.b0 + s.b1 * z1 + s.b2 * z1 * z1) / (1.0 + s.a1 * z1 + s.a2 * z1 * z1);
    return 20.0 * std::log10(std::abs(h));
}

}  // namespace

TEST(KWeightingFilter, ReproducesThePublished48kHzCoefficients) {
    const KWeightingFilter::Design d = KWeightingFilter::DesignFor(48000.0);
    EXPECT_NEAR(d[0].b0, 1.53512485958697, 1e-12);
    EXPECT_NEAR(d[0].b1, -2.69169618940638, 1e-12);
    EXPECT_NEAR(d[0].b2, 1.19839281085285, 1e-12);
    EXPECT_NEAR(d[0].a1, -1.69065929318241, 1e-12);
    EXPECT_NEAR(d[0].a2, 0.73248077421585, 1e-12);
    EXPECT_EQ(d[1].b0, 1.0);
    EXPECT_EQ(d[1].b1, -2.0);
    EXPECT_EQ(d[1].b2, 1.0);
    EXPECT_NEAR(d[1].a1, -1.99004745483398, 1e-12);
    EXPECT_NEAR(d[1].a2, 0.99007225036621, 1e-12);
}

TEST(KWeightingFilter, EveryRateHasThe48kHzResponse) {
    // Within 0.01 dB up to 10 kHz (0.05 dB to 15 kHz) of the 48 kHz design,
    // whose landmarks are +0.691 dB at 997 Hz (which the -0.691 LUFS offset
    // takes back), +4 dB high up and a steep fall below 40 Hz.
    const KWeightingFilter::Design reference = KWeightingFilter::DesignFor(48000.0);
    EXPECT_NEAR(ResponseDb(reference, 48000.0, 997.0), 0.691, 0.002);
    EXPECT_NEAR(ResponseDb(reference, 48000.0, 10000.0), 4.0, 0.1);
    EXPECT_LT(ResponseDb(reference, 48000.0, 10.0), -15.0);
    for (double rate : {32000.0, 44100.0, 88200.0, 96000.0, 192000.0}) {
        const KWeightingFilter::Design design = KWeightingFilter::DesignFor(rate);
        for (double f : {10.0, 20.0, 38.0, 100.0, 500.0, 1000.0, 1682.0, 3000.0, 6000.0, 10000.0, 15000.0}) {
            if (f >= 0.45 * rate) continue;
            const double tolerance = f <= 10000.0 ? 0.01 : 0.05;
            EXPECT_NEAR(ResponseDb(design, rate, f), ResponseDb(reference, 48000.0, f), tolerance) << rate << " Hz, " << f;
        }
    }
}

TEST(KWeightingFilter, RunningFilterMatchesItsDesignPerChannel) {
    // The power of a long sine through the running filter is the design's
    // gain squared; channels keep their own state.
    for (double rate : {44100.0, 96000.0}) {
        KWeightingFilter filter;
        filter.Prepare(rate, 2);
        for (double f : {30.0, 1000.0, 8000.0}) {
            const auto frames = static_cast<std::size_t>(rate);
            const std::vector<float> x = zentest::Sine(f, rate, frames, 0.5);
            const std::vector<float> silence(frames, 0.0f);
            double settle = 0.0, power = 0.0, quiet = 0.0;
            filter.AccumulatePower(0, x.data(), frames / 2, settle);
            filter.AccumulatePower(0, x.data() + frames / 2, frames / 2, power);
            filter.AccumulatePower(1, silence.data(), frames, quiet);
            const double gainDb = 10.0 * std::log10(power / (frames / 2) / 0.125);
            EXPECT_NEAR(gainDb, ResponseDb(filter.GetDesign(), rate, f), 0.01) << rate << " Hz, " << f;
            EXPECT_EQ(quiet, 0.0);
            filter.Reset();
        }
    }
}
