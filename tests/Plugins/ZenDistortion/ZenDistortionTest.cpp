// "Distortion" through the host interface: aliasing of a hard-driven tone
// against the same curve without oversampling, the curves' harmonics, the
// ceiling and output level trading level for drive, latency, block splits,
// smooth automation, layouts and bad input.
#include <gtest/gtest.h>

#include <cmath>
#include <string>

#include "Common/Algorithms/Waveshaper.h"
#include "Plugins/ZenDistortion/ZenDistortion.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"
#include "zen/ZenControlValueHost.h"

using zentest::PluginHarness;

namespace {

const char* kName = "Distortion";
constexpr double kRate = 48000.0;
const char* const kCurves[] = {"Tape", "Tube", "Hard", "Fold-back"};

// Amplitude in dBFS of the component at `frequency` over `x` from `from`,
// `length` samples holding whole periods of it.
double ComponentDb(const std::vector<float>& x, std::size_t from, std::size_t length, double frequency) {
    double re = 0.0, im = 0.0;
    for (std::size_t n = 0; n < length; ++n) {
        const double phase = 2.0 * zentest::kPi * frequency * static_cast<double>(n) / kRate;
        re += x[from + n] * std::cos(phase);
        im -= x[from + n] * std::sin(phase);
    }
    return zentest::ToDb(2.0 * std::hypot(re, im) / static_cast<double>(length));
}

// A 5 kHz tone repeats every 48 samples at 48 kHz, so everything it makes
// sits on whole kilohertz: the harmonics on multiples of 5, aliases between.
double WorstAliasDb(const std::vector<float>& y, std::size_t from) {
    double worst = -300.0;
    for (int k = 1; k < 24; ++k)
        if (k % 5 != 0) worst = std::max(worst, ComponentDb(y, from, 4800, 1000.0 * k));
    return worst;
}

}  // namespace

TEST(ZenDistortion, AHardDrivenToneAliasesFarLessThanTheCurveAtTheHostRate) {
    // A -6 dBFS tone from the default drive up to full drive: every alias
    // below -80 dBFS, where the same curve at the host rate leaves them above -40.
    const std::size_t settle = 24000;  // the DC blocker's start-up has died away
    const std::vector<float> tone = zentest::Sine(5000.0, kRate, settle + 4800, 0.5);
    for (int curve = 0; curve < 4; ++curve) {
        for (float driveDb : {12.0f, 24.0f, 36.0f}) {
            PluginHarness plugin = zentest::Prepared(kName, {{"Curve", float(curve)}, {"Drive", driveDb}});
            const double oversampled = WorstAliasDb(plugin.Run(tone, 1, 512)[0], settle);
            std::vector<float> plain(tone.size());
            const double drive = std::pow(10.0, driveDb / 20.0);
            for (std::size_t n = 0; n < tone.size(); ++n)
                plain[n] = static_cast<float>(Waveshaper::Apply(static_cast<Waveshaper::Curve>(curve), drive * tone[n]));
            const double atHostRate = WorstAliasDb(plain, settle);
            EXPECT_LT(oversampled, -80.0) << kCurves[curve] << " at " << driveDb;
            EXPECT_GT(atHostRate, -40.0) << kCurves[curve] << " at " << driveDb;
            std::cout << kCurves[curve] << ", " << driveDb << " dB of drive: worst alias " << oversampled
                      << " dBFS (at the host rate " << atHostRate << " dBFS)\n";
        }
    }
}

TEST(ZenDistortion, OnlyTheTubeMakesEvenHarmonics) {
    const std::vector<float> tone = zentest::Sine(1000.0, kRate, 24000 + 4800, 0.5);
    for (int curve = 0; curve < 4; ++curve) {
        PluginHarness plugin = zentest::Prepared(kName, {{"Curve", float(curve)}, {"Drive", 12.0f}});
        const std::vector<float> y = plugin.Run(tone, 1, 512)[0];
        const double second = ComponentDb(y, 24000, 4800, 2000.0);
        const double third = ComponentDb(y, 24000, 4800, 3000.0);
        if (curve == Waveshaper::kTube) {
            EXPECT_GT(second, -30.0);
        } else {
            EXPECT_LT(second, -100.0) << kCurves[curve];
        }
        EXPECT_GT(third, -40.0) << kCurves[curve];
        EXPECT_LE(zentest::Peak(y), 1.0f + 0.05f) << kCurves[curve];  // within the ceiling, but for filter ripple
    }
}

TEST(ZenDistortion, CeilingDownAndOutputLevelUpByTheSameShareDriveHarderAtTheSameLevel) {
    // Positions as the crunch control sets them: ceiling 1 - a, output level 0.5 + a / 2.
    const std::vector<float> tone = zentest::Sine(220.0, kRate, 9600, 0.5);
    double firstPeak = 0.0, previousSaturation = -200.0;
    for (float a : {0.0f, 0.25f, 0.5f, 0.75f, 1.0f}) {
        PluginHarness plugin(kName);
        plugin.Prepare(1);
        auto* host = static_cast<ZenControlValueHost*>(plugin.Instance().QueryInterface("ZenControlValueHost"));
        ASSERT_NE(host, nullptr);
        host->SetParameterPosition(ZenDistortion::kCeiling, 1.0f - a);
        host->SetParameterPosition(ZenDistortion::kOutputLevel, 0.5f + 0.5f * a);
        EXPECT_NEAR(plugin.Get("Ceiling") + plugin.Get("Output Level"), 0.0f, 1e-3f);
        plugin.Audio().Reset();
        const std::vector<float> y = plugin.Run(tone, 1, 512)[0];
        const double peak = zentest::ToDb(zentest::Peak(y, 4800));
        const double saturation = plugin.Meter("Saturation");
        if (a == 0.0f) firstPeak = peak;
        EXPECT_NEAR(peak, firstPeak, 1.5) << a;
        EXPECT_GT(saturation, previousSaturation + 5.0) << a;
        previousSaturation = saturation;
    }
}

