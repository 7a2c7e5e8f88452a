// Polyphase up- and down-samplers: pass band, image and alias rejection,
// group delay, multichannel reference (the forms are in FormEquivalenceTest).
#include <gtest/gtest.h>

#include <cmath>
#include <complex>
#include <vector>

#include "Algorithms/Downsampler.h"
#include "Algorithms/KaiserLowPass.h"
#include "Algorithms/Upsampler.h"
#include "KernelForms.h"
#include "Support/Signals.h"

using namespace ora::numeric;
using zentest::kPi;

namespace {

// Amplitude of frequency f over x[from, from + n), n a whole number of periods.
double Amplitude(const std::vector<float>& x, double f, double fs, std::size_t from, std::size_t n) {
    std::complex<double> sum = 0.0;
    for (std::size_t i = 0; i < n; ++i) sum += double(x[from + i]) * std::polar(1.0, -2.0 * kPi * f * double(i) / fs);
    return 2.0 * std::abs(sum) / double(n);
}

std::vector<float> Upsample(std::size_t factor, const std::vector<float>& in, std::size_t block) {
    Upsampler up({factor, 32, {}, 1, 1024});
    std::vector<float> out(in.size() * factor);
    for (std::size_t done = 0; done < in.size(); done += block) {
        const std::size_t n = std::min(block, in.size() - done);
        up.Process(in.data() + done, out.data() + done * factor, n);
    }
    return out;
}

}  // namespace

TEST(KaiserLowPass, UnitDcGainSymmetricAndDeepStopBand) {
    const auto h = KaiserLowPass(128, 0.1, 8.0);
    double dc = 0.0;
    for (float v : h) dc += v;
    EXPECT_NEAR(dc, 1.0, 1e-6);
    for (std::size_t i = 0; i < h.size(); ++i) EXPECT_FLOAT_EQ(h[i], h[h.size() - 1 - i]);
    for (double f : {0.2, 0.3, 0.45}) {
        std::complex<double> H = 0.0;
        for (std::size_t i = 0; i < h.size(); ++i) H += double(h[i]) * std::polar(1.0, -2.0 * kPi * f * double(i));
        EXPECT_LT(20.0 * std::log10(std::abs(H)), -75.0) << f;
    }
}

TEST(Upsampler, PassesTheBandRejectsImagesAndDelaysByHalfItsLength) {
    for (std::size_t factor : {2u, 4u, 8u}) {
        const double fs = 48000.0, high = fs * double(factor);
        const auto out = Upsample(factor, zentest::Sine(1000.0, fs, 9600), 512);
        const std::size_t n = 48 * 100 * factor;  // 100 periods, after the warm-up
        EXPECT_NEAR(Amplitude(out, 1000.0, high, 4000 * factor, n), 1.0, 0.002) << factor;
        for (double image : {fs - 1000.0, fs + 1000.0})
            EXPECT_LT(20.0 * std::log10(Amplitude(out, image, high, 4000 * factor, n)), -70.0) << factor << " " << image;

        std::vector<float> impulse(200, 0.0f);
        impulse[0] = 1.0f;
        Upsampler up({factor, 32, {}, 1, 1024});
        std::vector<float> response(200 * factor);
        up.Process(impulse.data(), response.data(), 200);
        double weighted = 0.0, sum = 0.0;
        for (std::size_t i = 0; i < response.size(); ++i) {
            weighted += double(i) * response[i];
            sum += response[i];
        }
        EXPECT_NEAR(weighted / sum, up.Delay(), 1e-3) << factor;  // symmetric: centroid = centre
        EXPECT_NEAR(sum, double(factor), 1e-4);                   // unit gain at DC on every phase
    }
}

TEST(Downsampler, PassesTheBandAndRejectsAliases) {
    for (std::size_t factor : {2u, 4u}) {
        const double low = 48000.0, fs = low * double(factor);
        Downsampler down({factor, 32, {}, 1, 2048});
        auto run = [&](double f) {
            const auto in = zentest::Sine(f, fs, 9600 * factor);
            std::vector<float> out(9600);
            for (std::size_t done = 0; done < in.size(); done += 2048) {
                down.Process(in.data() + done, out.data() + done / factor, std::min<std::size_t>(2048, in.size() - done));
            }
            down.Reset();
            return out;
        };
        EXPECT_NEAR(Amplitude(run(1000.0), 1000.0, low, 2400, 4800), 1.0, 0.002) << factor;
        // 30 kHz folds to 18 kHz at 48 kHz.
        EXPECT_LT(20.0 * std::log10(Amplitude(run(30000.0), 18000.0, low, 2400, 4800)), -70.0) << factor;
    }
}

TEST(Polyphase, TwoInterleavedChannelsEqualEachChannelAlone) {
    const auto left = kerneltest::RandomFloats(400, 1), right = kerneltest::RandomFloats(400, 2);
    std::vector<float> both(800);
    for (int i = 0; i < 400; ++i) {
        both[2 * i] = left[i];
        both[2 * i + 1] = right[i];
    }
    Upsampler upBoth({4, 8, {}, 2, 400}), upLeft({4, 8, {}, 1, 400});
    std::vector<float> outBoth(3200), outLeft(1600);
    upBoth.Process(both.data(), outBoth.data(), 400);
    upLeft.Process(left.data(), outLeft.data(), 400);
    Downsampler downBoth({4, 8, {}, 2, 400}), downRight({4, 8, {}, 1, 400});
    std::vector<float> dBoth(200), dRight(100);
    downBoth.Process(both.data(), dBoth.data(), 400);
    downRight.Process(right.data(), dRight.data(), 400);
    for (int i = 0; i < 1600; ++i) ASSERT_NEAR(outBoth[2 * i], outLeft[i], 1e-6f) << i;
    for (int i = 0; i < 100; ++i) ASSERT_NEAR(dBoth[2 * i + 1], dRight[i], 1e-6f) << i;
    EXPECT_STREQ(upBoth.FormName(), "ref");  // two channels: the reference form
}

TEST(Polyphase, BadShapesAreRefused) {
    EXPECT_THROW(Upsampler({3, 8, {}, 1, 64}), std::invalid_argument);
    EXPECT_THROW(Downsampler({1, 8, {}, 1, 64}), std::invalid_argument);
    EXPECT_THROW(Upsampler({2, 8, {}, 0, 64}), std::invalid_argument);
}
