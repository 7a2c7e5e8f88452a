// "Pitch" through the host interface: near transparency at no shift after
// its latency, the dry path, stereo in joint mode, the
// channel layouts it takes and its life cycle.
#include <gtest/gtest.h>

#include <cmath>
#include <complex>
#include <limits>

#include "Plugins/ZenAudioPitchShift/ZenAudioPitchShift.h"
#include "Support/AssertionRecorder.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"

using zentest::PluginHarness;

namespace {

constexpr std::uint32_t kLatency = 6400;
constexpr double kRate = 48000.0;

// Phase of frequency f in x[from, from + length) (Hann-windowed DTFT).
std::complex<double> Dtft(const std::vector<float>& x, std::size_t from, std::size_t length, double f) {
    std::complex<double> sum = 0.0;
    for (std::size_t i = 0; i < length; ++i) {
        const double w = 0.5 - 0.5 * std::cos(2.0 * zentest::kPi * static_cast<double>(i) / static_cast<double>(length));
        sum += w * x[from + i] * std::polar(1.0, -2.0 * zentest::kPi * f * static_cast<double>(i) / kRate);
    }
    return sum;
}

std::vector<float> Tone(double f, std::size_t frames, double phase) {
    std::vector<float> x(frames);
    for (std::size_t i = 0; i < frames; ++i)
        x[i] = static_cast<float>(0.3 * std::sin(2.0 * zentest::kPi * f * static_cast<double>(i) / kRate + phase) +
                                  0.15 * std::sin(2.0 * zentest::kPi * 2.0 * f * static_cast<double>(i) / kRate + 2.0 * phase));
    return x;
}

// y[i] - x[i - delay] from `delay` on (0 before).
std::vector<float> Difference(const std::vector<float>& y, const std::vector<float>& x, std::size_t delay) {
    std::vector<float> d(y.size(), 0.0f);
    for (std::size_t i = delay; i < y.size(); ++i) d[i] = y[i] - x[i - delay];
    return d;
}

}  // namespace

TEST(ZenAudioPitchShift, NoShiftIsNearlyTransparentAfterTheLatency) {
    PluginHarness plugin = zentest::Prepared("Pitch", {}, 2);
    const auto x = zentest::Noise(30000, 0.3, 9);
    zentest::Channels io = {x, x};
    io[1].assign(x.rbegin(), x.rend());
    const auto input = io;
    for (auto& c : io) c.resize(c.size() + kLatency, 0.0f);
    plugin.Process(io, 512);
    for (std::size_t c = 0; c < 2; ++c) {
        double err = 0.0, ref = 0.0;
        for (std::size_t i = 0; i < input[c].size(); ++i) {
            err += std::pow(io[c][i + kLatency] - input[c][i], 2.0);
            ref += input[c][i] * input[c][i];
        }
        const double db = 10.0 * std::log10(err / ref);
        std::printf("Pitch at 0 semitones, channel %zu: difference %.1f dB below the input\n", c, -db);
        EXPECT_LT(db, -60.0) << c;
    }
}

TEST(ZenAudioPitchShift, JointKeepsThePhaseDifferenceBetweenChannels) {
    // The right channel leads by 0.8 rad at 300 Hz (1.6 at 600 Hz); a fifth up.
    const std::size_t frames = 40000;
    PluginHarness plugin = zentest::Prepared("Pitch", {{"Semitones", 7.0f}, {"Split/Joint", 1.0f}}, 2);
    zentest::Channels io = {Tone(300.0, frames, 0.0), Tone(300.0, frames, 0.8)};
    plugin.Process(io, 512);
    const double f = 300.0 * std::pow(2.0, 7.0 / 12.0);
    const std::size_t from = 20000, length = 16384;
    for (int h = 1; h <= 2; ++h) {
        const auto l = Dtft(io[0], from, length, h * f);
        const auto r = Dtft(io[1], from, length, h * f);
        EXPECT_NEAR(std::arg(r * std::conj(l)), 0.8 * h, 0.02) << "partial " << h;
        EXPECT_NEAR(std::abs(r) / std::abs(l), 1.0, 0.01) << "partial " << h;
    }
}

