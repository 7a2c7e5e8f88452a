#include <gtest/gtest.h>

#include <cmath>
#include <random>

#include "Common/NoiseReduction/zn_noise_profile.h"

namespace nr = zen::noise_reduction;

namespace {

constexpr std::size_t kBins = 513;
constexpr double kWindowEnergy = 384.0;  // a 1024-point Hann window's squared sum

// Periodograms of noise whose expected power in bin k is `level(k)`.
template <class Level>
void LearnFrames(nr::zn_noise_profile& p, std::size_t channel, int frames, Level level, unsigned seed) {
    std::mt19937 random(seed);
    std::exponential_distribution<float> periodogram(1.0f);
    std::vector<float> power(kBins);
    for (int f = 0; f < frames; ++f) {
        for (std::size_t k = 0; k < kBins; ++k) power[k] = level(k) * periodogram(random);
        p.Learn(channel, power.data());
    }
}

}  // namespace

// The profile is the mean periodogram of the frames heard while learning,
// per channel; a learn that heard nothing keeps the previous profile.
TEST(zn_noise_profile, LearnsTheMeanPeriodogramPerChannel) {
    nr::zn_noise_profile p;
    ASSERT_TRUE(p.Configure(2, kBins, 48000.0, kWindowEnergy));
    EXPECT_FALSE(p.HasProfile());
    p.Begin();
    LearnFrames(p, 0, 2000, [](std::size_t k) { return 1.0f + static_cast<float>(k); }, 1);
    LearnFrames(p, 1, 2000, [](std::size_t) { return 4.0f; }, 2);
    EXPECT_EQ(p.End(), 2000u);
    ASSERT_TRUE(p.HasProfile());
    for (std::size_t k : {0u, 10u, 300u, 512u}) {
        EXPECT_NEAR(p.Power(0)[k] / (1.0f + static_cast<float>(k)), 1.0f, 0.1f) << k;
        EXPECT_NEAR(p.Power(1)[k], 4.0f, 0.4f) << k;
    }
    const float before = p.Power(1)[100];
    p.Begin();
    EXPECT_EQ(p.End(), 0u) << "nothing heard";
    EXPECT_EQ(p.Power(1)[100], before);
}

// As text the profile survives to the hundredth of a dB; a profile learnt at
// 48 kHz applies at 96 kHz (frames twice as long: the same bin spacing,
// twice the window energy) with the same level per unit of window energy,
// and its top bin above 24 kHz. Text that is not a profile is
// refused and leaves the profile as it was.
TEST(zn_noise_profile, TravelsAsTextAcrossRates) {
    nr::zn_noise_profile p;
    ASSERT_TRUE(p.Configure(1, kBins, 48000.0, kWindowEnergy));
    p.Begin();
    LearnFrames(p, 0, 500, [](std::size_t k) { return k < 100 ? 10.0f : 0.5f; }, 3);
    p.End();
    const std::string text = p.ToText();
    EXPECT_EQ(text.rfind("noise-profile 48000 513 1 ", 0), 0u) << text.substr(0, 40);

    nr::zn_noise_profile same;
    ASSERT_TRUE(same.Configure(1, kBins, 48000.0, kWindowEnergy));
    ASSERT_TRUE(same.FromText(text));
    for (std::size_t k = 0; k < kBins; ++k) EXPECT_NEAR(10 * std::log10(same.Power(0)[k] / p.Power(0)[k]), 0.0, 0.01);

    nr::zn_noise_profile doubled;
    ASSERT_TRUE(doubled.Configure(1, 2 * kBins - 1, 96000.0, 2 * kWindowEnergy));
    ASSERT_TRUE(doubled.FromText(text));
    EXPECT_NEAR(doubled.Power(0)[80] / (2.0f * p.Power(0)[80]), 1.0f, 1e-3f) << "3.75 kHz";
    EXPECT_NEAR(doubled.Power(0)[2 * kBins - 2] / (2.0f * p.Power(0)[kBins - 1]), 1.0f, 1e-3f) << "above 24 kHz: the last bin";

    for (const char* bad : {"", "noise-profile", "noise-profile 48000 3 1 1 2", "noise-profile 48000 2 1 1 2 3",
                            "noise-profile 48000 2 1 1 nan", "profile 48000 2 1 1 2", "noise-profile -1 2 1 1 2"})
        EXPECT_FALSE(same.FromText(bad)) << bad;
    EXPECT_NEAR(same.Power(0)[0], p.Power(0)[0], 1e-3f * p.Power(0)[0]);
}
