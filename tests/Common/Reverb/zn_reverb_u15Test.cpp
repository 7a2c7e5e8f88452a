// The processing object with its engine: the decay you set is the decay you
// get at every rate, the damping law, the mix law, stability over long runs,
// block-split invariance and the reset fade.
#include <gtest/gtest.h>

#include <cfloat>
#include <cmath>
#include <complex>

#include "Common/Reverb/zn_reverb_u15_x2.h"
#include "Common/Reverb/zn_reverb_u15_x4.h"
#include "ReverbRig.h"
#include "Support/AssertionRecorder.h"
#include "Support/DecayAnalysis.h"
#include "Support/Signals.h"

using namespace zen::reverb;
using reverbtest::Rig;

namespace {

void FullyWet(zn_reverb& e, float t60) {
    e.Set(zn_reverb::kBalance, 1.0f);
    e.Set(zn_reverb::kT60, t60);
}

// The wet impulse responses of `channels` outputs, long enough for the
// fit's -35 dB point with room to spare for the backward integration.
reverbtest::Channels WetResponses(float rate, float t60, float ratio, std::uint32_t channels) {
    Rig rig(rate, channels, [&](zn_reverb& e) {
        FullyWet(e, t60);
        e.Set(zn_reverb::kHighDecayRatio, ratio);
    });
    reverbtest::Channels io(channels, std::vector<float>(static_cast<std::size_t>((0.9 * t60 + 0.2) * rate), 0.0f));
    for (auto& c : io) c[0] = 1.0f;
    rig.Process(io);
    return io;
}

// As a room is measured: the mean over several listening positions (output
// channels, each with its own mix of the lines), which evens out the modal
// fluctuations of one position in short decays.
double MeanBandDecay(const reverbtest::Channels& responses, double band, float rate) {
    double sum = 0.0;
    for (const auto& response : responses) sum += zentest::BandDecayTime(response, band, rate);
    return sum / static_cast<double>(responses.size());
}

// "T@-60dB" is the decay of every band when the highs are not damped
// (full brightness); the damping law is tested on its own below.
void ExpectDecay(float rate, float t60) {
    const std::uint32_t positions = t60 < 1.0f ? 4 : 1;  // long decays are smooth from one
    const auto responses = WetResponses(rate, t60, 1.0f, positions);
    for (double band : {500.0, 1000.0, 2000.0}) {
        const double measured = MeanBandDecay(responses, band, rate);
        EXPECT_NEAR(measured / t60, 1.0, 0.05) << "T60 " << t60 << " s at " << rate << " Hz, " << band
                                               << " Hz band: measured " << measured << " s";
    }
}

}  // namespace

class DecayYouSet : public testing::TestWithParam<std::pair<float, float>> {};

TEST_P(DecayYouSet, IsTheDecayYouGet) { ExpectDecay(GetParam().first, GetParam().second); }

// The resampled objects at 96 and 192 kHz run the same room at 48 kHz.
INSTANTIATE_TEST_SUITE_P(RatesAndTimes, DecayYouSet,
                         testing::Values(std::pair{48000.0f, 0.3f}, std::pair{48000.0f, 0.5f}, std::pair{48000.0f, 1.0f},
                                         std::pair{48000.0f, 2.0f}, std::pair{48000.0f, 5.0f}, std::pair{48000.0f, 10.0f},
                                         std::pair{44100.0f, 0.3f}, std::pair{44100.0f, 3.0f}, std::pair{96000.0f, 0.3f},
                                         std::pair{96000.0f, 1.5f}, std::pair{192000.0f, 1.0f}),
                         [](const testing::TestParamInfo<std::pair<float, float>>& p) {
                             return "At" + std::to_string(int(p.param.first)) + "HzT60Of" +
                                    std::to_string(int(p.param.second * 1000)) + "ms";
                         });

