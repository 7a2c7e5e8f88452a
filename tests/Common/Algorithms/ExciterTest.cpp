// Exciter: its curve, the harmonics it adds above its band (odd only when
// unbiased, even too when biased), and what it leaves alone.
#include <gtest/gtest.h>

#include <cmath>

#include "Common/Algorithms/Exciter.h"
#include "Support/Signals.h"

namespace {

constexpr float kRate = 48000.0f;
constexpr std::size_t kLength = 48000;

std::vector<float> Excite(std::vector<float> x, float even, float mix = 50.0f) {
    Exciter exciter;
    exciter.SetChannelCount(1);
    exciter.Prepare(kRate, 512);
    exciter.SetParameter(Exciter::kEven, even);
    exciter.SetParameter(Exciter::kMix, mix);
    for (std::size_t done = 0; done < x.size(); done += 512) {
        float* channels[] = {x.data() + done};
        exciter.Process(channels, std::min<std::size_t>(512, x.size() - done));
    }
    return x;
}

// Level of a component relative to the 4 kHz fundamental, over the last half second.
double RelativeDb(const std::vector<float>& y, double frequency) {
    return zentest::ToDb(zentest::Amplitude(y, kRate, frequency, kLength / 2, kLength) /
                         zentest::Amplitude(y, kRate, 4000.0, kLength / 2, kLength));
}

}  // namespace

TEST(Exciter, CurveIsOddWithUnitSlopeAndReachesFullScaleFlat) {
    EXPECT_EQ(Exciter::Saturate(0.0f), 0.0f);
    EXPECT_NEAR(Exciter::Saturate(1e-3f) / 1e-3f, 1.0f, 1e-5f);
    for (float u : {3.0f, 5.0f, 1e30f}) {
        EXPECT_EQ(Exciter::Saturate(u), 1.0f);
        EXPECT_EQ(Exciter::Saturate(-u), -1.0f);
    }
    for (float u = -2.5f; u < 2.5f; u += 0.01f) ASSERT_LT(Exciter::Saturate(u), Exciter::Saturate(u + 0.01f)) << u;
    EXPECT_NEAR(Exciter::Saturate(2.999f), 1.0f, 1e-5f);  // arrives with zero slope
}

TEST(Exciter, AddsHarmonicsAboveItsBandAndLeavesTheLowsAlone) {
    const std::vector<float> tone = zentest::Sine(4000.0, kRate, kLength, 0.5);
    const std::vector<float> odd = Excite(tone, 0.0f), both = Excite(tone, 100.0f);
    EXPECT_GT(RelativeDb(odd, 12000.0), -40.0);
    EXPECT_LT(RelativeDb(odd, 8000.0), -100.0);  // an odd curve makes no even harmonics
    EXPECT_GT(RelativeDb(both, 8000.0), -40.0);

    const std::vector<float> low = zentest::Sine(200.0, kRate, kLength, 0.5);
    EXPECT_NEAR(zentest::ToDb(zentest::Rms(Excite(low, 50.0f), kLength / 2) / zentest::Rms(low, kLength / 2)), 0.0, 0.01);
    EXPECT_EQ(Excite(tone, 50.0f, 0.0f), tone);  // no mix, no change
}
