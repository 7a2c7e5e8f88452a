// The 16-lane damping and the 16-lane tone correction: responses, the
// denormal guard and the state a rebuild to another form keeps (the forms
// against ref are in FormEquivalenceTest).
#include <gtest/gtest.h>

#include <cfloat>
#include <cmath>
#include <vector>

#include "Algorithms/Lpf16.h"
#include "Algorithms/Lpfm16.h"
#include "KernelForms.h"

using namespace ora::numeric;
using ora::system::ScopedDispatch;

namespace {

// Steady-state gain of lane i for a constant (dc) or alternating (Nyquist) input.
template <class Filter>
std::vector<float> SteadyGains(Filter& filter, bool alternating) {
    const std::size_t frames = 4000;
    std::vector<float> in(frames * 16), out(frames * 16);
    for (std::size_t f = 0; f < frames; ++f)
        for (int i = 0; i < 16; ++i) in[f * 16 + i] = alternating && f % 2 ? -1.0f : 1.0f;
    filter.Process(in.data(), out.data(), frames);
    filter.Reset();
    std::vector<float> gains(16);
    for (int i = 0; i < 16; ++i) gains[i] = std::fabs(out[(frames - 1) * 16 + i]);
    return gains;
}

void Coefficients(float* c, float* g) {
    for (int i = 0; i < 16; ++i) {
        c[i] = -0.9f * static_cast<float>(i) / 15.0f;  // 0 .. -0.9
        g[i] = 0.5f + 0.03f * static_cast<float>(i);
    }
}

}  // namespace

TEST(Lpf16, BothLowPassesHaveTheLaneGainAtDcAndADampedNyquist) {
    float c[16], g[16];
    Coefficients(c, g);
    Lpf16 damping;
    damping.SetCoefficients(c, g);
    Lpfm16 tone;  // unit gain
    tone.SetCoefficients(c);
    const auto dampingDc = SteadyGains(damping, false), dampingNyquist = SteadyGains(damping, true);
    const auto toneDc = SteadyGains(tone, false), toneNyquist = SteadyGains(tone, true);
    for (int i = 0; i < 16; ++i) {
        const float nyquist = (1.0f + c[i]) / (1.0f - c[i]);
        EXPECT_NEAR(dampingDc[i], g[i], 1e-5) << i;
        EXPECT_NEAR(dampingNyquist[i], g[i] * nyquist, 1e-4) << i;
        EXPECT_NEAR(toneDc[i], 1.0f, 1e-5) << i;
        EXPECT_NEAR(toneNyquist[i], nyquist, 1e-4) << i;
    }
}

TEST(Lpf16, DecayingStateNeverTurnsDenormal) {
    // Without FTZ/DAZ: the guard alone keeps the state out of denormals (it
    // settles at zero or at a few steps of the guard's rounding, far below audibility).
    float c[16], g[16];
    for (int i = 0; i < 16; ++i) {
        c[i] = -0.99f;
        g[i] = 1.0f;
    }
    Lpf16 filter;
    filter.SetCoefficients(c, g);
    std::vector<float> frames(16 * 20000, 0.0f);
    for (int i = 0; i < 16; ++i) frames[i] = 1e-20f;
    filter.Process(frames.data(), frames.data(), 20000);
    for (int i = 0; i < 16; ++i) {
        const float s = std::fabs(filter.State().s[i]);
        EXPECT_TRUE(s == 0.0f || s >= FLT_MIN) << s;
        EXPECT_LT(s, 1e-22f);
    }
}

TEST(Lpfm16, ARebuildToAnotherFormKeepsTheState) {
    float c[16], unused[16];
    Coefficients(c, unused);
    const std::size_t frames = 300;
    const auto in = kerneltest::RandomFloats(frames * 16, 6);
    std::vector<float> expected(frames * 16);
    {
        ScopedDispatch forced(ora::system::InstructionLevel::None, false);
        Lpfm16 ref;
        ref.SetCoefficients(c);
        ref.Process(in.data(), expected.data(), frames);
    }
    kerneltest::ForEachForm(true, [&](const kerneltest::Form& form, const std::string& name) {
        std::vector<float> got(frames * 16);
        Lpfm16 filter;
        filter.SetCoefficients(c);
        {
            ScopedDispatch forced(ora::system::InstructionLevel::None, false);
            filter.Rebuild();
            filter.Process(in.data(), got.data(), 100);
        }
        filter.Rebuild();  // back to the form forced outside
        EXPECT_EQ(filter.FormName(), name);
        filter.Process(in.data() + 1600, got.data() + 1600, frames - 100);
        for (std::size_t i = 0; i < got.size(); ++i) {
            if (kerneltest::Fused(form.form)) ASSERT_NEAR(got[i], expected[i], 2e-6f) << name << " at " << i;
            else ASSERT_EQ(got[i], expected[i]) << name << " at " << i;
        }
    });
}
