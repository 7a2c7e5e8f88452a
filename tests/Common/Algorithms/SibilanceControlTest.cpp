// SibilanceControl: the gain falls by the band's boost when the band
// dominates, stays at unity otherwise and below the floor, is linked across
// channels, and the control refuses what it cannot take.
#include <gtest/gtest.h>

#include <cmath>

#include "Common/Algorithms/SibilanceControl.h"
#include "Support/Signals.h"
#include "Support/Speech.h"

namespace {

constexpr float kRate = 48000.0f;

std::unique_ptr<SibilanceControl> Make(float boostDb, std::uint64_t channels = 1, std::uint32_t maxBlock = 512) {
    auto s = std::make_unique<SibilanceControl>();
    s->SetChannelCount(channels);
    s->Prepare(kRate, maxBlock);
    s->SetParameter(SibilanceControl::kFrequency, 6000.0f);
    s->SetParameter(SibilanceControl::kQ, 1.0f);
    s->SetParameter(SibilanceControl::kGain, boostDb);
    s->SetParameter(SibilanceControl::kFloor, -50.0f);
    return s;
}

// Gain in dB on the last 100 ms of a steady sine of `amplitude` at `frequency`.
double SteadyGainDb(SibilanceControl& s, double frequency, double amplitude = 0.5) {
    std::vector<float> x = zentest::Sine(frequency, kRate, 24000, amplitude);
    const std::vector<float> in = x;
    float* channels[] = {x.data()};
    EXPECT_TRUE(s.Process(channels, x.size()));
    return zentest::ToDb(zentest::Rms(x, 19200) / zentest::Rms(in, 19200));
}

}  // namespace

TEST(SibilanceControl, GainFallsByTheBoostWhenTheBandDominates) {
    for (float boost : {4.0f, 10.0f, 16.0f}) {
        auto s = Make(boost);
        EXPECT_NEAR(SteadyGainDb(*s, 6000.0), -boost, 0.4) << boost;  // all the energy is in the band
        EXPECT_NEAR(s->GetMeter(SibilanceControl::kReductionMeter), -boost, 0.4) << boost;
        auto quiet = Make(boost);
        EXPECT_NEAR(SteadyGainDb(*quiet, 300.0), 0.0, 0.2) << boost;  // far below the band
    }
    // Below the -50 dB floor both envelopes rest on it: no reduction at all.
    auto s = Make(10.0f);
    EXPECT_NEAR(SteadyGainDb(*s, 6000.0, 0.001), 0.0, 1e-4);
}

TEST(SibilanceControl, WithoutBoostTheOutputIsTheInputAlsoWhenListening) {
    const zentest::SpeechLike speech = zentest::MakeSpeechLike(kRate, 2);
    for (float listen : {0.0f, 1.0f}) {
        auto s = Make(0.0f);
        s->SetParameter(SibilanceControl::kListen, listen);
        std::vector<float> x = speech.samples;
        float* channels[] = {x.data()};
        ASSERT_TRUE(s->Process(channels, x.size()));
        for (std::size_t n = 0; n < x.size(); ++n) ASSERT_NEAR(x[n], speech.samples[n], 1e-6) << n << " listen " << listen;
    }
}

TEST(SibilanceControl, StereoIsLinkedAndLongBlocksMatchShortOnes) {
    auto s = Make(10.0f, 2);
    std::vector<float> left = zentest::Sine(6000.0, kRate, 24000, 0.5), right = zentest::Sine(300.0, kRate, 24000, 0.5);
    const std::vector<float> rightIn = right;
    float* channels[] = {left.data(), right.data()};
    ASSERT_TRUE(s->Process(channels, 24000));
    // Sibilance on the left turns the right down with it.
    EXPECT_NEAR(zentest::ToDb(zentest::Rms(right, 19200) / zentest::Rms(rightIn, 19200)), -10.0, 0.3);

    const std::vector<float> speech = zentest::MakeSpeechLike(kRate, 2).samples;
    auto outputOf = [&](std::size_t block) {
        auto control = Make(10.0f, 1, 256);
        std::vector<float> x = speech;
        for (std::size_t done = 0; done < x.size(); done += block) {
            float* mono[] = {x.data() + done};
            EXPECT_TRUE(control->Process(mono, std::min(block, x.size() - done)));
        }
        return x;
    };
    EXPECT_EQ(outputOf(3000), outputOf(256));  // beyond the prepared maximum
    EXPECT_EQ(outputOf(1), outputOf(256));
}

TEST(SibilanceControl, RefusesNoChannelsAndMoreThanTwo) {
    for (std::uint64_t count : {0u, 3u}) {
        auto s = Make(10.0f, count);
        std::vector<float> a = zentest::Sine(6000.0, kRate, 256), b = a, c = a;
        float* channels[] = {a.data(), b.data(), c.data()};
        EXPECT_FALSE(s->Process(channels, 256)) << count;
        EXPECT_EQ(a, c) << count;
    }
}
