// Rect2Polar and CSquareMagnitude on complex bins: magnitude and phase
// within their stated errors in every octant and over the magnitudes an FFT
// gives, the zero, NaN and infinite bins, and the power of an FFT's bins
// against the signal's energy. (Every form against ref is in
// FormEquivalenceTest.)
#include <gtest/gtest.h>

#include <cmath>
#include <complex>
#include <limits>
#include <random>

#include "Algorithms/CSquareMagnitude.h"
#include "Algorithms/Rect2Polar.h"
#include "FFT/FFT.h"
#include "KernelForms.h"

using namespace kerneltest;
using ora::numeric::CSquareMagnitude;
using ora::numeric::Rect2Polar;

namespace {

constexpr double kPhaseError = 3e-7;     // rad
constexpr double kMagnitudeUlps = 1.5;  // for 1.1e-19 <= |z| <= 1.8e19

struct Polar {
    std::vector<float> magnitude, phase;
};

Polar Convert(const std::vector<float>& bins) {
    Polar p{std::vector<float>(bins.size() / 2), std::vector<float>(bins.size() / 2)};
    Rect2Polar().Process(bins.data(), p.magnitude.data(), p.phase.data(), bins.size() / 2);
    return p;
}

}  // namespace

TEST(Rect2Polar, MagnitudeAndPhaseWithinTheirStatedErrorsInEveryForm) {
    // Every direction, on the axes and diagonals too, from 1e-18 to 1e18.
    std::mt19937 rng(3);
    std::uniform_real_distribution<double> angle(-M_PI, M_PI), decade(-18.0, 18.0);
    std::vector<float> bins;
    for (int i = 0; i < 20000; ++i) {
        const double a = i < 16 ? M_PI / 4.0 * (i % 8 - 3) : angle(rng), m = std::pow(10.0, decade(rng));
        bins.push_back(static_cast<float>(m * std::cos(a)));
        bins.push_back(static_cast<float>(m * std::sin(a)));
    }
    ForEachForm(false, [&](const Form&, const std::string& name) {
        const Polar p = Convert(bins);
        double worstPhase = 0.0, worstMagnitude = 0.0;
        for (std::size_t i = 0; i < p.phase.size(); ++i) {
            const double re = bins[2 * i], im = bins[2 * i + 1], m = std::hypot(re, im);
            worstPhase = std::max(worstPhase, std::fabs(p.phase[i] - std::atan2(im, re)));
            int exponent = 0;
            std::frexp(static_cast<float>(m), &exponent);
            worstMagnitude = std::max(worstMagnitude, std::fabs(p.magnitude[i] - m) / std::ldexp(1.0, exponent - 24));
        }
        EXPECT_LE(worstPhase, kPhaseError) << name;
        EXPECT_LE(worstMagnitude, kMagnitudeUlps) << name;
    });
}

TEST(Rect2Polar, ZeroNaNAndInfiniteBins) {
    const float inf = std::numeric_limits<float>::infinity(), nan = std::nanf("");
    const std::vector<float> bins = {0.0f, 0.0f, -0.0f, 0.0f, 0.0f, -0.0f, -1.0f, 0.0f, -1.0f, -0.0f, nan, 1.0f,
                                     inf,  1.0f, 1.0f,  inf,  inf,  inf,   3e19f, 0.0f};
    ForEachForm(false, [&](const Form&, const std::string& name) {
        const Polar p = Convert(bins);
        EXPECT_EQ(p.phase[0], 0.0f) << name;
        EXPECT_EQ(p.phase[1], 0.0f) << name << ": -0 + 0i reads 0, not pi";
        EXPECT_TRUE(p.phase[2] == 0.0f && std::signbit(p.phase[2])) << name;
        EXPECT_FLOAT_EQ(p.phase[3], static_cast<float>(M_PI)) << name;
        EXPECT_FLOAT_EQ(p.phase[4], static_cast<float>(-M_PI)) << name;
        EXPECT_TRUE(std::isnan(p.phase[5]) && std::isnan(p.magnitude[5])) << name;
        EXPECT_TRUE(p.phase[6] == 0.0f && p.magnitude[6] == inf) << name;
        EXPECT_FLOAT_EQ(p.phase[7], static_cast<float>(M_PI / 2)) << name;
        EXPECT_TRUE(std::isnan(p.phase[8]) && p.magnitude[8] == inf) << name;
        EXPECT_EQ(p.magnitude[9], inf) << name << ": the square overflows";
        EXPECT_EQ(p.magnitude[0], 0.0f);
    });
}

TEST(CSquareMagnitude, ThePowerOfAnFftsBinsHoldsTheSignalsEnergy) {
    // Parseval: |X_0|^2 + |X_N/2|^2 + 2 sum |X_k|^2 = N sum x^2, bins read as
    // the FFT hands them out.
    const std::size_t n = 1024;
    const std::vector<float> x = RandomFloats(n, 3);
    ora::fft::FFT fft(n);
    std::vector<std::complex<float>> spectrum(fft.Bins());
    fft.ForwardReal(x.data(), spectrum.data());
    ForEachForm(false, [&](const Form&, const std::string& name) {
        std::vector<float> power(spectrum.size());
        CSquareMagnitude().Process(reinterpret_cast<const float*>(spectrum.data()), power.data(), power.size());
        double total = power.front() + power.back(), energy = 0.0;
        for (std::size_t k = 1; k + 1 < power.size(); ++k) total += 2.0 * power[k];
        for (float v : x) energy += double(v) * v;
        EXPECT_NEAR(total / static_cast<double>(n), energy, 1e-5 * energy) << name;
    });
}
