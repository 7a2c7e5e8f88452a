// BiQuad: the running filter's measured response against each design, at the
// rates the library runs at.
#include <gtest/gtest.h>

#include <cmath>
#include <complex>
#include <memory>

#include "Common/Algorithms/BiQuad.h"
#include "Support/Signals.h"

namespace {

constexpr double kPi = 3.141592653589793;
const float kRates[] = {44100.0f, 48000.0f, 96000.0f, 192000.0f};

std::unique_ptr<BiQuad> Make(float rate, BiQuad::Shape shape, float gainDb, float frequency, float q) {
    auto filter = std::make_unique<BiQuad>();
    filter->Prepare(rate, 512);
    filter->SetParameter(BiQuad::kShape, static_cast<float>(shape));
    filter->SetParameter(BiQuad::kGain, gainDb);
    filter->SetParameter(BiQuad::kFreq, frequency);
    filter->SetParameter(BiQuad::kQ, q);
    filter->SetParameter(BiQuad::kIn, 1.0f);
    return filter;
}

// Magnitude in dB at `frequency` of the filter's impulse response, run
// through the filter itself (block by block).
double MeasuredDb(BiQuad& filter, float rate, double frequency, std::size_t length = 1 << 16) {
    std::vector<float> h = zentest::Impulse(length);
    for (std::size_t done = 0; done < length; done += 512) filter.ProcessChannel(0, h.data() + done, 512);
    std::complex<double> sum = 0.0;
    const double w = 2.0 * kPi * frequency / rate;
    for (std::size_t n = 0; n < length; ++n) sum += static_cast<double>(h[n]) * std::polar(1.0, -w * static_cast<double>(n));
    filter.Reset();
    return 20.0 * std::log10(std::abs(sum));
}

}  // namespace

TEST(BiQuad, BellHasItsGainAtTheCentre) {
    for (float rate : kRates)
        for (float gain : {-12.0f, -3.0f, 6.0f, 18.0f}) {
            auto bell = Make(rate, BiQuad::kBell, gain, 1000.0f, 1.5f);
            EXPECT_NEAR(MeasuredDb(*bell, rate, 1000.0), gain, 0.05) << rate << " Hz, " << gain << " dB";
            EXPECT_NEAR(MeasuredDb(*bell, rate, 20.0), 0.0, 0.1) << rate;  // far from the centre: flat
        }
}

TEST(BiQuad, ShelvesHaveTheirGainsAtDcAndNyquistCappedNearNyquist) {
    for (float rate : kRates) {
        auto low = Make(rate, BiQuad::kLowShelf, 9.0f, 500.0f, 0.707f);
        EXPECT_NEAR(MeasuredDb(*low, rate, 0.0), 9.0, 0.05) << rate;
        EXPECT_NEAR(MeasuredDb(*low, rate, rate / 2.0), 0.0, 0.05) << rate;
        auto lowCut = Make(rate, BiQuad::kLowShelf, -9.0f, 500.0f, 0.707f);
        EXPECT_NEAR(MeasuredDb(*lowCut, rate, 0.0), -9.0, 0.05) << rate;

        auto high = Make(rate, BiQuad::kHighShelf, 6.0f, 3000.0f, 0.707f);
        EXPECT_NEAR(MeasuredDb(*high, rate, 0.0), 0.0, 0.05) << rate;
        EXPECT_NEAR(MeasuredDb(*high, rate, rate / 2.0), 6.0, 0.05) << rate;
        auto highCut = Make(rate, BiQuad::kHighShelf, -12.0f, 3000.0f, 0.707f);
        EXPECT_NEAR(MeasuredDb(*highCut, rate, rate / 2.0), -12.0, 0.05) << rate;
    }
    // Near Nyquist the boost is capped: at 48 kHz and 20 kHz, (24000/20000)^2 = 1.44, about +3.2 dB.
    auto high = Make(48000.0f, BiQuad::kHighShelf, 18.0f, 20000.0f, 0.707f);
    EXPECT_NEAR(MeasuredDb(*high, 48000.0f, 24000.0), 20.0 * std::log10(1.44), 0.05);
}

