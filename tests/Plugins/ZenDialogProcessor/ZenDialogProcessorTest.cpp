// "Dialogue Processor" through the host interface: the names and defaults
// the "AI" plug-in's dialogue template relies on, what a clean-up does to a
// noisy dialogue recording, each amount's law, the meters, clean switching,
// splits, layouts, latency, tail and bad input.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <string>
#include <utility>
#include <vector>

#include "Plugins/ZenDialogProcessor/ZenDialogProcessor.h"
#include "Support/Dynamics.h"
#include "Support/NoisyDialogue.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"

using zentest::PluginHarness;
using zentest::Region;
using Settings = std::vector<std::pair<std::string, float>>;

namespace {

constexpr float kRate = 48000.0f;
const char* const kStages[] = {"Rumble Filt", "De-Pop", "De-Ess", "Expander", "Compressor", "Exciter"};

// The template's defaults, set by parameter name.
const Settings kTemplateDefaults = {
    {"Rumble Filt", 0.0f}, {"De-Pop", 0.0f},          {"De-Ess", 0.0f},         {"Compressor", 0.0f},
    {"Expander", 0.0f},    {"Exciter", 0.0f},         {"De-Pop Amount", 0.15f}, {"De-Ess Amount", 0.05f},
    {"Exp Amount", 0.0f},  {"Exp Speed", 1000.0f},
};

// The template's defaults, then its "Cleanup" on and "CleanUpAmount" at
// `amount`, through the template's scales and offsets.
Settings Cleanup(float amount) {
    Settings settings = kTemplateDefaults;
    for (const char* stage : {"Rumble Filt", "De-Pop", "De-Ess", "Expander"}) settings.push_back({stage, 1.0f});
    settings.insert(settings.end(), {{"De-Pop Amount", 0.7f * amount + 0.15f},
                                     {"De-Ess Amount", 0.6f * amount + 0.05f},
                                     {"Exp Amount", 0.55f * amount}});
    return settings;
}

// Every stage out but `stage`.
Settings Only(const char* stage, Settings more = {}) {
    Settings settings;
    for (const char* s : kStages) settings.push_back({s, std::string(s) == stage ? 1.0f : 0.0f});
    settings.insert(settings.end(), more.begin(), more.end());
    return settings;
}

std::vector<float> Processed(const Settings& settings, const std::vector<float>& in) {
    return zentest::Prepared("Dialogue Processor", settings, 1).Run(in, 1, 512)[0];
}

double BandChangeDb(const std::vector<float>& out, const std::vector<float>& in, double low, double high,
                    const std::vector<Region>& regions, std::size_t frame = 1024) {
    return 10.0 * std::log10(zentest::BandEnergy(out, kRate, low, high, regions, frame) /
                             zentest::BandEnergy(in, kRate, low, high, regions, frame));
}

// The mean over the regions of each region's change of peak, in dB.
double PeakChangeDb(const std::vector<float>& out, const std::vector<float>& in, const std::vector<Region>& regions) {
    double sum = 0.0;
    for (const Region& r : regions)
        sum += zentest::ToDb(zentest::Peak(out, r.first, r.second) / zentest::Peak(in, r.first, r.second));
    return sum / static_cast<double>(regions.size());
}

// The last 0.8 s of each pause: the expander has closed by then.
std::vector<Region> GapEnds(const std::vector<Region>& gaps) {
    std::vector<Region> ends;
    for (const Region& g : gaps) ends.push_back({g.second - static_cast<std::size_t>(0.8 * kRate), g.second});
    return ends;
}

}  // namespace

TEST(ZenDialogProcessor, CarriesTheTemplateNamesWithValidDefaults) {
    PluginHarness plugin("Dialogue Processor");
    for (const auto& [name, value] : kTemplateDefaults) {
        plugin.Set(name, value);
        EXPECT_EQ(plugin.Get(name), value) << name;  // inside the range, not clamped
    }
    plugin.Set("Comp Amount", 0.5f);  // "EnhanceAmount" at full scale
    EXPECT_EQ(plugin.Get("Comp Amount"), 0.5f);
    // The defaults alone switch every stage out: the plug-in is a wire.
    const std::vector<float> speech = zentest::MakeNoisyDialogue(kRate, 1).samples;
    EXPECT_EQ(Processed(kTemplateDefaults, speech), speech);
}