TEST(zn_reverb_u15, HighsDecayFasterAsTheRatioFalls) {
    const float t60 = 1.0f;
    double previous = 1e9;
    for (float ratio : {1.0f, 0.5f, 0.25f}) {
        const auto responses = WetResponses(48000.0f, t60, ratio, 4);
        zn_reverb engine(48000.0f, 1, 1);
        engine.Set(zn_reverb::kT60, t60);
        engine.Set(zn_reverb::kHighDecayRatio, ratio);
        engine.Update();
        // The damping law: per pass lane i keeps g_i |H_i| at frequency f,
        // H_i(z) = (1 + c_i) / (1 + c_i z^-1). The mixed network holds energy
        // in each lane in proportion to its length, so it loses the sum of
        // the lanes' losses per pass over the sum of their times.
        auto predicted = [&](double f) {
            const double w = 2.0 * M_PI * f / 48000.0;
            double lossDb = 0.0, time = 0.0;
            for (std::uint32_t i = 0; i < 15; ++i) {
                const double g = engine.Param().tail.core.gains(i), c = engine.Param().tail.core.coefficients(i);
                const double h = (1.0 + c) / std::abs(std::complex<double>(1.0 + c * std::cos(w), -c * std::sin(w)));
                lossDb += -20.0 * std::log10(g * h);
                time += engine.LaneTime(i);
            }
            return 60.0 * time / lossDb;
        };
        for (double band : {500.0, 2000.0, 8000.0}) {
            const double measured = MeanBandDecay(responses, band, 48000.0f);
            EXPECT_NEAR(measured / predicted(band), 1.0, 0.12)
                << "ratio " << ratio << ": the " << band << " Hz band decays in " << measured << " s, the law says "
                << predicted(band) << " s";
        }
        const double high = MeanBandDecay(responses, 8000.0, 48000.0f);
        EXPECT_LT(high, previous) << ratio;
        previous = high;
    }
}

TEST(zn_reverb_u15, DryOnlyPassesTheInputUnchangedAtEveryRate) {
    for (float rate : {44100.0f, 48000.0f, 96000.0f, 192000.0f}) {
        Rig rig(rate, 2, [](zn_reverb& e) { e.Set(zn_reverb::kBalance, 0.0f); });
        reverbtest::Channels io = {zentest::Noise(4000, 0.9, 1), zentest::Noise(4000, 0.9, 2)};
        const auto input = io;
        rig.Process(io, 300);
        EXPECT_EQ(io, input) << rate;
    }
}

TEST(zn_reverb_u15, FullyWetHasNoDirectSound) {
    Rig rig(48000.0f, 1, [](zn_reverb& e) { e.Set(zn_reverb::kBalance, 1.0f); });
    const auto response = rig.ImpulseResponse(2000);
    const std::uint32_t first = rig.engine.Param().reflections.delays(0);
    for (std::uint32_t i = 0; i + 1 < first; ++i) ASSERT_EQ(response[i], 0.0f) << i;  // silence before the first reflection
    EXPECT_GT(std::fabs(response[first]) + std::fabs(response[first + 1]), 1e-3f);
    // Half way: the direct sound at the distance law's level, 1 / (4 m + 1).
    Rig half(48000.0f, 1);
    EXPECT_NEAR(half.ImpulseResponse(8)[0], 0.2f, 1e-6f);
}

TEST(zn_reverb_u15, LongNoiseStaysFiniteAndBounded) {
    // The longest, least damped tail, driven hard.
    Rig rig(48000.0f, 2, [](zn_reverb& e) {
        FullyWet(e, 20.0f);
        e.Set(zn_reverb::kHighDecayRatio, 1.0f);
    });
    reverbtest::Channels io = {zentest::Noise(480000, 1.0, 3), zentest::Noise(480000, 1.0, 4)};
    rig.Process(io);
    for (const auto& channel : io) {
        for (float v : channel) ASSERT_TRUE(std::isfinite(v));
        EXPECT_LT(zentest::Peak(channel), 30.0f);
        EXPECT_GT(zentest::Rms(channel, 400000), 0.1);
    }
}

TEST(zn_reverb_u15, TailFallsBelowMinus120dBAndNeverTurnsDenormal) {
    // No FTZ here: the state's guard alone keeps denormals out.
    Rig rig(48000.0f, 1, [](zn_reverb& e) { FullyWet(e, 0.3f); });
    const auto response = rig.ImpulseResponse(48000 * 6);
    const auto lastSecond = std::vector<float>(response.end() - 48000, response.end());
    EXPECT_LT(zentest::ToDb(zentest::Peak(lastSecond)), -120.0);
    for (float v : response) ASSERT_TRUE(v == 0.0f || std::fabs(v) >= FLT_MIN) << v;
}

