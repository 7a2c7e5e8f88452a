// "Stereo Fixer" through the host interface: a pair with an offset, an
// inverted channel and an imbalance comes out aligned to the sample; the
// fixed latency; swap and polarity; fold-down of dead and inverted
// channels; block splits; swap and polarity switches without a click.
#include <gtest/gtest.h>

#include <cmath>

#include "Plugins/ZenStereoFixer/ZenStereoFixer.h"
#include "Support/Modulation.h"
#include "Support/PluginHarness.h"
#include "Support/Signals.h"

using zentest::Channels;
using zentest::PluginHarness;

namespace {

const char* kName = "Stereo Fixer";
constexpr std::uint32_t kLatency = 480;  // 10 ms at 48 kHz

// Left noise; right the same, `lag` samples later (earlier when negative), times `gain`.
Channels Faulty(std::size_t frames, int lag, float gain) {
    const std::vector<float> source = zentest::Noise(frames + 2000, 0.5, 5);
    Channels lr(2, std::vector<float>(frames));
    for (std::size_t n = 0; n < frames; ++n) {
        lr[0][n] = source[1000 + n];
        lr[1][n] = gain * source[1000 + n - lag];
    }
    return lr;
}

// The lag within +-range where sum l[n] r[n + k] over [from, end) peaks.
int BestLag(const Channels& lr, std::size_t from, int range) {
    int best = 0;
    double bestValue = -1.0;
    for (int k = -range; k <= range; ++k) {
        double sum = 0.0;
        for (std::size_t n = from; n + range < lr[0].size(); ++n) sum += double{lr[0][n]} * lr[1][n + k];
        if (std::fabs(sum) > bestValue) bestValue = std::fabs(sum), best = k;
    }
    return best;
}

double Correlation(const Channels& lr, std::size_t from) {
    double ll = 0.0, rr = 0.0, lr_ = 0.0;
    for (std::size_t n = from; n < lr[0].size(); ++n) {
        ll += double{lr[0][n]} * lr[0][n];
        rr += double{lr[1][n]} * lr[1][n];
        lr_ += double{lr[0][n]} * lr[1][n];
    }
    return lr_ / std::sqrt(ll * rr);
}

}  // namespace

TEST(ZenStereoFixer, OffsetInversionAndImbalanceComeOutAlignedCorrelatedAndBalanced) {
    const int lag = static_cast<int>(std::lround(0.0032 * 48000.0));  // 3.2 ms: 154 samples
    const float gain = -static_cast<float>(std::pow(10.0, -4.0 / 20.0));
    for (int direction : {1, -1}) {
        // Right late, inverted and quiet; then the same on the left.
        PluginHarness plugin = zentest::Prepared(
            kName, {{direction > 0 ? "Right Polarity" : "Left Polarity", 1.0f}, {"Balance", 4.0f * direction}}, 2);
        EXPECT_EQ(plugin.Audio().GetLatency(), kLatency);
        Channels io = Faulty(48000, lag, gain);
        if (direction < 0) std::swap(io[0], io[1]);
        plugin.Process(io, 512);
        const std::size_t from = 24000;
        EXPECT_EQ(BestLag(io, from, 200), 0) << direction;
        EXPECT_GT(Correlation(io, from), 0.95) << direction;
        EXPECT_NEAR(zentest::ToDb(zentest::Rms(io[1], from) / zentest::Rms(io[0], from)), 0.0, 0.1) << direction;
        EXPECT_NEAR(plugin.Meter("Offset"), direction * lag / 48.0, 1e-3) << direction;
        EXPECT_GT(plugin.Meter("Output Correlation"), 0.95f);
        EXPECT_NEAR(plugin.Meter("Output Balance"), 0.0f, 0.1f);
    }
}

