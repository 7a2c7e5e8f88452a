// The analysis displays draw what the plug-ins measure: the spectrum curve
// is the array meter it read, the goniometer's points sit where the Phase
// Meter's point convention puts them, and the reverb's decay curve follows
// the decay law of the engine's lines.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>

#include "Common/Editor/DecayDisplay.h"
#include "Common/Editor/GoniometerDisplay.h"
#include "Common/Editor/SpectrumDisplay.h"
#include "Common/Editor/ZenEditor.h"
#include "Common/Reverb/zn_reverb_u15.h"
#include "Common/Editor/InstanceEditorLink.h"
#include "Common/ZenAudioPluginImpl.h"
#include "Plugins/ZenReverb/ZenReverb.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"
#include "Support/TestApplication.h"

using zentest::PluginHarness;

namespace {

ZenAudioPluginImpl& Impl(PluginHarness& plugin) { return dynamic_cast<ZenAudioPluginImpl&>(plugin.Audio()); }

std::uint32_t MeterIndex(AudioPlugin& plugin, const std::string& name) {
    zen::MeterInfo info;
    for (std::uint32_t i = 0; i < plugin.GetMeterCount(); ++i)
        if (plugin.GetMeterInfo(i, info) && info.name == name) return i;
    ADD_FAILURE() << "no meter " << name;
    return 0;
}

}  // namespace

TEST(AnalysisDisplays, SpectrumCurveIsTheArrayMeterItRead) {
    zentest::EnsureApplication();
    PluginHarness plugin = zentest::Prepared("Noise Reduction", {}, 1);
    zentest::Channels x = {zentest::PinkNoise(48000, 3)};
    plugin.Process(x, 512);
    InstanceEditorLink link(Impl(plugin));
    const std::uint32_t noise = MeterIndex(plugin.Audio(), "Noise Spectrum");
    SpectrumDisplay display("Noise", -140.0, 0.0, {{"Noise", noise, SpectrumDisplay::Source::Array}});
    display.Refresh(link);

    const std::vector<float> meter = plugin.MeterArray("Noise Spectrum");
    ASSERT_EQ(display.Curves().size(), 1u);
    const std::vector<QPointF>& curve = display.Curves()[0].points;
    ASSERT_EQ(curve.size(), meter.size() - 1);  // 0 Hz has no place on a log axis
    for (std::size_t k = 1; k < meter.size(); ++k) {
        EXPECT_DOUBLE_EQ(curve[k - 1].x(), 24000.0 * static_cast<double>(k) / static_cast<double>(meter.size() - 1));
        EXPECT_EQ(curve[k - 1].y(), meter[k]) << "point " << k;
    }
    EXPECT_TRUE(display.Curves()[0].filled);
    // Pink noise: the estimate falls towards the top.
    EXPECT_GT(curve[10].y(), curve[400].y() + 10.0);
}

TEST(AnalysisDisplays, SpectrumRecordPointsAreItsPowersInDb) {
    // Bin count, powers, held peaks: full scale reads 0 dB.
    const float record[] = {3.0f, 0.5f, 1.0f, 0.01f, 1.0f, 2.0f, 0.1f};
    const std::vector<QPointF> power = SpectrumDisplay::RecordPoints(record, 7, false, 48000.0);
    const std::vector<QPointF> peak = SpectrumDisplay::RecordPoints(record, 7, true, 48000.0);
    ASSERT_EQ(power.size(), 2u);
    EXPECT_DOUBLE_EQ(power[0].x(), 12000.0);
    EXPECT_NEAR(power[0].y(), 0.0, 1e-9);
    EXPECT_NEAR(power[1].y(), -20.0, 1e-5);
    EXPECT_NEAR(peak[0].y(), 10.0 * std::log10(2.0), 1e-5);
    // A record that claims more bins than it holds draws nothing.
    EXPECT_TRUE(SpectrumDisplay::RecordPoints(record, 6, false, 48000.0).empty());

    // The largest analysis, thinned for drawing, keeps a one-bin peak and its frequency's place.
    constexpr std::size_t kBins = 16385;
    std::vector<float> large(1 + 2 * kBins, 1e-6f);
    large[0] = kBins;
    large[1 + 12345] = 0.25f;
    const std::vector<QPointF> thinned =
        SpectrumDisplay::Thinned(SpectrumDisplay::RecordPoints(large.data(), large.size(), false, 48000.0));
    ASSERT_LE(thinned.size(), SpectrumDisplay::kMaxPoints);
    const auto loudest = std::max_element(thinned.begin(), thinned.end(),
                                          [](const QPointF& a, const QPointF& b) { return a.y() < b.y(); });
    EXPECT_NEAR(loudest->y(), 10.0 * std::log10(0.25), 1e-5);
    EXPECT_NEAR(loudest->x(), 12345.0 * 24000.0 / (kBins - 1), 24000.0 * 0.01);
}

