// The feedback path: the limiter's law, the cuts' responses, and a loop
// through it at full gain that stays bounded and sheds a bad sample.
#include <gtest/gtest.h>

#include <cmath>

#include "Common/Algorithms/FeedbackPath.h"
#include "Common/Algorithms/ModulatedDelayLine.h"
#include "Support/Signals.h"

TEST(FeedbackPath, TheLimiterIsTransparentToFullScaleThenBendsTowardTheCeiling) {
    for (float x : {0.0f, 0.25f, -0.9f, 1.0f, -1.0f}) EXPECT_EQ(FeedbackPath::SoftLimit(x), x);
    float last = 1.0f;
    for (float x = 1.01f; x < 100.0f; x *= 1.1f) {
        const float y = FeedbackPath::SoftLimit(x);
        ASSERT_GE(y, last) << x;
        if (x < 3.0f) {
            ASSERT_GT(y, last) << x;
        }
        ASSERT_LE(y, FeedbackPath::kCeiling) << x;
        ASSERT_EQ(FeedbackPath::SoftLimit(-x), -y);
        last = y;
    }
    // Slope 1 at the knee: no corner.
    EXPECT_NEAR((FeedbackPath::SoftLimit(1.001f) - 1.0f) / 0.001f, 1.0f, 1e-2f);
    EXPECT_EQ(FeedbackPath::SoftLimit(INFINITY), FeedbackPath::kCeiling);
    EXPECT_EQ(FeedbackPath::SoftLimit(NAN), 0.0f);
}

TEST(FeedbackPath, CutsAreButterworthSectionsAndZeroSwitchesThemOff) {
    FeedbackPath path;
    path.Prepare(48000.0, 2);
    auto response = [&](std::uint32_t channel) {
        std::vector<float> h = zentest::Impulse(1 << 14, 0, 0.5f);
        for (float& x : h) x = 2.0f * path.Process(channel, x);
        return h;
    };
    const std::vector<float> wire = response(0);
    EXPECT_EQ(wire, zentest::Impulse(1 << 14));
    path.SetCuts(200.0, 4000.0);
    const std::vector<float> h = response(1);
    EXPECT_NEAR(zentest::MagnitudeDb(h, 200.0, 48000.0), -3.01, 0.05);
    EXPECT_NEAR(zentest::MagnitudeDb(h, 4000.0, 48000.0), -3.01, 0.05);
    EXPECT_NEAR(zentest::MagnitudeDb(h, 1000.0, 48000.0), 0.0, 0.3);
    EXPECT_LT(zentest::MagnitudeDb(h, 50.0, 48000.0), -23.0);
    EXPECT_LT(zentest::MagnitudeDb(h, 16000.0, 48000.0), -23.0);
}

TEST(FeedbackPath, AFullGainLoopStaysBoundedAndShedsABadSampleAtOnce) {
    ModulatedDelayLine line;
    line.Resize(100.0);
    FeedbackPath path;
    path.Prepare(48000.0, 1);
    path.SetCuts(20.0, 18000.0);
    const std::vector<float> noise = zentest::Noise(48000, 1.0, 5);
    float peak = 0.0f;
    for (std::size_t n = 0; n < noise.size(); ++n) {
        const float y = line.Read(64.0);
        peak = std::max(peak, std::fabs(y));
        float in = noise[n] + path.Process(0, y);
        if (n == 1000) in = NAN;
        line.Push(in);
        ASSERT_TRUE(std::isfinite(y)) << n;
    }
    EXPECT_LE(peak, 1.0f + FeedbackPath::kCeiling);
    EXPECT_GT(peak, 1.5f);  // it did run hot
}