TEST(zn_reverb_u15, AnyBlockSplitGivesTheSameOutput) {
    for (float rate : {48000.0f, 96000.0f, 192000.0f}) {
        const auto input = zentest::Noise(6000, 0.5, 5);
        auto run = [&](std::size_t block) {
            Rig rig(rate, 2);
            reverbtest::Channels io = {input, input};
            rig.Process(io, block);
            return io;
        };
        const auto whole = run(reverbtest::kBlock);
        for (std::size_t block : {1u, 7u, 333u}) EXPECT_EQ(run(block), whole) << rate << " in blocks of " << block;
    }
}

TEST(zn_reverb_u15, ResetReproducesAFreshObject) {
    const auto input = zentest::Noise(9000, 0.5, 6);
    Rig fresh(48000.0f, 1), used(48000.0f, 1);
    reverbtest::Channels a = {input}, b = {zentest::Noise(20000, 0.5, 7)};
    used.Process(b);
    used.processor->Reset();
    b = {input};
    fresh.Process(a);
    used.Process(b);
    EXPECT_EQ(a, b);
}

TEST(zn_reverb_u15, NewRoomFadesTheTailOutResetsAndFadesItIn) {
    Rig rig(48000.0f, 1, [](zn_reverb& e) { FullyWet(e, 2.0f); });
    reverbtest::Channels io = {zentest::Noise(48000, 0.5, 8)};
    rig.Process(io);
    const std::uint32_t before = rig.processor->Tail().Lines().Length(0);
    rig.engine.Set(zn_reverb::kRoomWidth, 30.0f);
    rig.Apply();
    EXPECT_EQ(rig.processor->Tail().Lines().Length(0), before);  // not yet: fading out
    EXPECT_FALSE(rig.processor->Control().Idle());
    const std::uint32_t fade = rig.processor->Control().FadeLength();
    EXPECT_EQ(fade, 960u);  // 20 ms
    // Out, reset, silent while the emptied lines fill, in.
    const std::uint32_t longest = rig.engine.Param().tail.core.lengths(0);
    io = {zentest::Noise(fade + 256, 0.5, 9)};
    rig.Process(io);
    EXPECT_NE(rig.processor->Tail().Lines().Length(0), before);
    io = {zentest::Noise(longest + fade + 256, 0.5, 10)};
    rig.Process(io);
    EXPECT_EQ(rig.processor->Tail().Lines().Length(0), rig.engine.Param().tail.core.lengths(0));
    EXPECT_TRUE(rig.processor->Control().Idle());
    EXPECT_LT(zentest::LargestStep(io[0]), 0.5f);
}

TEST(zn_reverb_u15, BlocksTheResampledObjectsCannotTakeAreReported) {
    zentest::AssertionRecorder recorder;
    zn_reverb_u15_x2 x2;
    zn_reverb_u15_x4 x4;
    zn_reverb engine(48000.0f, 1, 1);
    engine.Update();
    for (zn_reverb_u15* p : {static_cast<zn_reverb_u15*>(&x2), static_cast<zn_reverb_u15*>(&x4)}) {
        p->Dimension(1, 1, 48000.0f * p->Factor(), 64, 8000);
        p->Configure(engine.Param());
    }
    std::vector<float> buffer(64, 0.0f);
    float* channels[] = {buffer.data()};
    EXPECT_TRUE(x2.Process(channels, 64));
    EXPECT_FALSE(x2.Process(channels, 63));
    EXPECT_FALSE(x4.Process(channels, 6));
    ASSERT_EQ(recorder.Assertions().size(), 2u);
    EXPECT_EQ(recorder.Assertions()[0].message, "(nsamples & 1) == 0");
    EXPECT_EQ(recorder.Assertions()[1].message, "(nsamples & 3) == 0");
    EXPECT_EQ(x4.InFrameSize(), 4096u);
}
