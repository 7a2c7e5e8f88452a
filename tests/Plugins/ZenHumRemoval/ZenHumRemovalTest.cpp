// "De-Hummer" through the host interface: 50 and 60 Hz hum with nine
// harmonics under speech, steady, off its nominal frequency and drifting,
// taken out by 30 dB while the speech band keeps its level; the amount and
// the listen switch, latency, block splits, layouts and bad input.
#include <gtest/gtest.h>

#include <array>
#include <cmath>
#include <complex>
#include <string>

#include "Plugins/ZenHumRemoval/ZenHumRemoval.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"
#include "Support/Speech.h"

using zentest::PluginHarness;

namespace {

const char* kName = "De-Hummer";
constexpr double kRate = 48000.0;
constexpr int kPartials = 10;  // the fundamental and nine harmonics

// Hum whose fundamental follows `frequency(t)`, each partial at -30 dBFS.
struct Hum {
    std::vector<float> samples;
    std::vector<double> phase;  // the fundamental's
};

template <class Frequency>
Hum MakeHum(std::size_t frames, Frequency frequency) {
    Hum hum{std::vector<float>(frames), std::vector<double>(frames)};
    double phase = 0.0;
    for (std::size_t n = 0; n < frames; ++n) {
        hum.phase[n] = phase;
        const std::complex<double> step = std::polar(1.0, phase + 0.7);
        std::complex<double> partial = step;
        double x = 0.0;
        for (int k = 1; k <= kPartials; ++k, partial *= step) x += 0.0316 * partial.real();
        hum.samples[n] = static_cast<float>(x);
        phase += 2.0 * zentest::kPi * frequency(static_cast<double>(n) / kRate) / kRate;
    }
    return hum;
}

// Amplitude (dBFS) of the part of x that follows each partial of the hum,
// over the samples `where` says.
std::array<double, kPartials> PartialsDb(const std::vector<float>& x, const Hum& hum, const std::vector<bool>& where) {
    std::array<std::complex<double>, kPartials> sums{};
    std::size_t count = 0;
    for (std::size_t n = 0; n < x.size(); ++n)
        if (where[n]) {
            const std::complex<double> step = std::polar(1.0, -hum.phase[n]);
            std::complex<double> partial = step;
            for (int k = 0; k < kPartials; ++k, partial *= step) sums[k] += double{x[n]} * partial;
            ++count;
        }
    std::array<double, kPartials> db;
    for (int k = 0; k < kPartials; ++k) db[k] = zentest::ToDb(2.0 * std::abs(sums[k]) / static_cast<double>(count));
    return db;
}

}  // namespace

TEST(ZenHumRemoval, HumUnderSpeechFallsBy30dBWhileTheSpeechBandHoldsItsLevel) {
    const zentest::SpeechLike speech = zentest::MakeSpeechLike(kRate, 14);
    const std::size_t frames = speech.samples.size();
    const std::size_t settled = static_cast<std::size_t>(1.5 * kRate);
    std::vector<zentest::Region> late;
    for (const auto& regions : {speech.vowels, speech.sibilants})
        for (const zentest::Region& r : regions)
            if (r.first >= settled) late.push_back(r);
    const double speechBand = zentest::BandEnergy(speech.samples, kRate, 200.0, 4000.0, late);
    // Hum is measured between the vowels, where the voice has nothing of its own at the partials.
    std::vector<bool> between(frames);
    for (std::size_t n = settled; n < frames; ++n) between[n] = true;
    for (const zentest::Region& r : speech.vowels)
        for (std::size_t n = r.first; n < std::min(frames, r.second + 2048); ++n) between[n] = false;

    const struct {
        const char* name;
        float mains;
        double (*frequency)(double);
    } cases[] = {
        {"50 Hz", 0.0f, [](double) { return 50.0; }},
        {"60 Hz", 1.0f, [](double) { return 60.0; }},
        {"50.7 Hz", 0.0f, [](double) { return 50.7; }},
        {"50 Hz drifting 0.5 Hz", 0.0f, [](double t) { return 50.0 + 0.5 * std::sin(2.0 * zentest::kPi * t / 10.0 + 0.5); }},
        {"60 Hz drifting 0.5 Hz", 1.0f, [](double t) { return 60.0 - 0.5 * std::sin(2.0 * zentest::kPi * t / 10.0); }},
    };
    for (const auto& c : cases) {
        const Hum hum = MakeHum(frames, c.frequency);
        std::vector<float> in(frames);
        for (std::size_t n = 0; n < frames; ++n) in[n] = speech.samples[n] + hum.samples[n];
        PluginHarness plugin = zentest::Prepared(kName, {{"Frequency", c.mains}});
        const std::vector<float> out = plugin.Run(in, 1, 512)[0];
        const auto before = PartialsDb(hum.samples, hum, between);
        const auto after = PartialsDb(out, hum, between);
        double worst = -300.0;
        for (int k = 0; k < kPartials; ++k) {
            const double drop = after[k] - before[k];
            EXPECT_LT(drop, -30.0) << c.name << ", partial " << k + 1;
            worst = std::max(worst, drop);
        }
        const double bandChange = 10.0 * std::log10(zentest::BandEnergy(out, kRate, 200.0, 4000.0, late) / speechBand);
        EXPECT_LT(std::fabs(bandChange), 0.5) << c.name;
        std::cout << c.name << ": partials down by at least " << -worst << " dB, speech band " << bandChange
                  << " dB, tracked " << plugin.Meter("Hum Frequency") << " Hz\n";
    }
}

