// ThreeBandEq: flat is exact, each band reaches its gain where its design
// puts it, and the ringing bound holds for the sharpest settings.
#include <gtest/gtest.h>

#include <cmath>

#include "Common/Algorithms/ThreeBandEq.h"
#include "Support/Signals.h"

namespace {

constexpr float kRate = 48000.0f;

std::vector<float> Equalised(ThreeBandEq& eq, std::vector<float> x) {
    for (std::size_t done = 0; done < x.size(); done += 512) {
        float* channels[] = {x.data() + done};
        eq.Process(channels, std::min<std::size_t>(512, x.size() - done));
    }
    return x;
}

std::vector<float> ImpulseResponse(const std::vector<std::pair<ThreeBandEq::Parameter, float>>& settings) {
    ThreeBandEq eq;
    eq.SetChannelCount(1);
    eq.Prepare(kRate, 512);
    for (const auto& [parameter, value] : settings) eq.SetParameter(parameter, value);
    return Equalised(eq, zentest::Impulse(1 << 16));
}

}  // namespace

TEST(ThreeBandEq, FlatIsExactAndEachBandReachesItsGain) {
    const std::vector<float> noise = zentest::Noise(4096, 0.5);
    ThreeBandEq flat;
    flat.SetChannelCount(1);
    flat.Prepare(kRate, 512);
    EXPECT_EQ(Equalised(flat, noise), noise);

    const std::vector<float> h = ImpulseResponse({{ThreeBandEq::kLowGain, 6.0f},
                                                  {ThreeBandEq::kMidGain, -9.0f},
                                                  {ThreeBandEq::kMidFrequency, 2000.0f},
                                                  {ThreeBandEq::kHighGain, 4.0f},
                                                  {ThreeBandEq::kHighFrequency, 16000.0f}});
    EXPECT_NEAR(zentest::MagnitudeDb(h, 0.0, kRate), 6.0, 0.02);    // low shelf at DC
    EXPECT_NEAR(zentest::MagnitudeDb(h, 2000.0, kRate), -9.0, 0.1);  // the bell, the shelves' skirts beside it
    EXPECT_NEAR(zentest::MagnitudeDb(h, kRate / 2, kRate), 4.0, 0.02);  // high shelf at Nyquist
}

TEST(ThreeBandEq, RingsNoLongerThanItsBoundSays) {
    const std::vector<float> h = ImpulseResponse(
        {{ThreeBandEq::kMidGain, 18.0f}, {ThreeBandEq::kMidFrequency, 200.0f}, {ThreeBandEq::kMidQ, 6.0f}});
    const float peak = zentest::Peak(h);
    std::size_t last = 0;
    for (std::size_t n = 0; n < h.size(); ++n)
        if (std::fabs(h[n]) > peak * 1e-5f) last = n;
    EXPECT_LE(static_cast<double>(last), ThreeBandEq::RingSeconds(18.0, 200.0, 6.0, 100.0) * kRate);
}
