// "Foley Sampler" through the host interface: when triggers land, the laws
// of pitch, rate and gain, variation, voice stealing, meters and tail.
#include <gtest/gtest.h>

#include <cmath>

#include "Plugins/ZenFoleySampler/ZenFoleySampler.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"

using zentest::Channels;
using zentest::PluginHarness;

namespace {

constexpr float kThud = 11;
constexpr float kMetal = 10;

PluginHarness Sampler(float pad, std::vector<std::pair<std::string, float>> settings = {}, float rate = 48000.0f,
                      std::uint32_t block = 512) {
    settings.insert(settings.begin(), {{"Pad", pad}, {"Variation", 0.0f}});
    return zentest::Prepared("Foley Sampler", settings, 2, rate, block);
}

Channels Silence(std::size_t frames) { return Channels(2, std::vector<float>(frames, 0.0f)); }

// Processes `frames` in blocks of `block`; Trigger rises before the block at
// `triggerBlock` (and falls after it).
std::vector<float> Play(PluginHarness& plugin, std::size_t frames, std::size_t block, std::size_t triggerBlock = 0) {
    std::vector<float> out;
    for (std::size_t b = 0; b * block < frames; ++b) {
        if (b == triggerBlock) plugin.Set("Trigger", 1.0f);
        Channels io = Silence(std::min(block, frames - b * block));
        plugin.Process(io);
        if (b == triggerBlock) plugin.Set("Trigger", 0.0f);
        out.insert(out.end(), io[0].begin(), io[0].end());
    }
    return out;
}

}  // namespace

TEST(ZenFoleySampler, TriggerStartsAtTheFirstSampleOfTheNextBlock) {
    PluginHarness first = Sampler(kThud);
    const std::vector<float> reference = Play(first, 4800, 4800);
    ASSERT_GT(zentest::Peak(reference), 0.1f);
    for (std::size_t block : {1, 64, 100}) {
        PluginHarness plugin = Sampler(kThud);
        const std::size_t triggerBlock = 7;
        const std::vector<float> out = Play(plugin, 4800 + 7 * block, block, triggerBlock);
        EXPECT_EQ(zentest::Peak(out, 0, triggerBlock * block), 0.0f) << block;
        for (std::size_t i = 0; i < reference.size(); ++i)
            ASSERT_EQ(out[triggerBlock * block + i], reference[i]) << "block " << block << ", sample " << i;
    }
}

TEST(ZenFoleySampler, RisingEdgesTriggerAndHeldTriggersDoNot) {
    PluginHarness plugin = Sampler(kThud);
    plugin.Set("Trigger", 1.0f);
    Channels io = Silence(256);
    plugin.Process(io);
    EXPECT_EQ(plugin.Meter("Active Voices"), 1.0f);
    for (int b = 0; b < 3; ++b) plugin.Process(io);  // held high
    EXPECT_EQ(plugin.Meter("Active Voices"), 1.0f);
    plugin.Audio().Prepare(48000.0f, 512);  // the prepared hand-over of a held trigger is no edge
    plugin.Process(io);
    EXPECT_EQ(plugin.Meter("Active Voices"), 0.0f);
    plugin.Set("Trigger", 0.0f);
    plugin.Process(io);
    plugin.Set("Trigger", 1.0f);
    plugin.Process(io);
    EXPECT_EQ(plugin.Meter("Active Voices"), 1.0f);
    // A pad beyond the bank plays nothing.
    plugin.Set("Pad", 100.0f);
    plugin.Set("Trigger", 0.0f);
    plugin.Process(io);
    plugin.Set("Trigger", 1.0f);
    plugin.Process(io);
    EXPECT_EQ(plugin.Meter("Active Voices"), 1.0f);
    EXPECT_EQ(plugin.Meter("Pads"), 11.0f);
}

TEST(ZenFoleySampler, PitchRateAndGainLaws) {
    PluginHarness unity = Sampler(kThud);
    const std::vector<float> x = Play(unity, 9600, 512);
    // An octave up reads every second source sample; an octave down every
    // other output sample is a source sample; so does twice the rate.
    PluginHarness up = Sampler(kThud, {{"Pitch", 12.0f}});
    const std::vector<float> y = Play(up, 4800, 512);
    for (std::size_t i = 0; i < 4800; ++i) ASSERT_EQ(y[i], x[2 * i]) << i;
    PluginHarness down = Sampler(kThud, {{"Pitch", -12.0f}});
    const std::vector<float> z = Play(down, 9600, 512);
    for (std::size_t i = 0; i < 4800; ++i) ASSERT_EQ(z[2 * i], x[i]) << i;
    PluginHarness fast = Sampler(kThud, {}, 96000.0f);
    const std::vector<float> w = Play(fast, 9600, 512);
    for (std::size_t i = 0; i < 4800; ++i) ASSERT_EQ(w[2 * i], x[i]) << i;
    // Between the samples the curve is smooth: no step larger than the source's.
    float sourceStep = 0.0f, step = 0.0f;
    for (std::size_t i = 1; i < 4800; ++i) sourceStep = std::max(sourceStep, std::fabs(x[i] - x[i - 1]));
    for (std::size_t i = 1; i < 9600; ++i) step = std::max(step, std::fabs(z[i] - z[i - 1]));
    EXPECT_LT(step, 0.6f * sourceStep);

    PluginHarness quiet = Sampler(kThud, {{"Gain", -6.0f}});
    const std::vector<float> q = Play(quiet, 9600, 512);
    const float g = std::pow(10.0f, -6.0f / 20.0f);
    for (std::size_t i = 0; i < 9600; ++i) ASSERT_NEAR(q[i], g * x[i], 1e-6f) << i;
}

