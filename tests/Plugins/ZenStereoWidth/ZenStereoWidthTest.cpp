// "Stereo Width" through the host interface: the width law at its fixed
// points (mono, untouched, side doubled), mono bass against the crossover's
// response and its switch, the correlation meter, block splits.
#include <gtest/gtest.h>

#include <cmath>

#include "Support/Modulation.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"

using zentest::Channels;
using zentest::PluginHarness;

namespace {

const char* kName = "Stereo Width";

Channels TwoNoises(std::size_t frames) { return {zentest::Noise(frames, 0.5, 11), zentest::Noise(frames, 0.3, 12)}; }

Channels Processed(const std::vector<std::pair<std::string, float>>& settings, Channels io, std::size_t block = 512) {
    PluginHarness plugin = zentest::Prepared(kName, settings, 2);
    plugin.Process(io, block);
    return io;
}

std::vector<float> Side(const Channels& lr) {
    std::vector<float> s(lr[0].size());
    for (std::size_t i = 0; i < s.size(); ++i) s[i] = (lr[0][i] - lr[1][i]) * 0.5f;
    return s;
}

std::vector<float> Mid(const Channels& lr) {
    std::vector<float> m(lr[0].size());
    for (std::size_t i = 0; i < m.size(); ++i) m[i] = (lr[0][i] + lr[1][i]) * 0.5f;
    return m;
}

}  // namespace

TEST(ZenStereoWidth, ZeroIsMidOnlyHundredPassesBitForBitTwoHundredDoublesSide) {
    const Channels in = TwoNoises(4096);
    for (float monoBass : {0.0f, 1.0f}) {
        const Channels mono = Processed({{"Width", 0.0f}, {"Mono Bass", monoBass}}, in);
        EXPECT_EQ(mono[0], mono[1]) << "mono bass " << monoBass;
    }
    EXPECT_EQ(Processed({{"Width", 100.0f}}, in), in);

    const Channels wide = Processed({{"Width", 200.0f}}, in);
    const std::vector<float> sideIn = Side(in), sideOut = Side(wide), midIn = Mid(in), midOut = Mid(wide);
    for (std::size_t i = 0; i < in[0].size(); ++i) {
        ASSERT_NEAR(sideOut[i], 2.0f * sideIn[i], 1e-6f) << i;
        ASSERT_NEAR(midOut[i], midIn[i], 1e-6f) << i;
    }
    const Channels half = Processed({{"Width", 50.0f}}, in);
    EXPECT_NEAR(zentest::Rms(Side(half)) / zentest::Rms(sideIn), 0.5, 1e-6);
}

TEST(ZenStereoWidth, MonoBassRemovesSideFarBelowTheFrequencyKeepsItAboveAndMidFlat) {
    const double rate = 48000.0, cutoff = 120.0;
    const std::vector<std::pair<std::string, float>> on = {{"Mono Bass", 1.0f}, {"Mono Bass Below", float(cutoff)}};
    // Left alone: as much side as mid. The crossover's high band is
    // r^4 / (1 + r^4): -48 dB two octaves down, -62 dB at a sixth.
    for (double ratio : {1.0 / 6.0, 1.0 / 8.0, 4.0}) {
        const double f = cutoff * ratio;
        const std::size_t frames = 48000;
        const Channels out = Processed(on, {zentest::Sine(f, rate, frames, 0.5), std::vector<float>(frames, 0.0f)});
        const std::size_t settled = frames / 2;
        const double sideDb = zentest::ToDb(zentest::Rms(Side(out), settled) / zentest::Rms(Mid(out), settled));
        const double r4 = std::pow(ratio, 4.0);
        EXPECT_NEAR(sideDb, zentest::ToDb(r4 / (1.0 + r4)), 0.1) << f << " Hz";
        if (ratio < 1.0 / 5.9) {
            EXPECT_LT(sideDb, -60.0) << f << " Hz";
        }
    }
    // Mid alone passes the crossover's all-pass: flat within a hundredth of a dB.
    const std::vector<float> impulse = zentest::Impulse(1 << 15);
    const Channels h = Processed(on, {impulse, impulse});
    EXPECT_EQ(h[0], h[1]);
    for (double f : {20.0, 60.0, 120.0, 240.0, 1000.0, 10000.0}) EXPECT_NEAR(zentest::MagnitudeDb(h[0], f, rate), 0.0, 0.01) << f;
}

TEST(ZenStereoWidth, CorrelationMeterReadsTheOutput) {
    const std::vector<float> noise = zentest::Noise(24000, 0.5, 3);
    std::vector<float> inverted(noise);
    for (float& x : inverted) x = -x;
    PluginHarness mono = zentest::Prepared(kName, {{"Width", 0.0f}}, 2);
    Channels io = {noise, zentest::Noise(24000, 0.5, 4)};
    mono.Process(io, 512);
    EXPECT_NEAR(mono.Meter("Correlation"), 1.0f, 1e-3f);
    PluginHarness through = zentest::Prepared(kName, {}, 2);
    io = {noise, inverted};
    through.Process(io, 512);
    EXPECT_NEAR(through.Meter("Correlation"), -1.0f, 1e-3f);
}

TEST(ZenStereoWidth, AutomationIsTheSameInAnyBlockSplitAndOnlyStereoIsTaken) {
    const Channels in = TwoNoises(6000);
    auto run = [&](std::size_t block) {
        PluginHarness plugin = zentest::Prepared(kName, {{"Mono Bass", 1.0f}}, 2);
        EXPECT_EQ(plugin.Audio().GetLatency(), 0u);
        Channels head = {std::vector<float>(in[0].begin(), in[0].begin() + 1000),
                         std::vector<float>(in[1].begin(), in[1].begin() + 1000)};
        plugin.Process(head, block);
        plugin.Set("Width", 180.0f);
        Channels tail = {std::vector<float>(in[0].begin() + 1000, in[0].end()),
                         std::vector<float>(in[1].begin() + 1000, in[1].end())};
        plugin.Process(tail, block);
        for (int c = 0; c < 2; ++c) head[c].insert(head[c].end(), tail[c].begin(), tail[c].end());
        return head;
    };
    const Channels whole = run(512);
    EXPECT_EQ(run(1), whole);
    EXPECT_EQ(run(777), whole);

    PluginHarness plugin(kName);
    EXPECT_FALSE(plugin.Audio().ConfigureChannels(1, 1));
    EXPECT_TRUE(plugin.Audio().ConfigureChannels(2, 2));
}

TEST(ZenStereoWidth, MonoBassSwitchesWithoutAClick) {
    // Side at 60 Hz that mono bass removes, under a 1 kHz tone that sets the curvature.
    const std::size_t frames = 24000, at = 9700, window = 4800;
    Channels io = {zentest::Sine(1000.0, 48000.0, frames, 0.5), zentest::Sine(1000.0, 48000.0, frames, 0.5, 0.7)};
    const std::vector<float> low = zentest::Sine(60.0, 48000.0, frames, 0.3);
    for (std::size_t i = 0; i < frames; ++i) {
        io[0][i] += low[i];
        io[1][i] -= low[i];
    }
    for (float to : {1.0f, 0.0f}) {
        PluginHarness plugin = zentest::Prepared(kName, {{"Width", 150.0f}, {"Mono Bass", 1.0f - to}}, 2);
        Channels out = io;
        plugin.ProcessSwitched(out, at, {{"Mono Bass", to}});
        for (int c = 0; c < 2; ++c) EXPECT_LT(zentest::SwitchCurvature(out[c], at, window), 1.1) << to << " " << c;
    }
}