TEST(BiQuad, PassesLowAndHighPassWithCornerGainEqualToQ) {
    for (float rate : kRates)
        for (float q : {0.5f, 0.707f, 2.0f}) {
            auto lpf = Make(rate, BiQuad::kLowPass, 0.0f, 2000.0f, q);
            EXPECT_NEAR(MeasuredDb(*lpf, rate, 0.0), 0.0, 0.01) << rate;
            EXPECT_NEAR(MeasuredDb(*lpf, rate, 2000.0), 20.0 * std::log10(q), 0.05) << rate << " Q " << q;
            EXPECT_LT(MeasuredDb(*lpf, rate, rate / 2.0), -100.0) << rate;

            auto hpf = Make(rate, BiQuad::kHighPass, 0.0f, 2000.0f, q);
            EXPECT_NEAR(MeasuredDb(*hpf, rate, rate / 2.0), 0.0, 0.01) << rate;
            EXPECT_NEAR(MeasuredDb(*hpf, rate, 2000.0), 20.0 * std::log10(q), 0.05) << rate << " Q " << q;
            EXPECT_LT(MeasuredDb(*hpf, rate, 0.0), -100.0) << rate;
        }
}

TEST(BiQuad, BandPassRunsItsDesignWithZerosAtDcAndNyquist) {
    for (float rate : kRates) {
        BiQuad band;
        band.Prepare(rate, 512);
        band.SetParameter(BiQuad::kIn, 1.0f);
        band.SetBandPass(3000.0, 2.0);
        EXPECT_EQ(band.GetType(), BiQuad::kBandPassType);
        // The design's own transfer function, g (1 + c3 z^-1 + c2 z^-2) / (1 - c1 z^-1 - c0 z^-2).
        const BiQuad::Coefficients c = band.GetCoefficients();
        for (double f : {300.0, 2000.0, 3000.0, 5000.0}) {
            const std::complex<double> z1 = std::polar(1.0, -2.0 * kPi * f / rate);
            const std::complex<double> h = c.g * (1.0 + c.c3 * z1 + c.c2 * z1 * z1) / (1.0 - c.c1 * z1 - c.c0 * z1 * z1);
            EXPECT_NEAR(MeasuredDb(band, rate, f), 20.0 * std::log10(std::abs(h)), 0.01) << rate << " " << f;
        }
        EXPECT_LT(MeasuredDb(band, rate, 0.0), -100.0) << rate;
        EXPECT_LT(MeasuredDb(band, rate, rate / 2.0), -100.0) << rate;
        EXPECT_GT(MeasuredDb(band, rate, 3000.0), MeasuredDb(band, rate, 300.0) + 10.0) << rate;
    }
}

TEST(BiQuad, ShelfPairShapesBothEnds) {
    BiQuad pair;
    pair.Prepare(48000.0f, 512);
    pair.SetParameter(BiQuad::kIn, 1.0f);
    pair.SetShelfPair(200.0, 2.0, 5000.0, 0.5);
    EXPECT_NEAR(MeasuredDb(pair, 48000.0f, 0.0), 20.0 * std::log10(2.0), 0.05);
    EXPECT_NEAR(MeasuredDb(pair, 48000.0f, 24000.0), 20.0 * std::log10(0.5), 0.05);
    EXPECT_NEAR(MeasuredDb(pair, 48000.0f, 1000.0), 0.0, 1.0);  // between the two: near flat
    pair.SetShelfPair(200.0, 1.0, 5000.0, 1.0);
    EXPECT_EQ(pair.GetCoefficients().g, 1.0);  // both gains 1: the wire
}

TEST(BiQuad, DisabledSectionsZeroDecibelShelvesAndUnknownShapesPassTheSignal) {
    const std::vector<float> input = zentest::Noise(4096, 1.0);
    auto output = [&](float shape, float gainDb, float in) {
        auto filter = Make(48000.0f, BiQuad::kBell, gainDb, 1000.0f, 1.0f);
        filter->SetParameter(BiQuad::kShape, shape);
        filter->SetParameter(BiQuad::kIn, in);
        std::vector<float> x = input;
        filter->ProcessChannel(0, x.data(), x.size());
        return x;
    };
    EXPECT_EQ(output(BiQuad::kBell, 12.0f, 0.999f), input);  // only exactly 1 switches on
    for (float shape : {float(BiQuad::kLowShelf), float(BiQuad::kHighShelf), 5.0f, -1.0f})
        EXPECT_EQ(output(shape, (shape < 0.0f || shape > 4.0f) ? 12.0f : 0.0f, 1.0f), input) << shape;
    const auto bell = output(BiQuad::kBell, 0.0f, 1.0f);
    for (std::size_t n = 0; n < input.size(); ++n) EXPECT_NEAR(bell[n], input[n], 1e-6);
}