TEST(ZenDialogProcessor, CleanupLeavesNoisyDialogueMeasurablyCleaner) {
    const zentest::NoisyDialogue d = zentest::MakeNoisyDialogue(kRate, 2);
    for (float amount : {0.5f, 1.0f}) {
        SCOPED_TRACE(amount);
        const std::vector<float> out = Processed(Cleanup(amount), d.samples);
        Settings noExpander = Cleanup(amount);
        noExpander.push_back({"Expander", 0.0f});
        const double rumble = BandChangeDb(out, d.samples, 15, 80, d.popFree, 8192);
        const double sibilants = PeakChangeDb(out, d.samples, d.sibilants);
        const double pops = PeakChangeDb(out, d.samples, d.pops);
        const double voice = BandChangeDb(out, d.samples, 200, 4000, d.vowels);
        const double expanded = BandChangeDb(out, Processed(noExpander, d.samples), 300, 20000, GapEnds(d.gaps));
        const double gaps = BandChangeDb(out, d.samples, 300, 20000, GapEnds(d.gaps));
        EXPECT_LT(rumble, -20.0);
        EXPECT_LT(sibilants, -3.0);
        EXPECT_LT(pops, -6.0);
        EXPECT_NEAR(voice, 0.0, 1.0);  // the voice itself
        // Between phrases the expander takes its range (40 dB x amount) off the room noise.
        const double range = ZenDialogProcessor::kExpanderRangeAtOneDb * 0.55 * amount;
        EXPECT_NEAR(expanded, -range, 1.5);
        EXPECT_LT(gaps, -range + 1.5);
        // The figures, for --gtest_output=xml.
        const std::string at = "_at_" + std::to_string(static_cast<int>(amount * 100.0f));
        for (const auto& [name, value] : {std::pair<const char*, double>{"rumble_db", rumble}, {"sibilant_peaks_db", sibilants},
                                          {"pop_peaks_db", pops}, {"voice_db", voice}, {"gaps_by_expander_db", expanded},
                                          {"gaps_db", gaps}})
            RecordProperty(name + at, std::to_string(value));
    }
}

TEST(ZenDialogProcessor, AmountsSetTheirStages) {
    // Expander: a tone open at -20 dB, then 6 dB under the threshold (ratio 3: -18 dB), then far under (the range).
    const std::size_t under = 24000, far = 72000;
    const std::vector<float> steps = zentest::LevelSteps(120000, {{0, -20.0}, {under, -46.0}, {far, -70.0}});
    const std::vector<float> expanded = Processed(Only("Expander", {{"Exp Amount", 0.5f}, {"Exp Speed", 500.0f}}), steps);
    EXPECT_NEAR(zentest::GainDb(expanded, steps, far - 1), -18.0, 0.2);
    EXPECT_NEAR(zentest::GainDb(expanded, steps, steps.size() - 1), -20.0, 0.2);
    // Closing takes the hold (50 ms) and a fifth of "Exp Speed" per time constant.
    EXPECT_NEAR(zentest::TimeConstantFrames(expanded, steps, under, 0.0, -18.0), 0.15 * kRate, 0.002 * kRate);

    // Compressor: a steady sine of -9 dB RMS, well above threshold and knee, meets the ratio line.
    const std::vector<float> tone = zentest::Sine(1000.0, kRate, 24000, 0.5);
    for (float amount : {0.5f, 1.0f}) {
        PluginHarness plugin = zentest::Prepared("Dialogue Processor", Only("Compressor", {{"Comp Amount", amount}}), 1);
        plugin.Run(tone);
        const double threshold = -12.0 - 18.0 * amount, ratio = 1.5 + 2.5 * amount;
        EXPECT_NEAR(plugin.Meter("Compressor Reduction"), (zentest::ToDb(0.5 / std::sqrt(2.0)) - threshold) * (1.0 / ratio - 1.0), 0.3)
            << amount;
    }

    // De-esser: more amount, less sibilance; none at 0.
    const zentest::NoisyDialogue d = zentest::MakeNoisyDialogue(kRate, 1);
    double previous = 0.5;
    for (float amount : {0.0f, 0.3f, 0.6f, 1.0f}) {
        const double change = BandChangeDb(Processed(Only("De-Ess", {{"De-Ess Amount", amount}}), d.samples), d.samples, 5000,
                                           9000, d.sibilants);
        EXPECT_LT(change, previous - (amount == 0.0f ? 0.0 : 1.0)) << amount;
        previous = change;
    }
    // Exciter: what it adds grows with the amount, in proportion.
    auto added = [&](float amount) {
        const std::vector<float> out = Processed(Only("Exciter", {{"Exciter Amount", amount}}), d.samples);
        std::vector<float> difference(out.size());
        for (std::size_t n = 0; n < out.size(); ++n) difference[n] = out[n] - d.samples[n];
        return zentest::Rms(difference);
    };
    EXPECT_NEAR(zentest::ToDb(added(1.0f) / added(0.5f)), 6.02, 0.05);
}

