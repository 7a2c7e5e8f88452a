// Waveshaper: each curve's law, its antiderivative, and the shaped output
// as the curve's mean over each step, scaled into the ceiling.
#include <gtest/gtest.h>

#include <cmath>
#include <vector>

#include "Common/Algorithms/Waveshaper.h"

namespace {

constexpr Waveshaper::Curve kCurves[] = {Waveshaper::kTape, Waveshaper::kTube, Waveshaper::kHard,
                                         Waveshaper::kFoldBack};

std::vector<float> Shaped(Waveshaper::Curve curve, std::vector<float> x, float pre, float post) {
    Waveshaper shaper;
    shaper.Prepare(48000.0f, 512);
    shaper.SetParameter(Waveshaper::kCurve, static_cast<float>(curve));
    const std::vector<float> pres(x.size(), pre), posts(x.size(), post);
    shaper.Shape(0, x.data(), pres.data(), posts.data(), x.size());
    return x;
}

}  // namespace

TEST(Waveshaper, EachCurvesLaw) {
    using W = Waveshaper;
    EXPECT_NEAR(W::Apply(W::kTape, 1.0), 1.0 / std::sqrt(2.0), 1e-12);
    EXPECT_NEAR(W::Apply(W::kHard, 0.7), 0.7, 1e-12);
    EXPECT_EQ(W::Apply(W::kHard, 3.0), 1.0);
    const double kHalfPi = 1.5707963267948966;
    EXPECT_NEAR(W::Apply(W::kFoldBack, kHalfPi), 1.0, 1e-12);  // the top, then folded back
    EXPECT_NEAR(W::Apply(W::kFoldBack, 2.0 * kHalfPi), 0.0, 1e-12);
    EXPECT_NEAR(W::Apply(W::kFoldBack, 3.0 * kHalfPi), -1.0, 1e-12);
    // The tube's halves saturate unevenly: the lower at -1, the upper lower.
    EXPECT_NEAR(W::Apply(W::kTube, -1e6), -1.0, 1e-6);
    EXPECT_NEAR(W::Apply(W::kTube, 1e6), W::TubeUpperLimit(), 1e-6);
    EXPECT_LT(W::TubeUpperLimit(), 0.8);
    for (auto curve : kCurves) {
        // Unit gain for small signals, zero in, zero out.
        EXPECT_NEAR(W::Apply(curve, 0.0), 0.0, 1e-15) << curve;
        EXPECT_NEAR(W::Apply(curve, 1e-4) / 1e-4, 1.0, 1e-3) << curve;
        for (double u = -8.0; u <= 8.0; u += 0.01) {
            EXPECT_LE(std::fabs(W::Apply(curve, u)), 1.0 + 1e-12) << curve << " at " << u;
            if (curve != W::kTube) {
                EXPECT_NEAR(W::Apply(curve, -u), -W::Apply(curve, u), 1e-12) << curve;
            }
            // Each antiderivative's slope is the one below it.
            const double slope = (W::Antiderivative(curve, u + 1e-5) - W::Antiderivative(curve, u - 1e-5)) / 2e-5;
            EXPECT_NEAR(slope, W::Apply(curve, u), 1e-5) << curve << " at " << u;
            const double slope2 =
                (W::SecondAntiderivative(curve, u + 1e-5) - W::SecondAntiderivative(curve, u - 1e-5)) / 2e-5;
            EXPECT_NEAR(slope2, W::Antiderivative(curve, u), 1e-5) << curve << " at " << u;
        }
    }
}

TEST(Waveshaper, OutputIsTheCurvesTriangleWeightedMeanWithinTheCeiling) {
    for (auto curve : kCurves) {
        // A held input gives the curve itself, scaled into the ceiling.
        const std::vector<float> held = Shaped(curve, std::vector<float>(8, 0.3f), 4.0f, 0.5f);
        EXPECT_NEAR(held.back(), 0.5 * Waveshaper::Apply(curve, 1.2), 1e-6) << curve;
        // A ramp across the corners (and longer than a chunk): the mean of
        // the curve over the two steps around the previous input, weighted
        // by a triangle that peaks there.
        std::vector<float> ramp(600);
        for (std::size_t n = 0; n < ramp.size(); ++n) ramp[n] = 0.02f * static_cast<float>(n) - 6.0f;
        const std::vector<float> y = Shaped(curve, ramp, 1.0f, 1.0f);
        for (std::size_t n = 2; n < ramp.size(); ++n) {
            double mean = 0.0;
            const double centre = ramp[n - 1], step = 0.5 * (ramp[n] - ramp[n - 2]);
            for (int k = 0; k < 2000; ++k) {
                const double t = (k + 0.5) / 1000.0 - 1.0;
                mean += (1.0 - std::fabs(t)) * Waveshaper::Apply(curve, centre + step * t);
            }
            ASSERT_NEAR(y[n], mean / 1000.0, 1e-5) << curve << " at " << ramp[n];
        }
        // Near 0 (here 1e-7) every curve is a straight line of unit slope: the
        // triangle's mean of the inputs themselves.
        std::vector<float> quiet(300);
        for (std::size_t n = 0; n < quiet.size(); ++n) quiet[n] = 1e-7f * static_cast<float>(std::sin(0.3 * n));
        const std::vector<float> q = Shaped(curve, quiet, 1.0f, 0.5f);
        for (std::size_t n = 2; n < quiet.size(); ++n)
            ASSERT_NEAR(q[n], 0.5 * (4.0 * quiet[n - 1] + quiet[n] + quiet[n - 2]) / 6.0, 1e-14) << curve << " at " << n;
        // Huge inputs stay finite and within the ceiling.
        const std::vector<float> wild = Shaped(curve, {1e6f, -1e6f, 3e5f, 1e6f, 1e6f}, 1000.0f, 0.25f);
        for (float v : wild) {
            EXPECT_TRUE(std::isfinite(v)) << curve;
            EXPECT_LE(std::fabs(v), 0.25f + 1e-6f) << curve;
        }
    }
}

TEST(Waveshaper, ReportsThePeakDrivenInputAndResets) {
    Waveshaper shaper;
    shaper.SetChannelCount(2);
    shaper.Prepare(48000.0f, 64);
    std::vector<float> x = {0.1f, -0.5f, 0.25f};
    const std::vector<float> pre = {2.0f, 2.0f, 2.0f}, post = {1.0f, 1.0f, 1.0f};
    EXPECT_FLOAT_EQ(shaper.Shape(1, x.data(), pre.data(), post.data(), 3), 1.0f);
    std::vector<float> again = {0.1f, -0.5f, 0.25f};
    shaper.Reset();
    shaper.Shape(1, again.data(), pre.data(), post.data(), 3);
    EXPECT_EQ(again, x);
    EXPECT_EQ(shaper.GetCurve(), Waveshaper::kTube);  // the default
}
