// The B-chain against what a room-tuning engineer measures: delays to the
// sample, gains and polarity, the EQ bands' responses, untouched channels.
#include <gtest/gtest.h>

#include <cmath>
#include <tuple>

#include "Common/Algorithms/BChainProcessor.h"
#include "Support/Signals.h"

using Channel = BChainProcessor::Channel;
using B = zen::host::BChainDocument;

namespace {

std::vector<std::vector<float>> ProcessAll(BChainProcessor& chain, std::vector<std::vector<float>> x) {
    std::vector<float*> pointers;
    for (auto& c : x) pointers.push_back(c.data());
    EXPECT_TRUE(chain.Process(pointers.data(), x[0].size()));
    return x;
}

}  // namespace

TEST(BChainProcessor, DelaysAreSampleExactAndGainAndPolarityAreExact) {
    std::vector<Channel> settings(B::kChannels);
    settings[0].delayMs = 2.5;
    settings[0].gainDb = -6.0;
    settings[1].delayMs = 10.0 / 48.0;  // ten samples at 48 kHz
    settings[1].inverted = true;
    settings[1].gainDb = 3.0;
    for (const auto& [rate, first, second] :
         {std::tuple{48000.0f, 120u, 10u}, {44100.0f, 110u, 9u}, {96000.0f, 240u, 20u}}) {
        BChainProcessor chain;
        chain.SetChannelCount(3);
        chain.Prepare(rate, 256);
        chain.Configure(settings);
        EXPECT_EQ(chain.GetDelaySamples(0), first);
        EXPECT_EQ(chain.GetDelaySamples(1), second);
        const auto out = ProcessAll(chain, {zentest::Impulse(512), zentest::Impulse(512), zentest::Impulse(512)});
        EXPECT_EQ(zentest::ArgPeak(out[0]), first);
        EXPECT_FLOAT_EQ(out[0][first], static_cast<float>(std::pow(10.0, -6.0 / 20.0)));
        EXPECT_EQ(zentest::ArgPeak(out[1]), second);
        EXPECT_FLOAT_EQ(out[1][second], -static_cast<float>(std::pow(10.0, 3.0 / 20.0)));
        EXPECT_EQ(out[2], zentest::Impulse(512));  // neutral settings: bit for bit
    }
}

TEST(BChainProcessor, EqBandsShapeTheResponseAndChannelsBeyondTheSettingsPassUnchanged) {
    std::vector<Channel> settings(1);
    settings[0].bands[0] = {B::kBell, 1000.0, -9.0, 2.0};
    settings[0].bands[1] = {B::kHighPass, 40.0, 0.0, 0.707};
    BChainProcessor chain;
    chain.SetChannelCount(2);
    chain.Prepare(48000.0f, 4800);
    chain.Configure(settings);
    auto gainAt = [&](double frequency) {
        chain.Reset();
        const auto sine = zentest::Sine(frequency, 48000.0, 4800);
        const auto out = ProcessAll(chain, {sine, sine});
        EXPECT_EQ(out[1], sine);  // the second channel has no settings
        return zentest::ToDb(zentest::Rms(out[0], 2400) / zentest::Rms(sine, 2400));
    };
    EXPECT_NEAR(gainAt(1000.0), -9.0, 0.05);
    EXPECT_NEAR(gainAt(8000.0), 0.0, 0.3);
    EXPECT_LT(gainAt(20.0), -10.0);

    // Re-prepared at another rate, the same settings give the same response.
    chain.Prepare(96000.0f, 4800);
    chain.Reset();
    const auto sine = zentest::Sine(1000.0, 96000.0, 4800);
    const auto out = ProcessAll(chain, {sine, sine});
    EXPECT_NEAR(zentest::ToDb(zentest::Rms(out[0], 2400) / zentest::Rms(sine, 2400)), -9.0, 0.05);
}
