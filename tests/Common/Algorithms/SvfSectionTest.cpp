// SvfSection: any BiQuad design gives the direct form's response, and a
// change of coefficients while a tone runs makes no step in the output.
#include <gtest/gtest.h>

#include <cmath>
#include <memory>

#include "Common/Algorithms/SvfSection.h"
#include "Support/Signals.h"

namespace {

std::unique_ptr<BiQuad> Design(BiQuad::Shape shape, float gainDb, float frequency, float q) {
    auto b = std::make_unique<BiQuad>();
    b->Prepare(48000.0f, 512);
    b->SetParameter(BiQuad::kShape, static_cast<float>(shape));
    b->SetParameter(BiQuad::kGain, gainDb);
    b->SetParameter(BiQuad::kFreq, frequency);
    b->SetParameter(BiQuad::kQ, q);
    b->SetParameter(BiQuad::kIn, 1.0f);
    return b;
}

}  // namespace

TEST(SvfSection, RunsAnyBiQuadDesign) {
    for (BiQuad::Shape shape : {BiQuad::kLowPass, BiQuad::kHighPass, BiQuad::kLowShelf, BiQuad::kHighShelf, BiQuad::kBell})
        for (float frequency : {30.0f, 1000.0f, 15000.0f}) {
            const auto direct = Design(shape, shape == BiQuad::kBell ? -9.0f : 12.0f, frequency, 0.8f);
            zen::SvfSection svf;
            svf.SetChannelCount(1);
            svf.Set(direct->GetCoefficients());
            std::vector<float> a = zentest::Impulse(8192), b = a;
            float* pa[] = {a.data()};
            float* pb[] = {b.data()};
            direct->Process(pa, a.size());
            svf.Process(pb, b.size());
            const float tolerance = 1e-5f * zentest::Peak(a);
            for (std::size_t n = 0; n < a.size(); ++n)
                ASSERT_NEAR(b[n], a[n], tolerance) << shape << ", " << frequency << " Hz, " << n;
        }
}

TEST(SvfSection, CoefficientsMoveWithoutStepsWhereTheDirectFormJumps) {
    // A 110 Hz tone through a high-pass whose corner moves from 80 to 90 Hz mid-way.
    auto largestStep = [](bool svf) {
        std::vector<float> x = zentest::Sine(110.0, 48000.0, 9600, 0.5);
        const auto direct = Design(BiQuad::kHighPass, 0.0f, 80.0f, 0.707f);
        zen::SvfSection section;
        section.SetChannelCount(1);
        for (std::size_t half : {0, 1}) {
            if (half == 1) direct->SetParameter(BiQuad::kFreq, 90.0f);
            section.Set(direct->GetCoefficients());
            float* p[] = {x.data() + half * 4800};
            svf ? section.Process(p, 4800) : (void)direct->Process(p, 4800);
        }
        return zentest::LargestStep(x);
    };
    const float natural = zentest::LargestStep(zentest::Sine(110.0, 48000.0, 9600, 0.5));
    EXPECT_LT(largestStep(true), 1.01f * natural);
    EXPECT_GT(largestStep(false), 2.0f * natural);  // what the direct form would do
}
