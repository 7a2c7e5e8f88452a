// "LFE Filter" through the host interface: each design's response against
// its analytic magnitude, which channels it filters per layout while the
// others pass bit for bit, the cut-off gliding, layouts and bad input.
#include <gtest/gtest.h>

#include <cmath>
#include <string>

#include "Plugins/ZenLFEFilter/ZenLFEFilter.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"

using zentest::PluginHarness;

namespace {

const char* kName = "LFE Filter";

// |H| in dB of the bilinear low-pass sections with these Qs at f: each is
// 1 / sqrt((1 - r^2)^2 + (r / q)^2), r the ratio of prewarped frequencies.
double DesignDb(ZenLFEFilter::Type type, ZenLFEFilter::Slope slope, double cutoff, double f, double rate) {
    const double r = std::tan(zentest::kPi * f / rate) / std::tan(zentest::kPi * cutoff / rate);
    double db = 0.0;
    for (double q : ZenLFEFilter::SectionQs(type, slope))
        if (q > 0.0) db -= 10.0 * std::log10((1.0 - r * r) * (1.0 - r * r) + (r / q) * (r / q));
    return db;
}

}  // namespace

TEST(ZenLFEFilter, EachDesignsResponseWithinATenthOfADecibel) {
    for (float rate : {44100.0f, 48000.0f, 96000.0f})
        for (int type : {ZenLFEFilter::kLinkwitzRiley, ZenLFEFilter::kButterworth})
            for (int slope : {ZenLFEFilter::k24dB, ZenLFEFilter::k48dB})
                for (float cutoff : {40.0f, 120.0f, 200.0f}) {
                    PluginHarness plugin = zentest::Prepared(
                        kName, {{"Cutoff", cutoff}, {"Type", float(type)}, {"Slope", float(slope)}}, 1, rate);
                    const std::vector<float> h = plugin.Run(zentest::Impulse(1 << 15), 1, 512)[0];
                    const auto t = static_cast<ZenLFEFilter::Type>(type);
                    const auto s = static_cast<ZenLFEFilter::Slope>(slope);
                    for (double f : {10.0, 20.0, 0.5 * cutoff, 0.8 * cutoff, 1.0 * cutoff, 1.5 * cutoff, 2.0 * cutoff,
                                     4.0 * cutoff}) {
                        const double want = DesignDb(t, s, cutoff, f, rate);
                        if (want < -80.0) continue;  // the float output's own noise would count
                        EXPECT_NEAR(zentest::MagnitudeDb(h, f, rate), want, 0.1)
                            << rate << " Hz, type " << type << ", slope " << slope << ", " << cutoff << " Hz at " << f;
                    }
                    // At the cut-off a Linkwitz-Riley is -6 dB, a Butterworth -3 dB; an octave up, the slope.
                    EXPECT_NEAR(DesignDb(t, s, cutoff, cutoff, rate), type == ZenLFEFilter::kButterworth ? -3.01 : -6.02, 0.01);
                    EXPECT_LT(zentest::MagnitudeDb(h, 2.0 * cutoff, rate), slope == ZenLFEFilter::k48dB ? -42.0 : -23.0);
                }
}

TEST(ZenLFEFilter, OnlyTheLfeOfTheLayoutIsFilteredTheRestPassBitForBit) {
    const std::vector<float> noise = zentest::Noise(4096, 0.5, 3);
    // Channel count, "Channel" value, the channels filtered.
    const std::vector<std::tuple<std::uint32_t, float, std::vector<int>>> cases = {
        {1, ZenLFEFilter::kAuto, {0}},         {2, ZenLFEFilter::kAuto, {}},
        {6, ZenLFEFilter::kAuto, {3}},         {8, ZenLFEFilter::kAuto, {3}},
        {12, ZenLFEFilter::kAuto, {3}},        {5, ZenLFEFilter::kAuto, {}},
        {2, ZenLFEFilter::kAll, {0, 1}},       {6, ZenLFEFilter::kFirstNumbered + 5, {5}},
        {2, ZenLFEFilter::kFirstNumbered + 7, {}},
    };
    for (const auto& [channels, choice, filtered] : cases) {
        PluginHarness plugin = zentest::Prepared(kName, {{"Channel", choice}}, channels);
        const zentest::Channels out = plugin.Run(noise, channels, 512);
        for (std::uint32_t c = 0; c < channels; ++c) {
            const bool lfe = std::find(filtered.begin(), filtered.end(), int(c)) != filtered.end();
            if (lfe) {
                EXPECT_LT(zentest::Rms(out[c]), 0.1 * zentest::Rms(noise)) << channels << " ch, channel " << c;
            } else {
                EXPECT_EQ(out[c], noise) << channels << " ch, channel " << c;
            }
        }
        if (!filtered.empty()) {
            EXPECT_GT(plugin.Meter("LFE Peak"), -40.0f);
        }
    }
    PluginHarness plugin(kName);
    EXPECT_TRUE(plugin.Audio().ConfigureChannels(32, 32));
    EXPECT_FALSE(plugin.Audio().ConfigureChannels(33, 33));
    EXPECT_FALSE(plugin.Audio().ConfigureChannels(6, 1));
}

TEST(ZenLFEFilter, NoLatencyAndTheCutoffGlidesTheSameInAnyBlockSplit) {
    const std::vector<float> noise = zentest::Noise(9000, 0.5, 8);
    auto run = [&](std::size_t block) {
        PluginHarness plugin = zentest::Prepared(kName, {{"Slope", 1.0f}}, 1, 48000.0f, 1024);
        EXPECT_EQ(plugin.Audio().GetLatency(), 0u);
        zentest::Channels head = {std::vector<float>(noise.begin(), noise.begin() + 700)};
        plugin.Process(head, block);
        plugin.Set("Cutoff", 50.0f);
        zentest::Channels tail = {std::vector<float>(noise.begin() + 700, noise.end())};
        plugin.Process(tail, block);
        head[0].insert(head[0].end(), tail[0].begin(), tail[0].end());
        return head[0];
    };
    const std::vector<float> whole = run(700);
    EXPECT_EQ(run(1), whole);
    EXPECT_EQ(run(333), whole);
    EXPECT_EQ(run(4000), whole);
    // The glide moves the filter without a jump: no step much beyond the steady output's.
    EXPECT_LT(zentest::LargestStep(std::vector<float>(whole.begin() + 700, whole.end())),
              2.0f * zentest::LargestStep(std::vector<float>(whole.begin(), whole.begin() + 700)));
}

TEST(ZenLFEFilter, NonFiniteInputRecoversWithinABlock) {
    for (float bad : {NAN, INFINITY}) {
        std::vector<float> in = zentest::Noise(4096, 0.5, 2);
        in[600] = bad;
        PluginHarness plugin = zentest::Prepared(kName, {}, 1);
        const std::vector<float> out = plugin.Run(in, 1, 512)[0];
        for (std::size_t n = 1024; n < out.size(); ++n) ASSERT_TRUE(std::isfinite(out[n])) << bad << " at " << n;
    }
}
