// LinkwitzRileyCrossover: the bands sum flat, each band is the product of
// the Linkwitz-Riley halves that reach it, and the split survives awkward
// settings, block splits and non-finite input.
#include <gtest/gtest.h>

#include <cmath>
#include <memory>

#include "Common/Algorithms/LinkwitzRileyCrossover.h"
#include "Support/Signals.h"

namespace {

const float kRates[] = {44100.0f, 48000.0f, 96000.0f};

std::unique_ptr<LinkwitzRileyCrossover> Make(float rate, std::size_t bands, const std::vector<float>& frequencies,
                                             std::uint64_t channels = 1, std::uint32_t block = 512) {
    auto x = std::make_unique<LinkwitzRileyCrossover>();
    x->SetChannelCount(channels);
    x->Prepare(rate, block);
    x->SetParameter(LinkwitzRileyCrossover::kBands, static_cast<float>(bands));
    for (std::size_t s = 0; s < frequencies.size(); ++s)
        x->SetParameter(LinkwitzRileyCrossover::kFrequency1 + s, frequencies[s]);
    return x;
}

// Every band's impulse response (channel 0), split block by block.
std::vector<std::vector<float>> BandResponses(LinkwitzRileyCrossover& x, std::size_t length) {
    const std::vector<float> impulse = zentest::Impulse(length);
    std::vector<std::vector<float>> bands(x.GetBandCount(), std::vector<float>(length));
    for (std::size_t done = 0; done < length; done += 512) {
        const float* in[] = {impulse.data() + done};
        x.Split(in, 512);
        for (std::size_t b = 0; b < bands.size(); ++b) std::copy_n(x.Band(b)[0], 512, bands[b].data() + done);
    }
    return bands;
}

// The magnitude the design promises for band `band` at `f`: the high halves
// of the splits below it, the low half of its own (|LR4|: 1 / (1 + r^4) with
// r the ratio of the prewarped frequencies).
double DesignDb(const LinkwitzRileyCrossover& x, std::size_t band, double f, double rate) {
    double gain = 1.0;
    for (std::size_t s = 0; s + 1 < x.GetBandCount(); ++s) {
        const double r = std::tan(zentest::kPi * f / rate) / std::tan(zentest::kPi * x.GetSplitFrequency(s) / rate);
        const double r4 = r * r * r * r;
        if (s < band) gain *= r4 / (1.0 + r4);
        if (s == band) gain *= 1.0 / (1.0 + r4);
    }
    return 20.0 * std::log10(gain);
}

}  // namespace

TEST(LinkwitzRileyCrossover, BandsSumFlatFrom20HzTo20kHz) {
    const std::vector<std::vector<float>> layouts = {{1000.0f}, {200.0f, 3000.0f}, {120.0f, 1000.0f, 5000.0f},
                                                     {80.0f, 400.0f, 2500.0f, 9000.0f}};
    for (float rate : kRates)
        for (const auto& frequencies : layouts) {
            auto x = Make(rate, frequencies.size() + 1, frequencies);
            std::vector<float> h = zentest::Impulse(16384);
            float* channels[] = {h.data()};
            ASSERT_TRUE(x->Process(channels, h.size()));
            double worst = 0.0;
            for (double f = 20.0; f <= 20000.0; f *= 1.08) worst = std::max(worst, std::fabs(zentest::MagnitudeDb(h, f, rate)));
            EXPECT_LT(worst, 0.01) << rate << " Hz, " << frequencies.size() + 1 << " bands";
        }
}