TEST(ZenDistortion, ReportsItsLatencyAndTheNeutralSettingPassesDelayed) {
    PluginHarness plugin = zentest::Prepared(kName, {{"Curve", 0.0f}, {"Drive", 0.0f}});
    const std::uint32_t latency = plugin.Audio().GetLatency();
    // A small impulse stays in the curve's linear part: it comes out at the latency.
    const std::vector<float> wet = plugin.Run(zentest::Impulse(2048, 100, 0.001f), 1, 512)[0];
    EXPECT_EQ(zentest::ArgPeak(wet), 100 + latency);
    EXPECT_GT(wet[100 + latency], 0.0008f);  // band-limited to 20 kHz, so a little lower

    PluginHarness neutral(kName);
    ASSERT_TRUE(neutral.Audio().ApplyNeutralSetting());
    neutral.Prepare(2);
    const std::vector<float> in = zentest::Sine(440.0, kRate, 2048, 0.5);
    const zentest::Channels out = neutral.Run(in, 2, 300);
    for (std::size_t n = latency; n < in.size(); ++n) ASSERT_EQ(out[1][n], in[n - latency]) << n;
    EXPECT_GT(neutral.Audio().GetTailLength(), latency);
}

TEST(ZenDistortion, ToneTiltsAboutItsPivot) {
    for (float tone : {-12.0f, 12.0f}) {
        PluginHarness plugin = zentest::Prepared(kName, {{"Curve", 0.0f}, {"Drive", 0.0f}, {"Tone", tone}});
        const std::vector<float> h = plugin.Run(zentest::Impulse(1 << 14, 0, 1e-3f), 1, 512)[0];
        const double low = zentest::MagnitudeDb(h, 100.0, kRate) + 60.0;
        const double high = zentest::MagnitudeDb(h, 12000.0, kRate) + 60.0;
        // First-order shelves: half the tilt on each side, reached gradually.
        EXPECT_NEAR(low, -tone / 2.0, 0.6) << tone;
        EXPECT_NEAR(high, tone / 2.0, 2.0) << tone;
    }
}

TEST(ZenDistortion, AutomationIsTheSameInAnyBlockSplit) {
    const std::vector<float> music = zentest::MusicLike(kRate, 12000);
    auto run = [&](std::size_t block) {
        PluginHarness plugin = zentest::Prepared(kName, {{"Drive", 0.0f}}, 2, 48000.0f, 1024);
        zentest::Channels head = {std::vector<float>(music.begin(), music.begin() + 3000),
                                  std::vector<float>(music.begin(), music.begin() + 3000)};
        plugin.Process(head, block);
        plugin.Set("Drive", 30.0f);
        plugin.Set("Ceiling", -12.0f);
        plugin.Set("Mix", 50.0f);
        zentest::Channels tail = {std::vector<float>(music.begin() + 3000, music.end()),
                                  std::vector<float>(music.begin() + 3000, music.end())};
        plugin.Process(tail, block);
        head[0].insert(head[0].end(), tail[0].begin(), tail[0].end());
        return head[0];
    };
    const std::vector<float> whole = run(1024);
    EXPECT_EQ(run(1), whole);
    EXPECT_EQ(run(333), whole);
}

TEST(ZenDistortion, LayoutsAndBadInput) {
    PluginHarness layouts(kName);
    EXPECT_TRUE(layouts.Audio().ConfigureChannels(8, 8));
    EXPECT_FALSE(layouts.Audio().ConfigureChannels(9, 9));
    EXPECT_FALSE(layouts.Audio().ConfigureChannels(2, 1));
    for (float bad : {NAN, INFINITY, -INFINITY, 3e38f}) {
        std::vector<float> in = zentest::Noise(4096, 0.5, 2);
        in[600] = bad;
        PluginHarness plugin = zentest::Prepared(kName, {{"Mix", 50.0f}}, 1);
        const std::vector<float> out = plugin.Run(in, 1, 512)[0];
        for (float v : out) ASSERT_TRUE(std::isfinite(v)) << bad;
        // Within a block of the bad sample, the output is the clean input's.
        in[600] = 0.0f;
        PluginHarness clean = zentest::Prepared(kName, {{"Mix", 50.0f}}, 1);
        const std::vector<float> reference = clean.Run(in, 1, 512)[0];
        for (std::size_t n = 600 + 512 + 2 * plugin.Audio().GetLatency(); n < out.size(); ++n)
            ASSERT_NEAR(out[n], reference[n], std::isnan(bad) ? 0.0f : 0.02f) << bad << " at " << n;
    }
}

