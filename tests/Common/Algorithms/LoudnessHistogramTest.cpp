// The histograms behind integrated loudness and loudness range against the
// exact computations that keep every block, on programme-like spreads of
// block loudness, and at their edges.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <random>

#include "Common/Algorithms/IntegratedLoudness.h"
#include "Common/Algorithms/LoudnessRange.h"

namespace {

using zen::LoudnessHistogram;

constexpr double kMinusInfinity = -std::numeric_limits<double>::infinity();

double MeanLoudnessAbove(const std::vector<double>& lufs, double gate, std::size_t* count = nullptr) {
    double sum = 0.0;
    std::size_t n = 0;
    for (double l : lufs)
        if (l > gate) {
            sum += LoudnessHistogram::Power(l);
            ++n;
        }
    if (count != nullptr) *count = n;
    return n > 0 ? LoudnessHistogram::Lufs(sum / static_cast<double>(n)) : kMinusInfinity;
}

double ExactIntegrated(const std::vector<double>& blocks) {
    const double gate = MeanLoudnessAbove(blocks, -70.0) - 10.0;
    return MeanLoudnessAbove(blocks, gate);
}

double ExactRange(const std::vector<double>& windows) {
    const double gate = MeanLoudnessAbove(windows, -70.0) - 20.0;
    std::vector<double> kept;
    for (double l : windows)
        if (l > -70.0 && l > gate) kept.push_back(l);
    if (kept.empty()) return 0.0;
    std::sort(kept.begin(), kept.end());
    auto at = [&](double p) { return kept[static_cast<std::size_t>(std::llround((kept.size() - 1) * p))]; };
    return at(0.95) - at(0.10);
}

// Block loudness of programme: speech around a level with pauses near the
// floor, music with slow swells, and bursts above the gates.
std::vector<double> Programme(unsigned seed, std::size_t blocks) {
    std::mt19937 random(seed);
    std::normal_distribution<double> speech(-24.0, 4.0), swell(-30.0, 8.0);
    std::uniform_real_distribution<double> pause(-85.0, -50.0), uniform(0.0, 1.0);
    std::vector<double> lufs;
    for (std::size_t i = 0; i < blocks; ++i) {
        const double u = uniform(random);
        lufs.push_back(u < 0.5 ? speech(random) : u < 0.8 ? swell(random) : u < 0.95 ? pause(random) : -8.0 * u);
    }
    return lufs;
}

}  // namespace

TEST(LoudnessHistogram, GatedMeansAndRangesMatchTheExactValuesWithinAHundredthOfALu) {
    // From 5 minutes to 10 hours of 100 ms blocks, and at several levels.
    for (unsigned seed = 1; seed <= 12; ++seed) {
        const std::size_t blocks = seed < 10 ? 3000u * seed : 360000u;
        std::vector<double> lufs = Programme(seed, blocks);
        const double shift = -20.0 + 4.0 * static_cast<double>(seed % 7);
        for (double& l : lufs) l += shift;
        zen::IntegratedLoudness integrated;
        zen::LoudnessRange range;
        for (double l : lufs) {
            integrated.AddBlock(LoudnessHistogram::Power(l));
            range.AddShortTerm(LoudnessHistogram::Power(l));
        }
        EXPECT_NEAR(integrated.Loudness(), ExactIntegrated(lufs), 0.01) << "seed " << seed;
        EXPECT_NEAR(range.Range(), ExactRange(lufs), 0.01) << "seed " << seed;
    }
}

TEST(LoudnessHistogram, EdgesOfTheGatesAndOfTheBins) {
    zen::IntegratedLoudness integrated;
    zen::LoudnessRange range;
    EXPECT_EQ(integrated.Loudness(), kMinusInfinity);
    EXPECT_EQ(range.Range(), 0.0);
    EXPECT_EQ(range.Low(), kMinusInfinity);
    // At or below the absolute gate, and NaN, count for nothing.
    for (double power : {LoudnessHistogram::Power(-70.0), LoudnessHistogram::Power(-90.0), 0.0,
                         std::numeric_limits<double>::quiet_NaN()}) {
        integrated.AddBlock(power);
        range.AddShortTerm(power);
    }
    EXPECT_EQ(integrated.BlocksAboveAbsoluteGate(), 0u);
    EXPECT_EQ(integrated.Loudness(), kMinusInfinity);
    // One level read back exactly, however many blocks; beyond the top bin too.
    for (double level : {-69.99, -23.0, 29.999, 45.0}) {
        zen::IntegratedLoudness one;
        for (int i = 0; i < 1000; ++i) one.AddBlock(LoudnessHistogram::Power(level));
        EXPECT_NEAR(one.Loudness(), level, 1e-9) << level;
    }
    // Blocks just below the relative gate stay out, just above it come in.
    for (double offset : {-0.001, 0.001}) {
        std::vector<double> lufs(100, -20.0);
        zen::IntegratedLoudness two;
        for (double l : lufs) two.AddBlock(LoudnessHistogram::Power(l));
        const double gate = two.RelativeGate();
        two.AddBlock(LoudnessHistogram::Power(gate + offset));
        lufs.push_back(gate + offset);
        EXPECT_NEAR(two.Loudness(), ExactIntegrated(lufs), 1e-6) << offset;
    }
    // Two levels 10 LU apart: the range is their difference.
    for (int i = 0; i < 200; ++i) range.AddShortTerm(LoudnessHistogram::Power(i < 100 ? -30.0 : -20.0));
    EXPECT_NEAR(range.Range(), 10.0, 1e-9);
    EXPECT_NEAR(range.Low(), -30.0, 1e-9);
    EXPECT_NEAR(range.High(), -20.0, 1e-9);
}