TEST(ZenDialogProcessor, MetersFollowEachStage) {
    const zentest::NoisyDialogue d = zentest::MakeNoisyDialogue(kRate, 1);
    Settings all = Cleanup(1.0f);
    all.insert(all.end(), {{"Compressor", 1.0f}, {"Comp Amount", 1.0f}, {"Exciter", 1.0f}});
    PluginHarness plugin = zentest::Prepared("Dialogue Processor", all, 2);
    // Each meter read at the end of the block holding its moment.
    const std::size_t sibilant = (d.sibilants[1].first + d.sibilants[1].second) / 2, pop = d.pops[0].first + 600,
                      vowel = (d.vowels[1].first + d.vowels[1].second) / 2, gapEnd = d.gaps[0].second - 1;
    const std::vector<std::pair<std::size_t, std::pair<std::string, double>>> expected = {
        {pop, {"De-Pop Reduction", -3.0}}, {sibilant, {"De-Ess Reduction", -3.0}},
        {vowel, {"Compressor Reduction", -1.0}}, {gapEnd, {"Expander Reduction", -20.5}}};
    std::size_t next = 0;
    float rumble = -120.0f;
    for (std::size_t done = 0; done < d.samples.size(); done += 512) {
        const std::size_t frames = std::min<std::size_t>(512, d.samples.size() - done);
        zentest::Channels block(2, std::vector<float>(d.samples.begin() + static_cast<std::ptrdiff_t>(done),
                                                      d.samples.begin() + static_cast<std::ptrdiff_t>(done + frames)));
        plugin.Process(block);
        EXPECT_FLOAT_EQ(plugin.Meter("Input Peak 2"), static_cast<float>(zentest::ToDb(zentest::Peak(d.samples, done, done + frames))));
        if (next < expected.size() && expected[next].first < done + frames) {
            const auto& [name, below] = expected[next].second;
            EXPECT_LT(plugin.Meter(name), below) << name;
            ++next;
        }
        if (done >= d.gaps[0].first) rumble = std::max(rumble, plugin.Meter("Rumble Removed"));
        if (done + frames > vowel && done <= vowel) {
            EXPECT_GT(plugin.Meter("Exciter Added"), -60.0f);
        }
    }
    EXPECT_EQ(next, expected.size());
    EXPECT_GT(plugin.Meter("Expander Reduction"), -23.5f);  // the range, not more
    // What the rumble filter takes is the rumble: at its peaks, 3 to 9 dB over its RMS.
    EXPECT_NEAR(rumble, zentest::kRumbleRmsDb + 6.0, 3.0);
}