TEST(ZenStereoFixer, FixedLatencySwapAndPolarityWithAnImpulse) {
    PluginHarness plugin = zentest::Prepared(
        kName, {{"Auto Align", 0.0f}, {"Swap Channels", 1.0f}, {"Left Polarity", 1.0f}}, 2);
    EXPECT_EQ(plugin.Audio().GetLatency(), kLatency);
    Channels io = {zentest::Impulse(2048, 100, 0.5f), zentest::Impulse(2048, 300, 0.25f)};
    plugin.Process(io, 512);
    // Swapped first, so the old right channel is the new left and is inverted.
    EXPECT_EQ(io[0], zentest::Impulse(2048, 300 + kLatency, -0.25f));
    EXPECT_EQ(io[1], zentest::Impulse(2048, 100 + kLatency, 0.5f));

    PluginHarness at96 = zentest::Prepared(kName, {}, 2, 96000.0f);
    EXPECT_EQ(at96.Audio().GetLatency(), 2 * kLatency);
}

TEST(ZenStereoFixer, FoldsDownADeadOrInvertedChannelAndLeavesHealthyStereo) {
    struct Case {
        float fold;
        Channels in;
        bool mono;
    };
    const std::vector<float> noise = zentest::Noise(24000, 0.5, 7);
    std::vector<float> inverted(noise);
    for (float& x : inverted) x = -x;
    const Channels healthy = {noise, zentest::Noise(24000, 0.5, 8)};
    const std::vector<Case> cases = {
        {ZenStereoFixer::kFoldAuto, {noise, std::vector<float>(24000, 0.0f)}, true},
        {ZenStereoFixer::kFoldAuto, {std::vector<float>(24000, 0.0f), noise}, true},
        {ZenStereoFixer::kFoldAuto, {noise, inverted}, true},
        {ZenStereoFixer::kFoldAuto, healthy, false},
        {ZenStereoFixer::kFoldOn, healthy, true},
        {ZenStereoFixer::kFoldOff, {noise, inverted}, false},
    };
    for (std::size_t i = 0; i < cases.size(); ++i) {
        PluginHarness plugin = zentest::Prepared(kName, {{"Mono Fold-Down", cases[i].fold}}, 2);
        Channels io = cases[i].in;
        plugin.Process(io, 512);
        const std::size_t from = 12000;
        if (cases[i].mono) {
            EXPECT_EQ(std::vector<float>(io[0].begin() + from, io[0].end()),
                      std::vector<float>(io[1].begin() + from, io[1].end())) << "case " << i;
            EXPECT_GT(zentest::Rms(io[0], from), 0.1) << "case " << i;  // nothing cancelled
            EXPECT_EQ(plugin.Meter("Folded"), 1.0f);
        } else {
            // Healthy stereo passes as it came, delayed by the latency.
            for (int c = 0; c < 2; ++c)
                for (std::size_t n = from; n < io[c].size(); ++n)
                    ASSERT_EQ(io[c][n], cases[i].in[c][n - kLatency]) << "case " << i << " channel " << c;
        }
    }
}

TEST(ZenStereoFixer, SameOutputInAnyBlockSplitAndOnlyStereoIsTaken) {
    const Channels in = Faulty(20000, 60, 0.8f);
    auto run = [&](std::size_t block) {
        PluginHarness plugin = zentest::Prepared(kName, {{"Balance", -3.0f}, {"Mono Fold-Down", 1.0f}}, 2);
        Channels io = in;
        plugin.Process(io, block);
        return io;
    };
    const Channels whole = run(512);
    EXPECT_EQ(run(1), whole);
    EXPECT_EQ(run(1000), whole);

    PluginHarness plugin(kName);
    EXPECT_FALSE(plugin.Audio().ConfigureChannels(1, 1));
}

TEST(ZenStereoFixer, SwapAndPolaritySwitchWithoutAClick) {
    const std::size_t frames = 19200, at = 4900, window = 4800;
    const Channels in = {zentest::Sine(1000.0, 48000.0, frames, 0.5), zentest::Sine(1000.0, 48000.0, frames, 0.4, 1.1)};
    for (const char* name : {"Swap Channels", "Left Polarity", "Right Polarity"}) {
        PluginHarness plugin = zentest::Prepared(kName, {{"Auto Align", 0.0f}}, 2);
        const std::size_t latency = plugin.Audio().GetLatency();
        Channels out = in;
        plugin.ProcessSwitched(out, at, {{name, 1.0f}});
        for (int c = 0; c < 2; ++c)
            EXPECT_LT(zentest::SwitchCurvature(out[c], at + latency, window), 1.1) << name << " " << c;
    }
}
