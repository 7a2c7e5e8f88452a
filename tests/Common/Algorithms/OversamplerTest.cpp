// Oversampler: the round trip flat and delayed by whole samples, the
// interpolator's images and the decimator's aliases held below the stop band.
#include <gtest/gtest.h>

#include <cmath>
#include <vector>

#include "Common/Algorithms/Oversampler.h"
#include "Support/Signals.h"

namespace {

// Amplitude in dB of the component at cycles-per-sample `f` of x[from..].
double ComponentDb(const float* x, std::size_t length, double f) {
    double re = 0.0, im = 0.0;
    for (std::size_t n = 0; n < length; ++n) {
        re += x[n] * std::cos(2.0 * zentest::kPi * f * static_cast<double>(n));
        im -= x[n] * std::sin(2.0 * zentest::kPi * f * static_cast<double>(n));
    }
    return zentest::ToDb(2.0 * std::hypot(re, im) / static_cast<double>(length));
}

}  // namespace

TEST(Oversampler, RoundTripIsFlatAcrossTheBandAndDelayedByTheLatency) {
    for (std::size_t factor : {2, 4, 8}) {
        Oversampler over(factor);
        over.SetChannelCount(1);
        over.Prepare(48000.0f, 4096);
        std::vector<float> h = zentest::Impulse(4096);
        float* channels[] = {h.data()};
        ASSERT_TRUE(over.Process(channels, h.size()));
        EXPECT_EQ(zentest::ArgPeak(h), over.GetLatency()) << factor;
        for (double f : {20.0, 1000.0, 10000.0, 18000.0, 20000.0})
            EXPECT_NEAR(zentest::MagnitudeDb(h, f, 48000.0), 0.0, 0.002) << factor << "x at " << f << " Hz";
    }
}

TEST(Oversampler, ImagesAndAliasesStayBelowTheStopBand) {
    constexpr std::size_t kFrames = 2400;
    for (std::size_t factor : {4, 8}) {
        const double highRate = 48000.0 * static_cast<double>(factor);
        Oversampler over(factor);
        over.SetChannelCount(1);
        over.Prepare(48000.0f, kFrames);
        // A 19 kHz tone: its images sit 19 kHz either side of each multiple of 48 kHz.
        const std::vector<float> tone = zentest::Sine(19000.0, 48000.0, kFrames);
        const float* high = over.Up(0, tone.data(), kFrames);
        // Whole periods of 1 kHz after the filters have filled.
        const std::size_t period = factor * 48;
        const std::size_t skip = (2 * factor * over.GetLatency() / period + 1) * period;
        const std::size_t length = kFrames * factor - skip;
        EXPECT_NEAR(ComponentDb(high + skip, length, 19000.0 / highRate), 0.0, 0.01) << factor;
        for (std::size_t m = 1; m < factor; ++m)
            for (double image : {48000.0 * m - 19000.0, 48000.0 * m + 19000.0})
                EXPECT_LT(ComponentDb(high + skip, length, image / highRate), -Oversampler::kStopbandDb + 2.0)
                    << factor << "x: " << image;

        // What the stage leaves above the host's Nyquist is gone after Down.
        for (double f : {24000.0, 25000.0, 31000.0, 47000.0, 72000.0, 95000.0, 121000.0, 168000.0, 191000.0}) {
            if (f >= 0.5 * highRate) continue;
            over.Reset();
            std::vector<float> out(kFrames);
            float* buffer = over.Up(0, out.data(), kFrames);
            for (std::size_t n = 0; n < kFrames * factor; ++n)
                buffer[n] = static_cast<float>(std::sin(2.0 * zentest::kPi * f * static_cast<double>(n) / highRate));
            over.Down(0, out.data(), kFrames);
            EXPECT_LT(zentest::ToDb(zentest::Peak(out, 2 * over.GetLatency())), -Oversampler::kStopbandDb + 2.0)
                << factor << "x: " << f << " Hz";
        }
    }
}

TEST(Oversampler, AStageOfAHalfOrAWholeSampleKeepsTheRoundTripOnWholeSamples) {
    // The stage averages each sample with the ones before: a box of two
    // (half a sample late) or a triangle of three (a whole sample late).
    const std::vector<std::vector<float>> stages = {{0.5f, 0.5f}, {0.25f, 0.5f, 0.25f}};
    for (std::size_t halfSamples : {1u, 2u}) {
        const std::vector<float>& taps = stages[halfSamples - 1];
        Oversampler over(8, halfSamples);
        over.SetChannelCount(2);
        over.Prepare(48000.0f, 512);
        std::vector<float> h = zentest::Impulse(512, 10);
        float* high = over.Up(1, h.data(), h.size());
        std::vector<float> in(high, high + 8 * h.size());
        for (std::size_t n = 0; n < in.size(); ++n) {
            double sum = 0.0;
            for (std::size_t k = 0; k < taps.size() && k <= n; ++k) sum += taps[k] * in[n - k];
            high[n] = static_cast<float>(sum);
        }
        over.Down(1, h.data(), h.size());
        const std::size_t peak = zentest::ArgPeak(h);
        EXPECT_EQ(peak, 10 + over.GetLatency()) << halfSamples;
        EXPECT_NEAR(h[peak - 1], h[peak + 1], 1e-6f) << halfSamples;
        EXPECT_NEAR(h[peak - 7], h[peak + 7], 1e-6f) << halfSamples;
    }
}
