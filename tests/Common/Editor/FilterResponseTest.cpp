// FilterResponse: the drawn response of BiQuad cascades and of each
// crossover band equals what the running filters do to an impulse, and the
// crossover's bands sum flat.
#include <gtest/gtest.h>

#include <complex>

#include "Common/Algorithms/BiQuad.h"
#include "Common/Algorithms/LinkwitzRileyCrossover.h"
#include "Common/Editor/FilterResponse.h"
#include "Support/Signals.h"

namespace {

const double kFrequencies[] = {25.0, 60.0, 110.0, 300.0, 900.0, 1700.0, 3000.0, 6500.0, 11000.0, 19000.0};

}  // namespace

TEST(FilterResponseTest, BiQuadCascadeAndGainMatchTheFiltersImpulseResponse) {
    const float rate = 44100.0f;
    BiQuad bell, highPass;
    for (BiQuad* b : {&bell, &highPass}) b->Prepare(rate, 4096);
    for (auto [index, value] : {std::pair{BiQuad::kIn, 1.0f},
                                {BiQuad::kShape, float{BiQuad::kBell}},
                                {BiQuad::kGain, 9.0f},
                                {BiQuad::kFreq, 2500.0f},
                                {BiQuad::kQ, 3.0f}})
        bell.SetParameter(index, value);
    for (auto [index, value] : {std::pair{BiQuad::kIn, 1.0f},
                                {BiQuad::kShape, float{BiQuad::kHighPass}},
                                {BiQuad::kFreq, 150.0f},
                                {BiQuad::kQ, 0.9f}})
        highPass.SetParameter(index, value);

    std::vector<float> impulse = zentest::Impulse(16384);
    float* channel = impulse.data();
    bell.Process(&channel, impulse.size());
    highPass.Process(&channel, impulse.size());

    FilterResponse drawn(rate);
    drawn.Add(bell.GetCoefficients()).Add(highPass.GetCoefficients()).AddGainDb(-4.0);
    for (double f : kFrequencies)
        EXPECT_NEAR(drawn.MagnitudeDb(f), zentest::MagnitudeDb(impulse, f, rate) - 4.0, 0.01) << f << " Hz";
    // The raw form normalises by a0.
    FilterResponse raw(rate);
    raw.Add(FilterResponse::Raw(2.0, 0.0, 0.0, 4.0, 0.0, 0.0));
    EXPECT_NEAR(raw.MagnitudeDb(1000.0), -6.0206, 1e-3);
}

TEST(FilterResponseTest, CrossoverBandsAreTheSplitBandsAndSumFlat) {
    for (float rate : {44100.0f, 96000.0f}) {
        LinkwitzRileyCrossover crossover;
        crossover.Prepare(rate, 8192);
        crossover.SetParameter(LinkwitzRileyCrossover::kBands, 4.0f);
        // Out of order: the crossover sorts its splits, and so must the curves.
        crossover.SetParameter(LinkwitzRileyCrossover::kFrequency1, 2500.0f);
        crossover.SetParameter(LinkwitzRileyCrossover::kFrequency2, 90.0f);
        crossover.SetParameter(LinkwitzRileyCrossover::kFrequency3, 700.0f);

        const std::size_t length = 8192;
        const std::vector<float> impulse = zentest::Impulse(length);
        const float* input = impulse.data();
        crossover.Split(&input, length);

        for (double f : kFrequencies) {
            std::complex<double> sum = 0.0;
            for (std::size_t band = 0; band < crossover.GetBandCount(); ++band) {
                const FilterResponse drawn = FilterResponse::CrossoverBand(crossover, band);
                sum += drawn.At(f);
                const std::vector<float> measured(crossover.Band(band)[0], crossover.Band(band)[0] + length);
                const double expected = zentest::MagnitudeDb(measured, f, rate);
                if (expected > -60.0) {
                    EXPECT_NEAR(drawn.MagnitudeDb(f), expected, 0.05) << band << ", " << f << " Hz";
                }
            }
            EXPECT_NEAR(20.0 * std::log10(std::abs(sum)), 0.0, 0.01) << f << " Hz at " << rate;
        }
    }
}