TEST(BiQuad, BlockSplitsDoNotChangeTheOutput) {
    const std::vector<float> input = zentest::Noise(3001);
    std::vector<float> whole = input;
    auto reference = Make(48000.0f, BiQuad::kBell, 9.0f, 700.0f, 3.0f);
    reference->ProcessChannel(0, whole.data(), whole.size());
    for (std::size_t block : {1u, 3u, 4u, 5u, 512u}) {
        auto filter = Make(48000.0f, BiQuad::kBell, 9.0f, 700.0f, 3.0f);
        std::vector<float> split = input;
        for (std::size_t done = 0; done < split.size(); done += block)
            filter->ProcessChannel(0, split.data() + done, std::min(block, split.size() - done));
        EXPECT_EQ(split, whole) << block;
    }
}

TEST(BiQuad, ChannelsHaveTheirOwnStateAndExtraChannelsAreSilent) {
    auto filter = Make(48000.0f, BiQuad::kLowPass, 0.0f, 500.0f, 0.707f);
    filter->SetChannelCount(2);
    std::vector<float> a = zentest::Noise(256, 1.0, 1), b = zentest::Noise(256, 1.0, 2);
    std::vector<float> a2 = a;
    float* channels[2] = {a.data(), b.data()};
    filter->Process(channels, 256);
    auto alone = Make(48000.0f, BiQuad::kLowPass, 0.0f, 500.0f, 0.707f);
    alone->ProcessChannel(0, a2.data(), 256);
    EXPECT_EQ(a, a2);  // channel 1 did not disturb channel 0

    std::vector<float> extra(16, 1.0f);
    filter->ProcessChannel(5, extra.data(), extra.size());
    for (float v : extra) EXPECT_EQ(v, 0.0f);
}

TEST(BiQuad, TogglingInClearsStateButRedesignKeepsIt) {
    auto filter = Make(48000.0f, BiQuad::kLowPass, 0.0f, 100.0f, 0.707f);
    std::vector<float> x(64, 1.0f);
    filter->ProcessChannel(0, x.data(), x.size());
    filter->SetParameter(BiQuad::kFreq, 200.0f);  // state kept: output continues smoothly
    float next = 1.0f;
    filter->ProcessChannel(0, &next, 1);
    EXPECT_GT(next, x.back());
    filter->SetParameter(BiQuad::kIn, 0.0f);
    filter->SetParameter(BiQuad::kIn, 1.0f);  // cleared: starts from rest
    float first = 1.0f;
    filter->ProcessChannel(0, &first, 1);
    EXPECT_FLOAT_EQ(first, static_cast<float>(filter->GetCoefficients().g));
}

TEST(BiQuad, PrepareAtANewRateRedesignsWithTheSameParameters) {
    auto filter = Make(48000.0f, BiQuad::kBell, 6.0f, 1000.0f, 1.0f);
    filter->Prepare(96000.0f, 512);  // the parameters are kept, unlike other algorithms'
    EXPECT_NEAR(MeasuredDb(*filter, 96000.0f, 1000.0), 6.0, 0.05);
}

TEST(BiQuad, DecayingStateDoesNotTurnDenormal) {
    auto filter = Make(48000.0f, BiQuad::kLowPass, 0.0f, 50.0f, 0.707f);
    std::vector<float> x = zentest::Impulse(48000 * 4);
    filter->ProcessChannel(0, x.data(), x.size());
    for (std::size_t n = x.size() - 1000; n < x.size(); ++n) EXPECT_TRUE(x[n] == 0.0f || std::isnormal(x[n])) << n;
}

TEST(BiQuad, RecoversFromNonFiniteInput) {
    auto filter = Make(48000.0f, BiQuad::kBell, 6.0f, 1000.0f, 1.0f);
    std::vector<float> poisoned = {1.0f, NAN, INFINITY, 0.5f};
    filter->ProcessChannel(0, poisoned.data(), poisoned.size());
    std::vector<float> clean = zentest::Noise(512);
    filter->ProcessChannel(0, clean.data(), clean.size());
    for (float v : clean) ASSERT_TRUE(std::isfinite(v));
}
