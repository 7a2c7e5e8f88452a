// TrackingNotchBank: nulls exact at each harmonic, the notch width law, and
// the fundamental found within the tracking range.
#include <gtest/gtest.h>

#include <cmath>
#include <vector>

#include "Common/Algorithms/TrackingNotchBank.h"
#include "Support/Signals.h"

namespace {

constexpr double kRate = 48000.0;

// Ten partials of `fundamental`, each at `amplitude`.
std::vector<float> Hum(double fundamental, std::size_t frames, double amplitude = 0.0316) {
    std::vector<float> x(frames);
    for (std::size_t n = 0; n < frames; ++n) {
        double v = 0.0;
        for (int k = 1; k <= 10; ++k) v += amplitude * std::cos(2.0 * zentest::kPi * k * fundamental * n / kRate + k);
        x[n] = static_cast<float>(v);
    }
    return x;
}

std::unique_ptr<TrackingNotchBank> Bank(double fundamental, bool tracking) {
    auto bank = std::make_unique<TrackingNotchBank>();
    bank->Prepare(static_cast<float>(kRate), 512);
    bank->SetParameter(TrackingNotchBank::kFundamental, static_cast<float>(fundamental));
    bank->SetParameter(TrackingNotchBank::kTracking, tracking ? 1.0f : 0.0f);
    return bank;
}

}  // namespace

TEST(TrackingNotchBank, FindsTheFundamentalWithinItsRange) {
    for (double actual : {50.0, 49.2, 50.7, 60.9}) {
        const double nominal = actual > 55.0 ? 60.0 : 50.0;
        auto bank = Bank(nominal, true);
        std::vector<float> x = Hum(actual, static_cast<std::size_t>(3 * kRate));
        float* channels[] = {x.data()};
        bank->Process(channels, x.size());
        EXPECT_NEAR(bank->GetTrackedFrequency(), actual, 0.005) << actual;
        EXPECT_LT(zentest::ToDb(zentest::Rms(x, x.size() - 24000) / 0.0316), -50.0) << actual;
    }
    // Out of reach: held at the edge of the range.
    auto bank = Bank(50.0, true);
    std::vector<float> x = Hum(52.5, static_cast<std::size_t>(kRate));
    float* channels[] = {x.data()};
    bank->Process(channels, x.size());
    EXPECT_NEAR(bank->GetTrackedFrequency(), 50.0 + TrackingNotchBank::kTrackingRange, 1e-9);
}

TEST(TrackingNotchBank, NotchesAreExactNullsAndWidenWithTheHarmonic) {
    // Width 1 Hz: harmonic k is k Hz wide at -3 dB, so k / 2 Hz off its
    // centre a tone keeps 1 / sqrt(2) of its level.
    const struct {
        double frequency, gain, tolerance;
    } points[] = {
        {50.0, 0.0, 0.001},      {150.0, 0.0, 0.001},      {500.0, 0.0, 0.001},
        {50.5, 0.7071, 0.03},    {252.5, 0.7071, 0.03},    {1000.0, 1.0, 0.005},
        {775.0, 1.0, 0.005},     {3000.0, 1.0, 0.005},
    };
    for (const auto& p : points) {
        auto bank = Bank(50.0, false);
        std::vector<float> x = zentest::Sine(p.frequency, kRate, static_cast<std::size_t>(3 * kRate), 0.1);
        float* channels[] = {x.data()};
        bank->Process(channels, x.size());
        EXPECT_NEAR(zentest::Rms(x, x.size() - 24000) / (0.1 / std::sqrt(2.0)), p.gain, p.tolerance) << p.frequency;
    }
}

TEST(TrackingNotchBank, HumTransferIsTheMeasuredSteadyState) {
    // Off the nulls, on the flanks and between notches: what a display draws
    // is what a held bank does to a steady tone.
    for (double f : {50.3, 50.5, 99.2, 252.5, 501.0, 775.0}) {
        auto bank = Bank(50.0, false);
        bank->SetParameter(TrackingNotchBank::kWidth, 2.0f);
        std::vector<float> x = zentest::Sine(f, kRate, static_cast<std::size_t>(2 * kRate), 0.1);
        float* channels[] = {x.data()};
        bank->Process(channels, x.size());
        const double measured = zentest::Rms(x, x.size() - 24000) / (0.1 / std::sqrt(2.0));
        EXPECT_NEAR(measured, std::abs(1.0 - bank->HumTransfer(f, 50.0)), 0.003) << f;
    }
}