TEST(ZenFoleySampler, VariationSpreadsTakesPitchAndLevelWithinItsRange) {
    // Reset restarts the random sequence, so a render repeats exactly.
    PluginHarness plugin = Sampler(kThud, {{"Variation", 100.0f}});
    const std::vector<float> first = Play(plugin, 1024, 512);
    plugin.Audio().Reset();
    EXPECT_EQ(Play(plugin, 1024, 512), first);

    PluginHarness varied = Sampler(kThud, {{"Variation", 100.0f}});
    float low = 1.0f, high = 0.0f;
    for (int t = 0; t < 24; ++t) {
        const float peak = zentest::Peak(Play(varied, 24000, 512));  // each take ends inside
        low = std::min(low, peak);
        high = std::max(high, peak);
    }
    const double bound = ZenFoleySampler::kVariationDb + 0.2;  // and the interpolated peak
    EXPECT_GT(zentest::ToDb(low / 0.5), -bound);
    EXPECT_LT(zentest::ToDb(high / 0.5), bound);
    EXPECT_GT(zentest::ToDb(high / low), 2.0) << "levels do not vary";
}

TEST(ZenFoleySampler, StealsTheOldestVoiceWithAFade) {
    PluginHarness plugin = Sampler(kMetal, {{"Voices", 2.0f}}, 48000.0f, 64);
    std::vector<float> out;
    for (int t = 0; t < 3; ++t) {
        const std::vector<float> part = Play(plugin, 128, 64);
        out.insert(out.end(), part.begin(), part.end());
    }
    EXPECT_EQ(plugin.Meter("Active Voices"), 3.0f);  // two sounding, the oldest fading
    const std::vector<float> after = Play(plugin, 480, 64, 99);
    EXPECT_EQ(plugin.Meter("Active Voices"), 2.0f);
    // The fade leaves no step: neighbours differ no more than the ringing does.
    out.insert(out.end(), after.begin(), after.end());
    float step = 0.0f;
    for (std::size_t i = 257; i < out.size(); ++i) step = std::max(step, std::fabs(out[i] - out[i - 1]));
    EXPECT_LT(step, 0.35f);

    // Triggers two samples apart outpace the fades.
    PluginHarness full = Sampler(kMetal, {{"Voices", 64.0f}}, 48000.0f, 1);
    for (int t = 0; t < 90; ++t) Play(full, 2, 1);
    EXPECT_EQ(full.Meter("Active Voices"), 64.0f + 16.0f);  // 64 sounding and every fade slot busy
    Play(full, 480, 16, 99);
    EXPECT_EQ(full.Meter("Active Voices"), 64.0f);
}

TEST(ZenFoleySampler, OutputIsOnlyTheVoicesAndEndsWithinTheTail) {
    PluginHarness plugin = Sampler(kMetal, {{"Pitch", -5.0f}, {"Variation", 50.0f}});
    Channels io = {std::vector<float>(512, 0.7f), std::vector<float>(512, -3e38f)};
    plugin.Process(io);  // whatever the host left in the buffers is not played
    EXPECT_EQ(zentest::Peak(io[0]), 0.0f);
    EXPECT_EQ(zentest::Peak(io[1]), 0.0f);
    EXPECT_EQ(plugin.Meter("Output Peak 1"), -120.0f);

    const std::uint32_t tail = plugin.Audio().GetTailLength();
    const std::vector<float> out = Play(plugin, tail + 1024, 512);
    EXPECT_GT(zentest::Peak(out, 0, tail), 0.1f);
    EXPECT_EQ(zentest::Peak(out, tail), 0.0f) << "tail " << tail;
    EXPECT_EQ(plugin.Meter("Active Voices"), 0.0f);
    EXPECT_FALSE(plugin.Audio().ApplyNeutralSetting());
}

TEST(ZenFoleySampler, MonoOutputSumsStereoTakesAtHalfLevel) {
    PluginHarness stereo = Sampler(kThud);
    const std::vector<float> x = Play(stereo, 2048, 512);
    PluginHarness mono(std::string("Foley Sampler"));
    mono.Set("Pad", kThud);
    mono.Set("Variation", 0.0f);
    mono.Prepare(1);
    mono.Set("Trigger", 1.0f);
    Channels io(1, std::vector<float>(2048, 0.0f));
    mono.Process(io);
    for (std::size_t i = 0; i < 2048; ++i) ASSERT_EQ(io[0][i], x[i]) << i;  // built-in takes are mono
}

TEST(ZenFoleySampler, ListedWithTwoChannelsAndNoAudioInput) {
    const auto list = GetZenPluginInterface()->GetPluginList(zen::kAudioPluginKind);
    const auto row = list.find("Foley Sampler:1517184627");
    ASSERT_NE(row, list.end());
    EXPECT_EQ(row->second.channelCount, 2u);
    PluginHarness plugin("Foley Sampler");
    EXPECT_FALSE(plugin.Audio().ConfigureChannels(2, 2));
    EXPECT_FALSE(plugin.Audio().ConfigureChannels(0, 3));
    EXPECT_TRUE(plugin.Audio().ConfigureChannels(0, 1));
}