TEST(ZenDialogProcessor, SwitchesAndAmountsMoveWithoutClicks) {
    // A low tone: the rumble filter would step it, the expander and compressor jump its level.
    const std::vector<float> tone = zentest::Sine(110.0, kRate, 48128, 0.3);
    PluginHarness plugin = zentest::Prepared("Dialogue Processor", Only("None"), 1);
    zentest::Channels io = {tone};
    for (std::size_t done = 0; done < tone.size(); done += 512) {
        if (done == 12288 || done == 30720)
            for (const char* stage : kStages) plugin.Set(stage, done == 12288 ? 1.0f : 0.0f);
        if (done == 20480)
            for (const char* amount : {"Exp Amount", "Comp Amount", "De-Pop Amount", "Exciter Amount"}) plugin.Set(amount, 1.0f);
        zentest::Channels block = {std::vector<float>(io[0].begin() + static_cast<std::ptrdiff_t>(done),
                                                      io[0].begin() + static_cast<std::ptrdiff_t>(done + 512))};
        plugin.Process(block);
        std::copy(block[0].begin(), block[0].end(), io[0].begin() + static_cast<std::ptrdiff_t>(done));
    }
    EXPECT_LT(zentest::LargestStep(io[0]), 1.2f * zentest::LargestStep(tone));
}

TEST(ZenDialogProcessor, SplitsLayoutsLatencyTailAndBadInput) {
    const zentest::NoisyDialogue d = zentest::MakeNoisyDialogue(kRate, 1);
    Settings all = Cleanup(1.0f);
    all.insert(all.end(), {{"Compressor", 1.0f}, {"Exciter", 1.0f}});
    // Settings that move while processing reach the same samples whatever the split.
    auto run = [&](std::uint32_t channels, std::size_t block) {
        PluginHarness plugin = zentest::Prepared("Dialogue Processor", Cleanup(0.5f), channels);
        zentest::Channels head(channels, std::vector<float>(d.samples.begin(), d.samples.begin() + 512));
        plugin.Process(head);
        for (const auto& [name, value] : all) plugin.Set(name, value);
        zentest::Channels rest(channels, std::vector<float>(d.samples.begin() + 512, d.samples.end()));
        plugin.Process(rest, block);
        return rest;
    };
    const zentest::Channels stereo = run(2, 512);
    EXPECT_EQ(stereo[0], stereo[1]);
    EXPECT_EQ(run(1, 512)[0], stereo[0]);
    EXPECT_EQ(run(1, 7)[0], stereo[0]);
    EXPECT_EQ(run(1, 5000)[0], stereo[0]);  // beyond the prepared block

    PluginHarness plugin = zentest::Prepared("Dialogue Processor", all, 1);
    EXPECT_EQ(plugin.Audio().GetLatency(), 0u);
    EXPECT_FALSE(plugin.Audio().ConfigureChannels(3, 3));
    EXPECT_FALSE(plugin.Audio().ConfigureChannels(1, 2));
    // Noise, then silence: below -100 dBFS once the stated tail has passed.
    const std::uint32_t tail = plugin.Audio().GetTailLength();
    EXPECT_GT(tail, 0u);
    std::vector<float> burst = zentest::Noise(4800 + tail, 0.5);
    std::fill(burst.begin() + 4800, burst.end(), 0.0f);
    EXPECT_LT(zentest::Peak(plugin.Run(burst)[0], 4800 + tail), 1e-5f);
    ASSERT_TRUE(plugin.Audio().ApplyNeutralSetting());
    EXPECT_EQ(plugin.Audio().GetTailLength(), 0u);

    // A NaN or infinity in a vowel: finite again within a block, and the voice after it as before.
    const std::vector<float> clean = Processed(all, d.samples);
    for (float bad : {NAN, INFINITY}) {
        std::vector<float> input = d.samples;
        input[d.vowels[0].first + 100] = bad;
        const std::vector<float> out = Processed(all, input);
        for (std::size_t n = d.vowels[0].first + 1024; n < out.size(); ++n) ASSERT_TRUE(std::isfinite(out[n])) << n;
        EXPECT_NEAR(zentest::ToDb(zentest::Rms(out, d.vowels[2].first, d.vowels[2].second) /
                                  zentest::Rms(clean, d.vowels[2].first, d.vowels[2].second)),
                    0.0, 0.1)
            << bad;
    }
}