TEST(ZenHumRemoval, AmountListenMetersAndTail) {
    const Hum hum = MakeHum(static_cast<std::size_t>(2 * kRate), [](double) { return 50.3; });
    const std::size_t last = hum.samples.size() - 24000;
    for (float amount : {100.0f, 50.0f}) {
        PluginHarness plugin = zentest::Prepared(kName, {{"Amount", amount}});
        const std::vector<float> out = plugin.Run(hum.samples, 1, 512)[0];
        const double left = zentest::ToDb(zentest::Rms(out, last) / zentest::Rms(hum.samples, last));
        EXPECT_NEAR(left, amount == 100.0f ? -200.0 : -6.02, amount == 100.0f ? 170.0 : 0.3) << amount;
        EXPECT_NEAR(plugin.Meter("Hum Frequency"), 50.3f, 0.01f);
        EXPECT_GT(plugin.Meter("Hum Level"), -30.0f);
    }
    // Listening: what is taken out, which here is the input itself.
    PluginHarness listen = zentest::Prepared(kName, {{"listen to removed hum", 1.0f}});
    const std::vector<float> removed = listen.Run(hum.samples, 1, 512)[0];
    std::vector<float> difference(removed.size());
    for (std::size_t n = 0; n < removed.size(); ++n) difference[n] = removed[n] - hum.samples[n];
    EXPECT_LT(zentest::ToDb(zentest::Rms(difference, last) / zentest::Rms(hum.samples, last)), -30.0);

    // After the input stops, the cancellers fall silent within the tail.
    PluginHarness plugin = zentest::Prepared(kName, {{"Width", 4.0f}});
    plugin.Run(hum.samples, 1, 512);
    const std::uint32_t tail = plugin.Audio().GetTailLength();
    const std::vector<float> after = plugin.Run(std::vector<float>(tail + 1000), 1, 512)[0];
    EXPECT_GT(zentest::Peak(after, 0, 480), 0.001f);
    EXPECT_LT(zentest::ToDb(zentest::Peak(after, tail)), -100.0);
}

TEST(ZenHumRemoval, NoLatencyNeutralAndTheSameInAnyBlockSplit) {
    const Hum hum = MakeHum(20000, [](double t) { return 60.4 + 0.2 * t; });
    std::vector<float> in = zentest::Noise(20000, 0.1, 4);
    for (std::size_t n = 0; n < in.size(); ++n) in[n] += hum.samples[n];
    auto run = [&](std::size_t block) {
        PluginHarness plugin = zentest::Prepared(kName, {{"Frequency", 1.0f}}, 2, 48000.0f, 1024);
        EXPECT_EQ(plugin.Audio().GetLatency(), 0u);
        zentest::Channels head = {std::vector<float>(in.begin(), in.begin() + 5000),
                                  std::vector<float>(in.begin(), in.begin() + 5000)};
        plugin.Process(head, block);
        plugin.Set("Amount", 40.0f);
        plugin.Set("listen to removed hum", 1.0f);
        zentest::Channels tail = {std::vector<float>(in.begin() + 5000, in.end()),
                                  std::vector<float>(in.begin() + 5000, in.end())};
        plugin.Process(tail, block);
        head[1].insert(head[1].end(), tail[1].begin(), tail[1].end());
        return head[1];
    };
    const std::vector<float> whole = run(1024);
    EXPECT_EQ(run(1), whole);
    EXPECT_EQ(run(333), whole);

    PluginHarness neutral(kName);
    ASSERT_TRUE(neutral.Audio().ApplyNeutralSetting());
    neutral.Prepare(1);
    EXPECT_EQ(neutral.Run(in, 1, 512)[0], in);
}

TEST(ZenHumRemoval, LayoutsAndBadInput) {
    PluginHarness layouts(kName);
    EXPECT_TRUE(layouts.Audio().ConfigureChannels(8, 8));
    EXPECT_FALSE(layouts.Audio().ConfigureChannels(9, 9));
    EXPECT_FALSE(layouts.Audio().ConfigureChannels(2, 1));
    const Hum hum = MakeHum(8192, [](double) { return 50.0; });
    for (float bad : {NAN, INFINITY, 3e38f}) {
        std::vector<float> in = hum.samples;
        in[600] = bad;
        PluginHarness plugin = zentest::Prepared(kName, {}, 1);
        const std::vector<float> out = plugin.Run(in, 1, 512)[0];
        for (std::size_t n = 1024; n < out.size(); ++n) ASSERT_TRUE(std::isfinite(out[n])) << bad << " at " << n;
        EXPECT_LT(std::fabs(out.back()), 1.0f) << bad;
    }
}
