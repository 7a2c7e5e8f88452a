// AutoCorr: the lagged sums against double precision, zero beyond the
// block, the period of a voiced sound, and every form against ref over
// awkward block lengths and lag counts from misaligned buffers.
#include <gtest/gtest.h>

#include <cmath>

#include "Algorithms/AutoCorr.h"
#include "KernelForms.h"

using namespace kerneltest;
using ora::numeric::AutoCorr;
using ora::numeric::AutoCorrConfig;

TEST(AutoCorr, SumsTheLaggedProductsAndIsZeroBeyondTheBlock) {
    const std::vector<float> x = RandomFloats(300, 5);
    std::vector<float> r(320, -1.0f);
    const AutoCorr autocorr(AutoCorrConfig{r.size()});
    EXPECT_EQ(autocorr.GetLagCount(), 320u);
    autocorr.Process(x.data(), x.size(), r.data());
    for (std::size_t k = 0; k < r.size(); ++k) {
        double sum = 0.0, magnitude = 0.0;
        for (std::size_t n = 0; n + k < x.size(); ++n) {
            sum += double(x[n]) * x[n + k];
            magnitude += std::fabs(double(x[n]) * x[n + k]);
        }
        ASSERT_NEAR(r[k], sum, 1e-6 * magnitude) << "lag " << k;
        if (k >= x.size()) {
            ASSERT_EQ(r[k], 0.0f) << "lag " << k;
        }
    }
}

TEST(AutoCorr, PeaksAtThePeriodOfAVoicedSound) {
    // Five harmonics of 200 Hz at 48 kHz: the strongest lag past the first
    // fall is the period, 240 samples.
    const std::size_t frames = 2048, period = 240;
    std::vector<float> x(frames, 0.0f);
    for (std::size_t n = 0; n < frames; ++n)
        for (int h = 1; h <= 5; ++h)
            x[n] += static_cast<float>(std::sin(2.0 * M_PI * h * double(n) / period + h) / h);
    std::vector<float> r(400);
    AutoCorr(AutoCorrConfig{r.size()}).Process(x.data(), frames, r.data());
    std::size_t best = 40;
    for (std::size_t k = 40; k < r.size(); ++k)
        if (r[k] > r[best]) best = k;
    EXPECT_EQ(best, period);
    EXPECT_GT(r[period], 0.8f * r[0]);
}

TEST(AutoCorr, EveryFormGivesTheReferenceResult) {
    const std::vector<float> signal = RandomFloats(4095, 17);
    for (std::size_t lags : {1u, 3u, 8u, 17u, 40u, 100u}) {
        for (std::size_t frames : AwkwardLengths()) {
            std::vector<float> want(lags);
            {
                ora::system::ScopedDispatch forced(InstructionLevel::None, false);
                AutoCorr(AutoCorrConfig{lags}).Process(signal.data(), frames, want.data());
            }
            ForEachForm(true, [&](const Form& form, const std::string& name) {
                const AutoCorr autocorr(AutoCorrConfig{lags});
                EXPECT_EQ(autocorr.FormName(), name);
                Guarded<> x(frames), r(lags);
                std::copy_n(signal.begin(), frames, x.data());
                autocorr.Process(x.data(), frames, r.data());
                ASSERT_TRUE(r.GuardsIntact()) << name << " " << frames << " frames, " << lags << " lags";
                for (std::size_t k = 0; k < lags; ++k) {
                    double magnitude = 0.0;
                    for (std::size_t n = 0; n + k < frames; ++n) magnitude += std::fabs(double(x[n]) * x[n + k]);
                    const double bound = Fused(form.form) ? std::ldexp(magnitude * double(frames), -22) : 0.0;
                    ASSERT_LE(std::fabs(double(r[k]) - want[k]), bound)
                        << name << " " << frames << " frames, lag " << k << ": " << r[k] << " vs " << want[k];
                }
            });
        }
    }
}
