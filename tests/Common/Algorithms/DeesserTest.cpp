// Deesser: its four user controls seen in what they do to the sound: the
// band's shape by mode, the reduction by amount, the speed by reaction.
#include <gtest/gtest.h>

#include <cmath>

#include "Common/Algorithms/Deesser.h"
#include "Support/Signals.h"

namespace {

constexpr float kRate = 48000.0f;

std::unique_ptr<Deesser> Make(std::initializer_list<std::pair<Deesser::Parameter, float>> settings) {
    auto d = std::make_unique<Deesser>();
    d->SetChannelCount(1);
    d->Prepare(kRate, 512);
    for (const auto& [index, value] : settings) d->SetParameter(index, value);
    return d;
}

double SteadyGainDb(Deesser& d, double frequency) {
    std::vector<float> x = zentest::Sine(frequency, kRate, 24000, 0.5);
    float* channels[] = {x.data()};
    EXPECT_TRUE(d.Process(channels, x.size()));
    return zentest::ToDb(zentest::Rms(x, 19200) / (0.5 / std::sqrt(2.0)));
}

// What "Listen" lets the user hear at `frequency` for a mode value.
double ListenedDb(float mode, double frequency) {
    auto d = Make({{Deesser::kRange, 4000.0f}, {Deesser::kMode, mode}, {Deesser::kAmount, 100.0f},
                   {Deesser::kListen, 1.0f}});
    return SteadyGainDb(*d, frequency);
}

}  // namespace

TEST(Deesser, ListeningShowsTheBandOfEachMode) {
    const double boost = 100.0 / 6.0;  // full "Amount"
    for (float mode : {0.0f, 0.4f, 0.5f, 1.0f}) EXPECT_NEAR(ListenedDb(mode, 4000.0), 0.0, 0.1) << mode;
    // Narrow and wide bells differ an octave away; a value rounds to the nearest mode.
    const double narrow = ListenedDb(0.0f, 2000.0), wide = ListenedDb(1.0f, 2000.0);
    EXPECT_LT(narrow, wide - 3.0);
    EXPECT_GT(wide, -boost + 3.0);
    EXPECT_EQ(ListenedDb(0.4f, 2000.0), narrow);
    EXPECT_EQ(ListenedDb(0.5f, 2000.0), wide);
    // "HF" is a shelf: everything above the frequency, nothing far below.
    for (float hf : {1.5f, 2.0f}) {
        EXPECT_NEAR(ListenedDb(hf, 16000.0), 0.0, 0.2) << hf;
        EXPECT_NEAR(ListenedDb(hf, 300.0), -boost, 0.3) << hf;
    }
}

TEST(Deesser, AmountSetsTheReductionOfAnEssAtTheBandCentre) {
    for (float amount : {12.0f, 50.0f, 100.0f}) {
        auto d = Make({{Deesser::kRange, 6000.0f}, {Deesser::kAmount, amount}});
        EXPECT_NEAR(SteadyGainDb(*d, 6000.0), -amount / 6.0, 0.3) << amount;
        EXPECT_NEAR(d->GetMeter(Deesser::kReductionMeter), -amount / 6.0, 0.3) << amount;
    }
    auto off = Make({{Deesser::kRange, 6000.0f}, {Deesser::kAmount, 0.0f}});
    std::vector<float> x = zentest::Noise(9600, 0.5), in = x;
    float* channels[] = {x.data()};
    off->Process(channels, x.size());
    for (std::size_t n = 0; n < x.size(); ++n) ASSERT_NEAR(x[n], in[n], 1e-6) << n;
}

TEST(Deesser, ReactionSetsHowFastTheGainFollows) {
    // 100 ms of an ess over a low tone, then the tone alone; the meter is read every millisecond.
    auto recovery = [](float reaction) {
        auto d = Make({{Deesser::kRange, 6000.0f}, {Deesser::kAmount, 100.0f}, {Deesser::kReaction, reaction}});
        const std::vector<float> tone = zentest::Sine(300.0, kRate, 48000, 0.3), ess = zentest::Sine(6000.0, kRate, 4800, 0.5);
        std::vector<float> x = tone;
        for (std::size_t n = 0; n < ess.size(); ++n) x[n] += ess[n];
        std::size_t onset = 0, recovered = 0;
        for (std::size_t block = 0; block * 48 < x.size(); ++block) {
            float* channels[] = {x.data() + block * 48};
            d->Process(channels, 48);
            const float meter = d->GetMeter(Deesser::kReductionMeter);
            if (onset == 0 && meter < -6.0f) onset = block + 1;
            if (block >= 100 && recovered == 0 && meter > -1.0f) recovered = block + 1 - 100;
        }
        return std::pair{onset, recovered};
    };
    const auto [slowOnset, slow] = recovery(0.0f);  // 10 ms attack, 20 ms hold, 80 ms release
    const auto [mediumOnset, medium] = recovery(1.0f);
    const auto [fastOnset, fast] = recovery(2.0f);  // 0.1 / 1 / 1 ms
    EXPECT_LE(fast, 3u);
    EXPECT_GT(medium, fast + 10);
    EXPECT_GT(slow, medium + 20);
    EXPECT_GT(slow, 20u + 80u);  // past the hold, and a release time on
    EXPECT_LE(fastOnset, 2u);
    EXPECT_LT(mediumOnset, slowOnset);
}
