// PeriodicPinkNoise: the loop's length per rate, its RMS, nothing outside
// 500 Hz - 2 kHz, and channels decorrelated by their offsets.
#include <gtest/gtest.h>

#include <cmath>

#include "Common/Algorithms/PeriodicPinkNoise.h"
#include "FFT/FFT.h"

TEST(PeriodicPinkNoise, OnePeriodHasUnitRmsAndNoPowerOutsideTheBand) {
    for (float rate : {44100.0f, 48000.0f, 96000.0f}) {
        PeriodicPinkNoise noise;
        noise.Prepare(rate, 512);
        const std::vector<float>& loop = noise.Loop();
        ASSERT_GE(loop.size(), PeriodicPinkNoise::kMinPeriodSeconds * rate);
        ASSERT_LT(loop.size(), 2.0 * PeriodicPinkNoise::kMinPeriodSeconds * rate);
        double power = 0.0;
        for (float x : loop) power += double{x} * x;
        EXPECT_NEAR(power / loop.size(), 1.0, 1e-5) << rate;

        ora::fft::FFT fft(loop.size());
        std::vector<ora::fft::Complex> bins(fft.Bins());
        fft.ForwardReal(loop.data(), bins.data());
        double inside = 0.0, outside = 0.0;
        for (std::size_t k = 0; k < bins.size(); ++k) {
            const double f = k * double{rate} / loop.size();
            (f >= PeriodicPinkNoise::kLowHz && f <= PeriodicPinkNoise::kHighHz ? inside : outside) += std::norm(bins[k]);
        }
        EXPECT_LT(10.0 * std::log10(outside / inside), -100.0) << rate;
    }
}

TEST(PeriodicPinkNoise, ChannelsReadTheLoopDecorrelated) {
    PeriodicPinkNoise noise;
    noise.SetChannelCount(3);
    noise.Prepare(48000.0f, 512);
    std::vector<std::vector<float>> out(3, std::vector<float>(48000));
    for (std::size_t done = 0; done < 48000; done += 512) {
        float* p[3] = {out[0].data() + done, out[1].data() + done, out[2].data() + done};
        noise.Process(p, std::min<std::size_t>(512, 48000 - done));
    }
    for (int c = 1; c < 3; ++c) {
        double product = 0.0, ll = 0.0, rr = 0.0;
        for (std::size_t n = 0; n < 48000; ++n) {
            product += double{out[0][n]} * out[c][n];
            ll += double{out[0][n]} * out[0][n];
            rr += double{out[c][n]} * out[c][n];
        }
        EXPECT_LT(std::fabs(product / std::sqrt(ll * rr)), 0.05) << c;
    }
    // Channel 0 is the loop itself from the start; a reset starts it again.
    EXPECT_EQ(std::vector<float>(noise.Loop().begin(), noise.Loop().begin() + 48000), out[0]);
    noise.Reset();
    std::vector<float> again(16);
    noise.Read(0, again.data(), 16);
    EXPECT_EQ(again, std::vector<float>(out[0].begin(), out[0].begin() + 16));
}