TEST(AnalysisDisplays, GoniometerPutsEachChannelOnItsDiagonal) {
    zentest::EnsureApplication();
    for (const bool leftOnly : {true, false}) {
        PluginHarness plugin = zentest::Prepared("Phase Meter", {}, 2);
        const std::vector<float> tone = zentest::Sine(997.0, 48000.0, 2400, 0.5);
        const std::vector<float> silence(tone.size(), 0.0f);
        zentest::Channels x = leftOnly ? zentest::Channels{tone, silence} : zentest::Channels{silence, tone};
        InstanceEditorLink link(Impl(plugin));
        const std::uint32_t ring = MeterIndex(plugin.Audio(), "Goniometer");
        const auto correlation = static_cast<int>(MeterIndex(plugin.Audio(), "Correlation"));
        GoniometerDisplay display("Goniometer", ring, correlation);
        display.Refresh(link);  // the cursor starts at the ring's start
        plugin.Process(x, 512);
        display.Refresh(link);

        ASSERT_EQ(display.Points().size(), tone.size()) << "one point per sample at 48 kHz";
        double largest = 0.0;
        for (std::size_t i = 0; i < tone.size(); ++i) {
            const QPointF& p = display.Points()[i];
            // Side = (R - L) / sqrt 2, mid = (L + R) / sqrt 2.
            const double expectedMid = tone[i] / std::sqrt(2.0);
            EXPECT_NEAR(p.y(), expectedMid, 1e-6);
            EXPECT_NEAR(p.x(), leftOnly ? -expectedMid : expectedMid, 1e-6);
            largest = std::max(largest, std::hypot(p.x(), p.y()));
        }
        EXPECT_NEAR(largest, 0.5, 1e-3);  // the sample peak's distance from the centre
        EXPECT_EQ(display.Correlation(), plugin.Meter("Correlation"));

        // With no audio coming (transport stopped) the cloud empties instead of freezing.
        for (std::size_t i = 0; i < GoniometerDisplay::kEmptyingRefreshes; ++i) display.Refresh(link);
        EXPECT_TRUE(display.Points().empty());
    }
}

TEST(AnalysisDisplays, ReverbDecayCurveFollowsTheLinesDecayLaw) {
    zentest::EnsureApplication();
    constexpr float kT60 = 2.5f;
    constexpr float kBrightness = 40.0f;  // %: the highest frequencies decay in 40 % of the time
    PluginHarness plugin = zentest::Prepared("Reverb", {{"ZenReverb::T60", kT60}, {"ZenReverb::BRIGHTNESS", kBrightness}}, 2);
    InstanceEditorLink link(Impl(plugin));
    DecayDisplay display("Decay", [](const zen::EditorLink& l, zen::reverb::zn_reverb& engine) {
        for (std::uint32_t p = 0; p < ZenReverb::kParameterCount; ++p)
            engine.Set(ZenReverb::RecordEntry(p), ZenReverb::ToRecord(p, l.GetParameter(p)));
    });
    display.Refresh(link);
    ASSERT_EQ(display.Curves().size(), 1u);
    const std::vector<QPointF>& curve = display.Curves()[0].points;
    ASSERT_GE(curve.size(), 80u);

    // Each line: gain g = 10^(-3 tau / T60) per pass and a one-pole damping
    // whose Nyquist gain makes the loop g^(1 / brightness) there.
    const zen::reverb::zn_reverb& engine = *display.Engine();
    const double rate = engine.SampleRate();
    const double alpha = kBrightness / 100.0;
    const auto law = [&](double frequency) {
        double sum = 0.0;
        for (std::uint32_t i = 0; i < 15; ++i) {
            const double tau = engine.LaneTime(i);
            const double g = std::pow(10.0, -3.0 * tau / kT60);
            const double b = std::pow(g, 1.0 / alpha - 1.0);
            const double c = (b - 1.0) / (b + 1.0);
            const double w = 2.0 * zentest::kPi * frequency / rate;
            const double magnitude = (1.0 + c) / std::sqrt(1.0 + 2.0 * c * std::cos(w) + c * c);
            sum += -3.0 * tau / std::log10(g * magnitude);
        }
        return sum / 15.0;
    };
    for (const QPointF& p : curve) EXPECT_NEAR(p.y(), law(p.x()), 1e-3 * law(p.x())) << "at " << p.x() << " Hz";
    EXPECT_NEAR(curve.front().y(), kT60, 0.01 * kT60);             // the low end decays in "T@-60dB"
    EXPECT_NEAR(DecayDisplay::T60At(engine, rate / 2.0), alpha * kT60, 1e-3);  // Nyquist in brightness x T60
    for (std::size_t i = 1; i < curve.size(); ++i) EXPECT_LE(curve[i].y(), curve[i - 1].y() + 1e-9);
}
