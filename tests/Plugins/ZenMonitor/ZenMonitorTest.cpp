// "Monitor" through the host interface: the pink noise's calibration level
// and slope, the sine's level and frequency, the pulse's polarity, the
// channel walk and output choice, layouts and block splits.
#include <gtest/gtest.h>

#include <cmath>

#include "FFT/FFT.h"
#include "Plugins/ZenMonitor/ZenMonitor.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"

using zentest::Channels;
using zentest::PluginHarness;

namespace {

const char* kName = "Monitor";

// `frames` of each of `outputs` channels with `settings` made before Prepare.
Channels Generate(const std::vector<std::pair<std::string, float>>& settings, std::uint32_t outputs,
                  std::size_t frames, std::size_t block = 512, float rate = 48000.0f) {
    PluginHarness plugin(kName);
    for (const auto& [name, value] : settings) plugin.Set(name, value);
    EXPECT_TRUE(plugin.Audio().ConfigureChannels(0, outputs));
    EXPECT_TRUE(plugin.Audio().Prepare(rate, 512));
    Channels out(outputs, std::vector<float>(frames, 0.0f));
    plugin.Process(out, block);
    return out;
}

float Out(int channel) { return static_cast<float>(ZenMonitor::kFirstNumbered + channel - 1); }

}  // namespace

TEST(ZenMonitor, PinkNoiseIsMinus20DbfsRmsWithMinus3DbPerOctaveInTheBand) {
    // The second pass of the loop (2^17 at 48 kHz), after the 5 ms fade-in.
    const std::size_t period = 1 << 17;
    Channels out = Generate({{"Output", float(ZenMonitor::kAll)}}, 2, 2 * period);
    for (auto& channel : out) channel.erase(channel.begin(), channel.begin() + period);
    for (int c = 0; c < 2; ++c) EXPECT_NEAR(zentest::ToDb(zentest::Rms(out[c])), -20.0, 0.2) << c;

    // The power per bin against log2 of the frequency, fitted by a line over 500 Hz - 2 kHz.
    ora::fft::FFT fft(period);
    std::vector<ora::fft::Complex> bins(fft.Bins());
    fft.ForwardReal(out[0].data(), bins.data());
    double n = 0, sx = 0, sy = 0, sxx = 0, sxy = 0, inside = 0, total = 0;
    for (std::size_t k = 1; k < bins.size(); ++k) {
        const double f = k * 48000.0 / period, p = std::norm(bins[k]);
        total += p;
        if (f < 500.0 || f > 2000.0) continue;
        inside += p;
        const double x = std::log2(f), y = 10.0 * std::log10(p);
        n += 1, sx += x, sy += y, sxx += x * x, sxy += x * y;
    }
    EXPECT_NEAR((n * sxy - sx * sy) / (n * sxx - sx * sx), -3.0, 0.5);
    EXPECT_GT(inside / total, 0.999999);
}

TEST(ZenMonitor, SineAndPolarityPulse) {
    const Channels sine = Generate({{"Signal", float(ZenMonitor::kSine)}, {"Output", Out(1)}, {"Frequency", 997.0f}}, 1, 48000);
    EXPECT_NEAR(zentest::ToDb(zentest::Rms(sine[0], 480)), -20.0, 0.01);
    int rising = 0;
    for (std::size_t i = 1; i < sine[0].size(); ++i) rising += sine[0][i - 1] < 0.0f && sine[0][i] >= 0.0f;
    EXPECT_NEAR(rising, 997, 1);

    const Channels pulse = Generate({{"Signal", float(ZenMonitor::kPolarityPulse)}, {"Output", Out(1)}}, 1, 48000);
    EXPECT_GE(*std::min_element(pulse[0].begin(), pulse[0].end()), 0.0f);  // never below zero: the polarity reads
    EXPECT_NEAR(zentest::ToDb(zentest::Peak(pulse[0])), -20.0 + ZenMonitor::kPulseAboveLevelDb, 0.05);
    // Twice a second, each 2 ms long.
    int starts = 0;
    for (std::size_t i = 1; i < pulse[0].size(); ++i) starts += pulse[0][i - 1] == 0.0f && pulse[0][i] > 0.0f;
    EXPECT_EQ(starts + (pulse[0][0] > 0.0f), 2);
}

TEST(ZenMonitor, WalkSoundsOneChannelAtATimeAndOutputPicksOne) {
    const std::size_t step = 24000;  // "Walk Time" 0.5 s
    const Channels walk = Generate({{"Signal", float(ZenMonitor::kSine)}, {"Walk Time", 0.5f}}, 3, 4 * step);
    for (std::size_t s = 0; s < 4; ++s)
        for (std::size_t c = 0; c < 3; ++c) {
            // Away from the 5 ms fades at the steps.
            const double rms = zentest::Rms(walk[c], s * step + 480, (s + 1) * step - 480);
            if (c == s % 3) {
                EXPECT_NEAR(zentest::ToDb(rms), -20.0, 0.05) << "step " << s << " channel " << c;
            } else {
                EXPECT_EQ(rms, 0.0) << "step " << s << " channel " << c;
            }
        }
    // Faded in and out: no step beyond the sine's own, 0.1414 * 2 pi * 1000 / 48000.
    EXPECT_LT(zentest::LargestStep(walk[1]), 0.0186f);

    const Channels one = Generate({{"Output", Out(2)}}, 3, 4096);
    EXPECT_EQ(zentest::Rms(one[0]), 0.0);
    EXPECT_GT(zentest::Rms(one[1]), 0.05);
    EXPECT_EQ(zentest::Rms(one[2]), 0.0);
    const Channels missing = Generate({{"Output", Out(5)}}, 2, 4096);
    EXPECT_EQ(zentest::Peak(missing[0]) + zentest::Peak(missing[1]), 0.0f);
}

TEST(ZenMonitor, LayoutsMetersAndBlockSplits) {
    PluginHarness plugin(kName);
    EXPECT_FALSE(plugin.Audio().ConfigureChannels(2, 2));
    EXPECT_FALSE(plugin.Audio().ConfigureChannels(0, 33));
    EXPECT_TRUE(plugin.Audio().ConfigureChannels(0, 32));
    ASSERT_TRUE(plugin.Audio().Prepare(48000.0f, 512));
    EXPECT_EQ(plugin.Audio().GetLatency(), 0u);
    Channels out(32, std::vector<float>(2048 + 24000 * 3, 0.0f));
    plugin.Set("Walk Time", 0.5f);
    plugin.Process(out, 512);
    EXPECT_EQ(plugin.Meter("Channel"), 4.0f);

    auto run = [](std::size_t block) {
        PluginHarness p(kName);
        p.Set("Signal", float(ZenMonitor::kSine));
        p.Set("Walk Time", 0.5f);
        EXPECT_TRUE(p.Audio().ConfigureChannels(0, 2));
        EXPECT_TRUE(p.Audio().Prepare(48000.0f, 1024));
        Channels head(2, std::vector<float>(20000, 0.0f));
        p.Process(head, block);
        p.Set("Frequency", 200.0f);
        p.Set("Level", -30.0f);
        Channels tail(2, std::vector<float>(20000, 0.0f));
        p.Process(tail, block);
        for (int c = 0; c < 2; ++c) head[c].insert(head[c].end(), tail[c].begin(), tail[c].end());
        return head;
    };
    const Channels whole = run(1000);
    EXPECT_EQ(run(1), whole);
    EXPECT_EQ(run(777), whole);
}
