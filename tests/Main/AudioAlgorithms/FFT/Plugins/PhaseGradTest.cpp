// The per-frame choice of "Auto", the two phase reconstructions and the
// peak picking, on frames the tests place themselves. (How exact the phase
// derivatives are shows in the shifter's partials, PitchShiftEngineTest.)
#include <gtest/gtest.h>

#include <cmath>
#include <vector>

#include "FFT/Engine.h"
#include "FFT/Plugins/Dft2Out.h"
#include "FFT/Plugins/In2Dft.h"
#include "FFT/Plugins/PhaseGrad.h"
#include "FFT/Plugins/Plpv.h"
#include "FFT/Plugins/Polar2Rect.h"
#include "FFT/Plugins/Rect2Polar.h"
#include "FFT/Plugins/RtPghi.h"
#include "Support/Signals.h"

using namespace ora::fft;

namespace {

constexpr std::size_t kN = 4096;
constexpr std::size_t kHop = 1024;

struct Chain {
    In2Dft in;
    Rect2Polar toPolar;
    PhaseGrad grad;
    RtPghi pghi;
    Plpv plpv;
    Polar2Rect toRect;
    Dft2Out out;
    Engine engine;

    explicit Chain(std::size_t channels = 1) {
        EngineConfig config;
        config.channels = channels;
        config.sharedRow = true;
        config.frameLength = kN;
        config.fftLength = kN;
        config.hop = kHop;
        config.inputCapacity = 1 << 16;
        config.pipeline = {&in, &toPolar, &grad, &pghi, &plpv, &toRect, &out};
        EXPECT_TRUE(engine.Configure(config));
    }
    void Write(const std::vector<float>& x) {
        const float* p[1] = {x.data()};
        engine.Write(p, x.size());
    }
    std::int64_t Mask() { return *engine.GetFrame().Int(variable::MASK); }
};

}  // namespace

TEST(PhaseGrad, AutoUsesMagnitudesOnlyWhereTheFrameIsNew) {
    std::vector<float> x(30000, 0.0f);
    const auto tone = zentest::Sine(440.0, 48000.0, 20000, 0.5);
    std::copy(tone.begin(), tone.end(), x.begin() + 10000);
    Chain chain;
    chain.grad.SetMode(PhaseGrad::Mode::Auto);
    chain.Write(x);
    std::vector<std::int64_t> masks;
    for (std::int64_t start = 0; start + static_cast<std::int64_t>(kN) <= 30000; start += 1500) {
        chain.engine.RunFrame(start);
        masks.push_back(chain.Mask());
    }
    EXPECT_EQ(masks[0], 1);  // no history yet
    // The frame the tone enters in is new content; steady frames are not.
    bool sawOnset = false;
    for (std::size_t i = 1; i < masks.size(); ++i) {
        const std::int64_t start = static_cast<std::int64_t>(i) * 1500;
        if (start + static_cast<std::int64_t>(kN) > 10000 && start < 10000) sawOnset |= masks[i] == 1;
        if (start > 12000) {
            EXPECT_EQ(masks[i], 0) << "frame at " << start;
        }
    }
    EXPECT_TRUE(sawOnset);

    // At the synthesis hop nothing is stretched: Auto stays with the history.
    chain.engine.Reset();
    chain.Write(x);
    for (std::int64_t start = 0; start + static_cast<std::int64_t>(kN) <= 30000; start += kHop) {
        chain.engine.RunFrame(start);
        if (start > 0) {
            EXPECT_EQ(chain.Mask(), 0) << start;
        }
    }
}

TEST(PhaseReconstruction, BothGiveBackTheInputWhenNothingIsStretched) {
    const auto x = zentest::Noise(20000, 0.3, 5);
    for (bool pghi : {true, false}) {
        Chain chain;
        chain.grad.SetMode(PhaseGrad::Mode::PV);
        chain.pghi.SetEnabled(pghi);
        chain.plpv.SetEnabled(!pghi);
        chain.plpv.SetLog10Threshold(-7.0f);
        chain.plpv.SetMaxPeaks(256);
        std::vector<float> y(20000, 0.0f);
        const float* ip[1] = {x.data()};
        float* op[1] = {y.data()};
        chain.engine.Push(ip, op, x.size());
        double err = 0.0, ref = 0.0;
        for (std::size_t i = kN; i < 20000; ++i) {
            err += std::pow(y[i] - x[i - (kN - 1)], 2.0);
            ref += x[i - (kN - 1)] * x[i - (kN - 1)];
        }
        EXPECT_LT(10.0 * std::log10(err / ref), -70.0) << (pghi ? "PGHI" : "PLPV");
    }
}

TEST(Plpv, KeepsAtMostMaxPeakPeaksAboveTheThreshold) {
    // Partials at falling levels: 0, -20, -40, -60 and -80 dB.
    std::vector<float> x(12000, 0.0f);
    for (int i = 0; i < 5; ++i) {
        const auto s = zentest::Sine(500.0 + 700.0 * i, 48000.0, x.size(), std::pow(10.0, -i));
        for (std::size_t j = 0; j < x.size(); ++j) x[j] += s[j];
    }
    Chain chain;
    chain.pghi.SetEnabled(false);
    chain.plpv.SetEnabled(true);
    chain.Write(x);
    struct Case {
        float log10Eps;
        std::size_t maxPeaks;
        std::size_t expected;
    };
    for (const Case& c : {Case{-1.5f, 50, 2}, Case{-3.5f, 50, 4}, Case{-5.0f, 3, 3}, Case{-2.5f, 1, 1}}) {
        chain.plpv.SetLog10Threshold(c.log10Eps);
        chain.plpv.SetMaxPeaks(c.maxPeaks);
        chain.engine.RunFrame(0);
        chain.engine.RunFrame(1024);
        const auto& peaks = chain.plpv.Peaks();
        EXPECT_EQ(peaks.size(), c.expected) << "eps " << c.log10Eps << " max " << c.maxPeaks;
        // The strongest survive: the first is always the 500 Hz partial.
        ASSERT_FALSE(peaks.empty());
        EXPECT_NEAR(peaks[0] * 48000.0 / kN, 500.0, 12.0);
    }
}