TEST(ZenAudioPitchShift, TakesOneToEightChannelsWithAsManyOutputs) {
    PluginHarness plugin("Pitch");
    AudioPlugin& audio = plugin.Audio();
    EXPECT_TRUE(audio.ConfigureChannels(1, 1));
    EXPECT_TRUE(audio.ConfigureChannels(8, 8));
    EXPECT_FALSE(audio.ConfigureChannels(9, 9));
    zentest::AssertionRecorder assertions;
    EXPECT_FALSE(audio.ConfigureChannels(2, 1));
    EXPECT_FALSE(audio.ConfigureChannels(2, 4));
    EXPECT_TRUE(assertions.Assertions().empty());  // hosts probe layouts: a refusal, not an error

    // A new layout after preparation rebuilds the engine for it.
    plugin.Prepare(2);
    ASSERT_TRUE(audio.ConfigureChannels(6, 6));
    zentest::Channels six(6, zentest::Sine(440.0, kRate, 8000, 0.5));
    plugin.Process(six, 1000);
    for (const auto& c : six) EXPECT_GT(zentest::Peak(c, kLatency + 1000), 0.3f);
    EXPECT_EQ(audio.GetLatency(), kLatency);
}

TEST(ZenAudioPitchShift, LifeCycleAndResetKeepTheHostsSettings) {
    PluginHarness plugin("Pitch");
    auto* instance = dynamic_cast<ZenAudioPitchShift*>(&plugin.Instance());
    ASSERT_NE(instance, nullptr);
    EXPECT_TRUE(instance->HasEngine());  // built when the instance was created

    plugin.Set("Dry/Wet", 0.0f);
    plugin.Set("Semitones", 5.0f);
    plugin.Prepare(1);
    const auto x = zentest::Noise(kLatency + 4000, 0.5, 4);
    zentest::Channels io = {x};
    plugin.Process(io, 256);
    plugin.Audio().Reset();
    io = {x};
    plugin.Process(io, 256);
    // Still all dry after the reset: the host's settings are applied again.
    for (std::size_t i = kLatency; i < x.size(); ++i) ASSERT_EQ(io[0][i], x[i - kLatency]) << i;
    // A change while running reaches the engine: the shifted signal comes in.
    plugin.Set("Dry/Wet", 100.0f);
    io = {x};
    plugin.Process(io, 256);
    EXPECT_GT(zentest::Peak(Difference(io[0], x, kLatency), x.size() - 2000), 0.05f);

    instance->ShutdownPlugin();
    EXPECT_FALSE(instance->HasEngine());
    io = {x};
    plugin.Process(io, 256);  // without an engine the block passes unchanged
    EXPECT_EQ(io[0], x);
}

TEST(ZenAudioPitchShift, NonFiniteInputIsSilenceAndTheTailFollowsTheRatio) {
    PluginHarness plugin("Pitch");
    EXPECT_EQ(plugin.Audio().GetTailLength(), 4096u);  // half a frame, and half a frame read at 1
    plugin.Set("Semitones", -12.0f);
    EXPECT_EQ(plugin.Audio().GetTailLength(), 2048u + 4096u);
    plugin.Prepare(1);
    auto x = zentest::Sine(300.0, kRate, 20000, 0.5);
    x[3000] = std::numeric_limits<float>::quiet_NaN();
    x[3001] = std::numeric_limits<float>::infinity();
    zentest::Channels io = {x};
    plugin.Process(io, 512);
    for (float y : io[0]) ASSERT_TRUE(std::isfinite(y));
    EXPECT_GT(zentest::Peak(io[0], 15000), 0.3f);
}

TEST(ZenAudioPitchShift, ClicksComeOutTheReportedLatencyLateAtEveryRate) {
    for (float rate : {44100.0f, 96000.0f, 192000.0f}) {
        for (float semitones : {-7.0f, 12.0f}) {
            PluginHarness plugin = zentest::Prepared("Pitch", {{"Semitones", semitones}}, 1, rate);
            const std::uint32_t latency = plugin.Audio().GetLatency();
            std::vector<float> x(20000, 0.0f);
            for (std::size_t at : {3000u, 8500u, 14200u}) x[at] = 0.8f;
            zentest::Channels io = {x};
            io[0].resize(x.size() + latency, 0.0f);
            plugin.Process(io, 512);
            io[0].erase(io[0].begin(), io[0].begin() + latency);
            EXPECT_NEAR(zentest::EnvelopeLag(x, io[0], 64), 0.0, 1.0) << rate << " Hz, " << semitones << " semitones";
        }
    }
}

TEST(ZenAudioPitchShift, HugeFiniteSamplesComeOutFinite) {
    for (float level : {1e18f, 1e19f, 3e38f}) {
        PluginHarness plugin = zentest::Prepared("Pitch", {{"Semitones", 3.0f}}, 1);
        auto x = zentest::Sine(300.0, kRate, 12000, 0.5);
        for (std::size_t i = 0; i < 100; ++i) x[2000 + i] = level;
        zentest::Channels io = {x};
        plugin.Process(io, 512);
        for (std::size_t i = 0; i < io[0].size(); ++i) ASSERT_TRUE(std::isfinite(io[0][i])) << level << " at " << i;
    }
}
