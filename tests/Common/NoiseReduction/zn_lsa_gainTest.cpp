#include <gtest/gtest.h>

#include <cmath>
#include <random>

#include "Common/NoiseReduction/zn_lsa_gain.h"

namespace nr = zen::noise_reduction;

namespace {

constexpr double kBinHz = 48000.0 / 1024.0;
constexpr double kHop = 256.0 / 48000.0;

// E1 by numerical integration of exp(-t)/t from v to infinity (t = v e^u).
double E1(double v) {
    double sum = 0.0;
    const double du = 1e-4;
    for (double u = du / 2; u < 40.0; u += du) {
        const double t = v * std::exp(u);
        if (t > 60.0) break;
        sum += std::exp(-t) * du;
    }
    return sum;
}

}  // namespace

// The estimator's gain xi/(1+xi) exp(E1(v)/2), v = xi gamma/(1+xi), against
// the integral, within the approximation's error; it tends to the Wiener
// gain at high SNR and never exceeds 1.
TEST(zn_lsa_gain, LsaGainMatchesTheExponentialIntegral) {
    for (double xi : {0.003, 0.1, 1.0, 10.0, 100.0})
        for (double gamma : {0.1, 1.0, 3.0, 30.0, 1000.0}) {
            const double v = xi * gamma / (1.0 + xi);
            const double expected = std::min(1.0, xi / (1.0 + xi) * std::exp(0.5 * E1(v)));
            EXPECT_NEAR(nr::zn_lsa_gain::LsaGain(static_cast<float>(xi), static_cast<float>(gamma)), expected,
                        2e-4 + 1e-3 * expected)
                << "xi " << xi << ", gamma " << gamma;
        }
    EXPECT_NEAR(nr::zn_lsa_gain::LsaGain(100.0f, 1000.0f), 100.0f / 101.0f, 1e-4f);
}

// A strong bin passes, noise alone rests at the floor (the presence says
// no speech), no bin falls below it; the sensitivity lowers the gains.
TEST(zn_lsa_gain, StrongBinsPassNoiseRestsAtTheFloor) {
    constexpr std::size_t kBins = 64;
    nr::zn_lsa_gain rule;
    ASSERT_TRUE(rule.Configure(1, kBins, kBinHz, kHop));
    std::mt19937 random(3);
    std::exponential_distribution<float> periodogram(1.0f);
    std::vector<float> power(kBins), noise(kBins, 1.0f), presence(kBins, 0.0f), gain(kBins);
    presence[10] = 1.0f;
    const float floor = 0.1f;
    double noiseDb = 0.0;
    int counted = 0;
    for (int frame = 0; frame < 200; ++frame) {
        for (std::size_t k = 0; k < kBins; ++k) power[k] = (k == 10 ? 1000.0f : 1.0f) * periodogram(random);
        rule.Compute(0, power.data(), noise.data(), 1.0f, floor, presence.data(), gain.data());
        for (std::size_t k = 0; k < kBins; ++k) ASSERT_GE(gain[k], floor * 0.9999f);
        if (frame < 20) continue;
        for (std::size_t k = 20; k < kBins; ++k, ++counted) noiseDb += 20.0 * std::log10(gain[k]);
        EXPECT_GT(gain[10], 0.9f) << "30 dB bin, frame " << frame;
    }
    EXPECT_NEAR(noiseDb / counted, -20.0, 1.0);

    std::vector<float> sensitive(kBins);
    for (std::size_t k = 0; k < kBins; ++k) power[k] = 10.0f;
    nr::zn_lsa_gain a, b;
    a.Configure(1, kBins, kBinHz, kHop);
    b.Configure(1, kBins, kBinHz, kHop);
    std::fill(presence.begin(), presence.end(), 0.5f);
    a.Compute(0, power.data(), noise.data(), 1.0f, 0.01f, presence.data(), gain.data());
    b.Compute(0, power.data(), noise.data(), 4.0f, 0.01f, presence.data(), sensitive.data());
    EXPECT_LT(sensitive[5], 0.9f * gain[5]);
}

// A weak component among a voice's harmonics is taken as speech and keeps
// the LSA gain; the same component alone, far from any, rests near the floor.
TEST(zn_lsa_gain, WeakBinsBesideHarmonicsAreKept) {
    constexpr std::size_t kBins = 200;
    nr::zn_lsa_gain rule;
    ASSERT_TRUE(rule.Configure(1, kBins, kBinHz, kHop));
    std::mt19937 random(5);
    std::exponential_distribution<float> periodogram(1.0f);
    std::vector<float> power(kBins), noise(kBins, 1.0f), gain(kBins);
    const std::size_t beside = 41, alone = 161;  // weak bins: among harmonics 30..50, and by itself
    double besideDb = 0.0, aloneDb = 0.0;
    for (int frame = 0; frame < 100; ++frame) {
        for (std::size_t k = 0; k < kBins; ++k) {
            const bool harmonic = k >= 30 && k <= 50 && k % 4 == 0;
            const bool weak = k == beside || k == alone;
            power[k] = (harmonic ? 100.0f : weak ? 3.0f : 1.0f) * periodogram(random);
        }
        rule.Compute(0, power.data(), noise.data(), 1.0f, 0.1f, nullptr, gain.data());
        if (frame < 20) continue;
        besideDb += 20.0 * std::log10(gain[beside]) / 80.0;
        aloneDb += 20.0 * std::log10(gain[alone]) / 80.0;
    }
    EXPECT_GT(besideDb, aloneDb + 6.0) << besideDb;
    EXPECT_LT(aloneDb, -12.0);
}
