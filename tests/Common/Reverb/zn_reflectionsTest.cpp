// The tap networks: plain taps land where and as loud as set; modulated taps
// stay within their depth, move the pitch by well under a cent, cross-fade a
// new tap set, and refuse lines longer than their limit.
#include <gtest/gtest.h>

#include <cmath>

#include "Common/Reverb/zn_reflections.h"
#include "Common/Reverb/zn_reflections_mod.h"
#include "Support/AssertionRecorder.h"
#include "Support/Signals.h"

using namespace zen::reverb;

namespace {

// Lane `tap` of the response to `input` (`inputs` channels one after the other).
template <class Taps>
std::vector<float> Lane(Taps& taps, const std::vector<float>& input, std::uint32_t inputs, std::uint32_t tap) {
    const std::size_t frames = input.size() / inputs;
    std::vector<float> lanes(frames * 16);
    taps.Process(input.data(), frames, lanes.data(), frames, frames);
    return std::vector<float>(lanes.begin() + tap * frames, lanes.begin() + (tap + 1) * frames);
}

zn_reflections_mod_param Taps(std::uint32_t inputs, std::uint32_t first, float depth) {
    zn_reflections_mod_param p(inputs);
    for (std::uint32_t k = 0; k < 16; ++k) {
        p.delays(k) = first + 37 * k;
        p.depths(k) = depth;
    }
    return p;
}

}  // namespace

TEST(zn_reflections, EachTapIsItsDelayedWeightedInputs) {
    zn_reflections taps;
    taps.Dimension(2, 100);
    zn_reflections_param p(2);
    for (std::uint32_t k = 0; k < 16; ++k) {
        p.delays(k) = 5 + 3 * k;
        p.weights(k, 0) = 0.5f;
        p.weights(k, 1) = -0.25f;
    }
    p.delays(15) = 3000;  // longer than dimensioned: the memory grows
    taps.Configure(p);
    EXPECT_GE(taps.Capacity(), 3001u);
    std::vector<float> input(2 * 3100, 0.0f);
    input[0] = 1.0f;          // left impulse at 0
    input[3100 + 10] = 1.0f;  // right impulse at 10
    for (std::uint32_t k : {0u, 7u, 15u}) {
        taps.Reset();
        const auto lane = Lane(taps, input, 2, k);
        const std::uint32_t d = p.delays(k);
        EXPECT_EQ(lane[d], 0.5f) << k;
        EXPECT_EQ(lane[d + 10], -0.25f) << k;
        EXPECT_NEAR(zentest::Rms(lane), std::sqrt((0.25 + 0.0625) / lane.size()), 1e-9) << k;  // nothing else
    }
}

TEST(zn_reflections_mod, WithoutDepthItIsThePlainNetwork) {
    zn_reflections plain;
    zn_reflections_mod modulated;
    plain.Dimension(1, 1000);
    modulated.Dimension(1, 48000.0f);
    const auto p = Taps(1, 20, 0.0f);
    plain.Configure(p);
    modulated.Configure(p);
    const auto input = zentest::Noise(2000, 1.0, 4);
    for (std::uint32_t k : {0u, 9u}) {
        plain.Reset();
        modulated.Reset();
        EXPECT_EQ(Lane(modulated, input, 1, k), Lane(plain, input, 1, k)) << k;
    }
}

TEST(zn_reflections_mod, TapsMoveWithinTheirDepthAndBarelyBendThePitch) {
    // Depth 4.2 samples, the deepest the plug-in sets on its last tap.
    zn_reflections_mod taps;
    taps.Dimension(1, 48000.0f);
    taps.Configure(Taps(1, 100, 4.2f));
    const auto lane = Lane(taps, zentest::Impulse(1000), 1, 0);
    for (std::size_t i = 0; i < lane.size(); ++i) {
        if (lane[i] != 0.0f) {
            EXPECT_NEAR(double(i), 100.0, 5.3) << i;
        }
    }
    // A 1 kHz tone through the slowest and the fastest tap for two seconds:
    // the period, from zero crossings, strays by under 1.5 cents (slow
    // vibrato becomes audible at several cents).
    taps.Reset();
    const auto tone = zentest::Sine(1000.0, 48000.0, 96000);
    for (std::uint32_t k : {0u, 15u}) {
        taps.Reset();
        const auto out = Lane(taps, tone, 1, k);
        double previous = -1.0, worst = 0.0;
        for (std::size_t i = 1000; i < out.size(); ++i) {
            if (!(out[i - 1] < 0.0f && out[i] >= 0.0f)) continue;
            const double crossing = double(i - 1) + out[i - 1] / (out[i - 1] - out[i]);
            if (previous > 0.0) worst = std::max(worst, std::fabs(1200.0 * std::log2((crossing - previous) / 48.0)));
            previous = crossing;
        }
        EXPECT_LT(worst, 1.5) << "tap " << k << " bends the pitch by " << worst << " cents";
    }
}

TEST(zn_reflections_mod, ANewTapSetIsCrossFaded) {
    zn_reflections_mod taps;
    taps.Dimension(1, 48000.0f);
    taps.Configure(Taps(1, 100, 0.5f));
    const auto tone = zentest::Sine(300.0, 48000.0, 4000, 0.8);
    auto before = Lane(taps, tone, 1, 3);
    taps.Configure(Taps(1, 700, 0.5f));  // a jump of 600 samples
    EXPECT_TRUE(taps.Fading());
    auto after = Lane(taps, tone, 1, 3);
    EXPECT_FALSE(taps.Fading());
    EXPECT_EQ(taps.Delay(3), 700u + 3 * 37);
    EXPECT_LT(zentest::LargestStep(after), 1.5f * zentest::LargestStep(before));
}

TEST(zn_reflections_mod, LinesLongerThanTheLimitAreReported) {
    zentest::AssertionRecorder recorder;
    zn_reflections_mod taps;
    taps.Dimension(1, 48000.0f);
    taps.Configure(Taps(1, 40000, 0.0f));
    ASSERT_EQ(recorder.Assertions().size(), 1u);
    EXPECT_EQ(recorder.Assertions()[0].message, "max_length <= zn_reflections_mod_param::DelayLines::MaxLength");
    EXPECT_EQ(taps.Delay(0), zn_reflections_mod_param::DelayLines::MaxLength);  // clamped
}

TEST(zn_reflections_mod, FadesGlidesAndSettledRunsGiveTheSameOutputInAnySplit) {
    const auto input = zentest::Noise(6000, 0.8, 11);
    auto run = [&](std::size_t block) {
        zn_reflections_mod taps;
        taps.Dimension(2, 48000.0f, 512);
        taps.Configure(Taps(2, 100, 0.8f));
        std::vector<float> lanes(16 * 6000);
        std::vector<float> in(2 * block);
        for (std::size_t done = 0, n = 0; done < 6000; done += n) {
            if (done == 2400) taps.Configure(Taps(2, 300, 1.5f));  // a fade, then a depth glide that settles
            n = std::min(block, (done < 2400 ? 2400 : 6000) - done);
            std::copy_n(input.begin() + done, n, in.begin());
            std::copy_n(input.rbegin() + done, n, in.begin() + block);
            std::vector<float> out(16 * n);
            taps.Process(in.data(), block, out.data(), n, n);
            for (std::size_t k = 0; k < 16; ++k) std::copy_n(out.begin() + k * n, n, lanes.begin() + k * 6000 + done);
        }
        return lanes;
    };
    const auto whole = run(480);
    for (std::size_t block : {1u, 7u, 333u}) EXPECT_EQ(run(block), whole) << "blocks of " << block;
}
