// ShaperIntegrals: each curve's second antiderivative against the library's
// functions in long double, and every form against the reference bit for bit
// (the antiderivatives and their peak, the means and which steps are too
// small, the scaled output).
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <vector>

#include "Algorithms/ShaperIntegrals.h"
#include "KernelForms.h"

using namespace ora::numeric;

namespace {

const ShaperShape kShapes[] = {
    {ShaperCurve::Tape}, {ShaperCurve::Tube, 1.3, 0.2, 0.196, 0.836}, {ShaperCurve::Hard}, {ShaperCurve::FoldBack}};

long double RootIntegral(long double v) { return 0.5L * (v * std::sqrt(1.0L + v * v) + std::asinh(v)); }

long double Reference(const ShaperShape& s, long double u) {
    switch (s.curve) {
        case ShaperCurve::Tape: return RootIntegral(u);
        case ShaperCurve::Tube:
            return (RootIntegral(s.k * u + s.bias) / (s.k * s.k) - 0.5L * s.biasLevel * u * u) * s.scale;
        case ShaperCurve::Hard: {
            const long double m = std::fabs(u);
            return m <= 1.0L ? u * u * u / 6.0L : std::copysign(0.5L * m * m - 0.5L * m + 1.0L / 6.0L, u);
        }
        case ShaperCurve::FoldBack: return u - std::sin(u);
    }
    return 0.0L;
}

}  // namespace

TEST(ShaperIntegrals, EachCurveWithinTenUnitsOfItsSizeOrOfOne) {
    // Differences of these values are divided by squared steps: the error
    // must stay within ten units of the value's size (of 1 below it).
    std::vector<double> inputs = {0.0, 1e-9, -3e-5, 0.999999, 1.0, 1.000001, -1.0, 3.14159, 6.2831853, 1e3, -7e4};
    for (int i = -7000; i <= 7000; ++i) inputs.push_back(i * 0.01 + 0.003);
    for (const ShaperShape& shape : kShapes)
        for (double u : inputs) {
            const long double expected = Reference(shape, u);
            const double got = ShaperIntegrals::Evaluate(shape, u);
            ASSERT_LE(std::fabs(got - expected), 2e-15L * (std::fabs(expected) + 1.0L))
                << static_cast<int>(shape.curve) << " at " << u;
        }
}

TEST(ShaperIntegrals, EveryFormAgreesWithTheReferenceBitForBit) {
    const std::size_t total = kerneltest::AwkwardTotal();
    std::vector<float> pre = kerneltest::RandomFloats(total, 7, 30.0f), in = kerneltest::RandomFloats(total, 8);
    for (float& p : pre) p = std::fabs(p) + 0.5f;
    for (const ShaperShape& shape : kShapes) {
        std::vector<double> refU(total), refF2(total);
        double refPeak = 0.0;
        {
            ora::system::ScopedDispatch forced(ora::system::InstructionLevel::None, false);
            ShaperIntegrals ref;
            ASSERT_EQ(ref.GetForm(), ora::system::KernelForm::Ref);
            refPeak = ref.Evaluate(shape, pre.data(), in.data(), refU.data(), refF2.data(), total);
        }
        for (const kerneltest::Form& form : kerneltest::AllForms()) {
            if (!kerneltest::Runnable(form)) continue;
            ora::system::ScopedDispatch forced(form.level, form.fma);
            ShaperIntegrals kernel;
            // The mean over the reference's values: the same flags, and the same means where unflagged.
            std::vector<double> mean(total - 2), refMean(total - 2);
            std::vector<unsigned char> small(total - 2), refSmall(total - 2);
            kernel.Mean(refU.data(), refF2.data(), 1e-3, mean.data(), small.data(), total - 2);
            {
                ora::system::ScopedDispatch plain(ora::system::InstructionLevel::None, false);
                ShaperIntegrals().Mean(refU.data(), refF2.data(), 1e-3, refMean.data(), refSmall.data(), total - 2);
            }
            std::size_t flagged = 0;
            for (std::size_t i = 0; i + 2 < total; ++i) {
                ASSERT_EQ(small[i], refSmall[i]) << i;
                flagged += small[i];
                if (small[i] == 0) {
                    ASSERT_EQ(mean[i], refMean[i]) << i;
                }
            }
            EXPECT_EQ(kernel.Mean(refU.data(), refF2.data(), 1e-3, mean.data(), small.data(), total - 2), flagged);
            // Scaled into the output, held within +-1 (the raw means of random steps stray far outside).
            std::vector<float> scaled(total - 2), refScaled(total - 2);
            kernel.Scale(refMean.data(), pre.data(), scaled.data(), total - 2);
            {
                ora::system::ScopedDispatch plain(ora::system::InstructionLevel::None, false);
                ShaperIntegrals().Scale(refMean.data(), pre.data(), refScaled.data(), total - 2);
            }
            for (std::size_t i = 0; i + 2 < total; ++i) {
                ASSERT_EQ(scaled[i], refScaled[i]) << i;
                ASSERT_LE(std::fabs(scaled[i]), pre[i]) << i;
            }
            std::size_t done = 0;
            double peak = 0.0;
            for (std::size_t length : kerneltest::AwkwardLengths()) {
                std::vector<double> u(length), f2(length);
                peak = std::max(peak, kernel.Evaluate(shape, pre.data() + done, in.data() + done, u.data(),
                                                      f2.data(), length));
                for (std::size_t i = 0; i < length; ++i) {
                    ASSERT_EQ(u[i], refU[done + i]);
                    ASSERT_EQ(f2[i], refF2[done + i]) << static_cast<int>(shape.curve) << " form "
                                                      << ora::system::KernelFormName(kernel.GetForm()) << " at " << i;
                }
                done += length;
            }
            EXPECT_EQ(peak, refPeak);
        }
    }
}