TEST(LinkwitzRileyCrossover, EachBandIsItsLinkwitzRileyHalvesAndMinus6dBAtItsEdges) {
    for (float rate : kRates) {
        auto x = Make(rate, 5, {100.0f, 600.0f, 3000.0f, 12000.0f});
        const auto bands = BandResponses(*x, 16384);
        for (std::size_t b = 0; b < bands.size(); ++b)
            for (double f : {50.0, 100.0, 250.0, 600.0, 1500.0, 3000.0, 6000.0, 12000.0, 16000.0}) {
                const double want = DesignDb(*x, b, f, rate);
                if (want < -60.0) continue;  // far in the stop band the float output's noise counts
                EXPECT_NEAR(zentest::MagnitudeDb(bands[b], f, rate), want, 0.01) << rate << " Hz, band " << b << " at " << f;
            }
        // Neighbours cross at -6 dB.
        EXPECT_NEAR(zentest::MagnitudeDb(bands[0], 100.0, rate), -6.02, 0.05);
        EXPECT_NEAR(zentest::MagnitudeDb(bands[1], 100.0, rate), -6.02, 0.05);
        EXPECT_NEAR(zentest::MagnitudeDb(bands[3], 12000.0, rate), -6.02, 0.05);
        EXPECT_NEAR(zentest::MagnitudeDb(bands[4], 12000.0, rate), -6.02, 0.05);
    }
}

TEST(LinkwitzRileyCrossover, SplitPointsAreSortedAndHeldBelowNyquist) {
    auto ordered = Make(48000.0f, 4, {150.0f, 2000.0f, 8000.0f});
    auto shuffled = Make(48000.0f, 4, {8000.0f, 150.0f, 2000.0f});
    EXPECT_EQ(BandResponses(*ordered, 2048), BandResponses(*shuffled, 2048));

    // 20 kHz at 22.05 kHz: held at 0.45 of the rate, still flat and finite.
    auto low = Make(22050.0f, 2, {20000.0f});
    EXPECT_DOUBLE_EQ(low->GetSplitFrequency(0), 0.45 * 22050.0);
    std::vector<float> h = zentest::Impulse(8192);
    float* channels[] = {h.data()};
    low->Process(channels, h.size());
    for (double f : {20.0, 1000.0, 9000.0, 10500.0}) EXPECT_NEAR(zentest::MagnitudeDb(h, f, 22050.0), 0.0, 0.01) << f;
}

TEST(LinkwitzRileyCrossover, OneBandIsAWireAndChannelsAndBlockSplitsAreIndependent) {
    const std::vector<float> noise = zentest::Noise(3000, 0.5, 3);
    auto wire = Make(48000.0f, 1, {});
    std::vector<float> y = noise;
    float* one[] = {y.data()};
    wire->Process(one, y.size());
    EXPECT_EQ(y, noise);

    // Three channels, whole against sample-awkward chunks of the split.
    auto whole = Make(48000.0f, 5, {90.0f, 700.0f, 4000.0f, 11000.0f}, 3, 4096);
    auto chunked = Make(48000.0f, 5, {90.0f, 700.0f, 4000.0f, 11000.0f}, 3, 37);
    std::vector<std::vector<float>> a(3, noise), b(3, noise);
    a[1] = zentest::Noise(3000, 0.5, 4);
    b[1] = a[1];
    float* pa[] = {a[0].data(), a[1].data(), a[2].data()};
    float* pb[] = {b[0].data(), b[1].data(), b[2].data()};
    whole->Process(pa, 3000);
    chunked->Process(pb, 3000);
    EXPECT_EQ(a, b);
    EXPECT_EQ(a[0], a[2]);
    EXPECT_NE(a[0], a[1]);
}

TEST(LinkwitzRileyCrossover, NonFiniteInputClearsWithinTheBlock) {
    auto x = Make(48000.0f, 4, {150.0f, 2000.0f, 8000.0f}, 2);
    for (float bad : {NAN, INFINITY}) {
        std::vector<float> left = zentest::Noise(512, 0.5), right = left;
        left[100] = bad;
        float* channels[] = {left.data(), right.data()};
        x->Process(channels, 512);
        std::vector<float> after = zentest::Noise(512, 0.5, 9);
        std::vector<float> other = after;
        float* next[] = {after.data(), other.data()};
        x->Process(next, 512);
        for (float v : after) ASSERT_TRUE(std::isfinite(v)) << bad;
    }
}
