// SibilanceControl: the gain falls by the band's boost when the band
// dominates, stays at unity otherwise and below the floor, is linked across
// channels, and the control refuses what it cannot take. (Transparency at no
// boost and block splits are shown through the plug-in.)
#include <gtest/gtest.h>

#include <cmath>

#include "Common/Algorithms/SibilanceControl.h"
#include "Support/Signals.h"

namespace {

std::unique_ptr<SibilanceControl> Make(float boostDb, std::uint64_t channels = 1) {
    auto s = std::make_unique<SibilanceControl>();
    s->SetChannelCount(channels);
    s->Prepare(48000.0f, 512);
    for (const auto& [index, value] : {std::pair{SibilanceControl::kFrequency, 6000.0f}, {SibilanceControl::kQ, 1.0f},
                                       {SibilanceControl::kGain, boostDb}, {SibilanceControl::kFloor, -50.0f}})
        s->SetParameter(index, value);
    return s;
}

// Gain (dB) over the last 100 ms on channel `measured` of steady sines.
double SteadyGainDb(SibilanceControl& s, std::vector<double> frequencies, std::size_t measured = 0,
                    double amplitude = 0.5) {
    std::vector<std::vector<float>> x;
    std::vector<float*> channels;
    for (double f : frequencies) x.push_back(zentest::Sine(f, 48000.0, 24000, amplitude));
    for (auto& channel : x) channels.push_back(channel.data());
    EXPECT_TRUE(s.Process(channels.data(), 24000));
    return zentest::ToDb(zentest::Rms(x[measured], 19200) * std::sqrt(2.0) / amplitude);
}

}  // namespace

TEST(SibilanceControl, GainFallsByTheBoostWhenTheBandDominates) {
    for (float boost : {4.0f, 10.0f, 16.0f}) {
        auto s = Make(boost);
        EXPECT_NEAR(SteadyGainDb(*s, {6000.0}), -boost, 0.4) << boost;  // all the energy in the band
        EXPECT_NEAR(s->GetMeter(SibilanceControl::kReductionMeter), -boost, 0.4) << boost;
        EXPECT_NEAR(SteadyGainDb(*Make(boost), {300.0}), 0.0, 0.2) << boost;  // far below the band
        // Linked: an ess on the left turns the right down with it.
        EXPECT_NEAR(SteadyGainDb(*Make(boost, 2), {6000.0, 300.0}, 1), -boost, 0.4) << boost;
    }
    // Below the -50 dB floor both envelopes rest on it: no reduction at all.
    EXPECT_NEAR(SteadyGainDb(*Make(10.0f), {6000.0}, 0, 0.001), 0.0, 1e-4);
}

TEST(SibilanceControl, RefusesNoChannelsAndMoreThanTwo) {
    for (std::uint64_t count : {0u, 3u}) {
        std::vector<float> a = zentest::Sine(6000.0, 48000.0, 256), b = a, c = a;
        float* channels[] = {a.data(), b.data(), c.data()};
        EXPECT_FALSE(Make(10.0f, count)->Process(channels, 256)) << count;
        EXPECT_EQ(a, c) << count;
    }
}
