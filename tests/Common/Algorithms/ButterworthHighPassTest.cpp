// ButterworthHighPass: the Butterworth law (bilinear, so exact at the warped
// frequency), the bound on its ringing, channels and bad input.
#include <gtest/gtest.h>

#include <cmath>

#include "Common/Algorithms/ButterworthHighPass.h"
#include "Support/Signals.h"

namespace {

constexpr float kCorner = 80.0f;

std::vector<float> ImpulseResponse(float rate, int slope, std::size_t length = 1 << 14) {
    ButterworthHighPass filter;
    filter.SetChannelCount(1);
    filter.Prepare(rate, 512);
    filter.SetParameter(ButterworthHighPass::kFrequency, kCorner);
    filter.SetParameter(ButterworthHighPass::kSlope, static_cast<float>(slope));
    std::vector<float> h = zentest::Impulse(length);
    for (std::size_t done = 0; done < length; done += 512) {
        float* channels[] = {h.data() + done};
        filter.Process(channels, 512);
    }
    return h;
}

}  // namespace

TEST(ButterworthHighPass, FollowsTheButterworthLawAtEveryRate) {
    for (float rate : {44100.0f, 48000.0f, 96000.0f})
        for (int slope : {ButterworthHighPass::kTwelveDb, ButterworthHighPass::kTwentyFourDb}) {
            const std::vector<float> h = ImpulseResponse(rate, slope);
            const double order = slope == ButterworthHighPass::kTwelveDb ? 2.0 : 4.0;
            for (double f : {20.0, 40.0, 60.0, 80.0, 120.0, 300.0, 3000.0}) {
                const double ratio = std::tan(zentest::kPi * f / rate) / std::tan(zentest::kPi * kCorner / rate);
                const double expected = 10.0 * std::log10(std::pow(ratio, 2 * order) / (1.0 + std::pow(ratio, 2 * order)));
                EXPECT_NEAR(zentest::MagnitudeDb(h, f, rate), expected, 0.01) << rate << " Hz, order " << order << ", " << f;
            }
        }
}

TEST(ButterworthHighPass, RingsNoLongerThanItsBoundSays) {
    for (int slope : {ButterworthHighPass::kTwelveDb, ButterworthHighPass::kTwentyFourDb}) {
        const std::vector<float> h = ImpulseResponse(48000.0f, slope);
        const float peak = zentest::Peak(h);
        std::size_t last = 0;
        for (std::size_t n = 0; n < h.size(); ++n)
            if (std::fabs(h[n]) > peak * 1e-5f) last = n;
        const double bound = ButterworthHighPass::RingSeconds(kCorner, slope, 100.0) * 48000.0;
        EXPECT_LE(static_cast<double>(last), bound) << slope;
        EXPECT_GT(static_cast<double>(last), 0.5 * bound) << slope;  // and a bound, not a guess
    }
}

TEST(ButterworthHighPass, BadInputClearsOut) {
    ButterworthHighPass filter;
    filter.SetChannelCount(2);
    filter.Prepare(48000.0f, 512);
    std::vector<float> left = zentest::Noise(4096, 0.5, 1), right = zentest::Impulse(4096);  // channels on their own
    left[100] = NAN;
    right[200] = INFINITY;
    for (std::size_t done = 0; done < 4096; done += 512) {
        float* channels[] = {left.data() + done, right.data() + done};
        ASSERT_TRUE(filter.Process(channels, 512));
    }
    for (std::size_t n = 512; n < 4096; ++n) ASSERT_TRUE(std::isfinite(left[n]) && std::isfinite(right[n])) << n;
    EXPECT_EQ(zentest::Peak(right, 3584), 0.0f);  // the infinity left nothing behind
}
