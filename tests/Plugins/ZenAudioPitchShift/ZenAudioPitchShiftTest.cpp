// "Pitch" through the host interface: near transparency at no shift after
// its latency, the dry path, stereo in joint mode, the channel layouts it
// takes, its life cycle and the blocks that cannot have the engine.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <complex>
#include <future>
#include <limits>
#include <thread>

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

// Holds the plug-in's engine lock on a thread of its own from construction
// until Release, exclusively (no engine for the audio thread) or shared (no
// upgrade to apply settings).
class LockHolder {
public:
    LockHolder(ZenAudioPitchShift& plugin, bool exclusive)
        : m_releaseSignal(m_release.get_future()),
          m_thread([this, &plugin, exclusive] {
              if (exclusive) {
                  boost::unique_lock<boost::upgrade_mutex> lock(plugin.EngineLock());
                  Hold();
              } else {
                  boost::shared_lock<boost::upgrade_mutex> lock(plugin.EngineLock());
                  Hold();
              }
          }) {
        m_held.get_future().wait();
    }
    ~LockHolder() { Release(); }
    void Release() {
        if (!m_thread.joinable()) return;
        m_release.set_value();
        m_thread.join();
    }

private:
    void Hold() {
        m_held.set_value();
        m_releaseSignal.wait();
    }
    std::promise<void> m_held;
    std::promise<void> m_release;
    std::future<void> m_releaseSignal;
    std::thread m_thread;
};

// Processes x[from, to) of a mono stream in blocks of 512 into y.
void ProcessSpan(PluginHarness& plugin, const std::vector<float>& x, std::vector<float>& y, std::size_t from,
                 std::size_t to) {
    zentest::Channels io = {std::vector<float>(x.begin() + static_cast<std::ptrdiff_t>(from),
                                               x.begin() + static_cast<std::ptrdiff_t>(to))};
    plugin.Process(io, 512);
    std::copy(io[0].begin(), io[0].end(), y.begin() + static_cast<std::ptrdiff_t>(from));
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

    // Without an engine the stream keeps its timing: the input comes out
    // delayed by the latency it reports.
    instance->ShutdownPlugin();
    EXPECT_FALSE(instance->HasEngine());
    EXPECT_EQ(plugin.Audio().GetLatency(), kLatency);
    io = {x};
    plugin.Process(io, 256);
    for (std::size_t i = kLatency; i < x.size(); ++i) ASSERT_EQ(io[0][i], x[i - kLatency]) << i;

    // Back after a gap longer than the backlog keeps: the engine starts
    // again and the shifted signal returns without a click.
    ASSERT_TRUE(instance->InitializePlugin());
    const auto tone = Tone(300.0, 3 * kLatency, 0.0);
    io = {tone};
    plugin.Process(io, 256);
    EXPECT_GT(zentest::Peak(Difference(io[0], tone, kLatency), io[0].size() - 2000), 0.05f);
    EXPECT_LT(zentest::LargestStep(std::vector<float>(io[0].begin() + kLatency, io[0].end())), 0.1f);
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

TEST(ZenAudioPitchShift, ALockedEngineDelaysTheInputThenFadesBackWithoutAGapInItsStream) {
    // An uninterrupted instance is the reference for the engine's stream.
    const auto x = Tone(220.0, 24576, 0.0);
    PluginHarness reference = zentest::Prepared("Pitch", {{"Semitones", 5.0f}}, 1);
    std::vector<float> expected(x.size());
    ProcessSpan(reference, x, expected, 0, x.size());

    PluginHarness plugin = zentest::Prepared("Pitch", {{"Semitones", 5.0f}}, 1);
    auto& instance = dynamic_cast<ZenAudioPitchShift&>(plugin.Instance());
    const std::size_t lockedFrom = 8192, lockedTo = 10240;
    std::vector<float> y(x.size());
    ProcessSpan(plugin, x, y, 0, lockedFrom);
    {
        LockHolder holder(instance, true);
        ProcessSpan(plugin, x, y, lockedFrom, lockedTo);
    }
    ProcessSpan(plugin, x, y, lockedTo, x.size());

    for (std::size_t i = 0; i < lockedFrom; ++i) ASSERT_EQ(y[i], expected[i]) << i;
    for (std::size_t i = lockedFrom; i < lockedTo; ++i) ASSERT_EQ(y[i], x[i - kLatency]) << i;
    // Caught up on the missed input and faded in: the reference's stream.
    for (std::size_t i = x.size() - 4096; i < x.size(); ++i) ASSERT_NEAR(y[i], expected[i], 1e-4f) << i;
    // The way back is a fade, not a jump between the two signals (the way
    // in cannot be: the engine's output is not there to fade from).
    std::vector<float> delayed(kLatency, 0.0f);
    delayed.insert(delayed.end(), x.begin(), x.end() - kLatency);
    const float steepest = std::max(zentest::LargestStep(expected), zentest::LargestStep(delayed));
    EXPECT_LT(zentest::LargestStep(std::vector<float>(y.begin() + lockedTo, y.end())), steepest * 1.1f);
}

TEST(ZenAudioPitchShift, ASharedHolderDelaysAChangeOfSettingsButNotTheAudio) {
    const auto x = zentest::Noise(3 * kLatency, 0.5, 7);
    PluginHarness plugin = zentest::Prepared("Pitch", {{"Semitones", 5.0f}, {"Dry/Wet", 0.0f}}, 1);
    auto& instance = dynamic_cast<ZenAudioPitchShift&>(plugin.Instance());
    std::vector<float> y(x.size());
    const std::size_t changeAt = kLatency + 1024, releaseAt = 2 * kLatency;
    ProcessSpan(plugin, x, y, 0, changeAt);
    {
        LockHolder holder(instance, false);
        plugin.Set("Dry/Wet", 100.0f);
        ProcessSpan(plugin, x, y, changeAt, releaseAt);
    }
    // The engine kept running dry: nothing but the delayed input so far.
    for (std::size_t i = kLatency; i < releaseAt; ++i) ASSERT_EQ(y[i], x[i - kLatency]) << i;
    ProcessSpan(plugin, x, y, releaseAt, x.size());
    EXPECT_GT(zentest::Peak(Difference(y, x, kLatency), x.size() - 2000), 0.05f);
}
