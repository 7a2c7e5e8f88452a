// Deesser: its user controls heard in the sound: the band's shape by mode
// and the speed by reaction ("Amount" is shown through the plug-in).
#include <gtest/gtest.h>

#include <cmath>

#include "Common/Algorithms/Deesser.h"
#include "Support/Signals.h"

namespace {

std::unique_ptr<Deesser> Make(std::initializer_list<std::pair<Deesser::Parameter, float>> settings) {
    auto d = std::make_unique<Deesser>();
    d->SetChannelCount(1);
    d->Prepare(48000.0f, 512);
    for (const auto& [index, value] : settings) d->SetParameter(index, value);
    return d;
}

double SteadyGainDb(Deesser& d, double frequency) {
    std::vector<float> x = zentest::Sine(frequency, 48000.0, 24000, 0.5);
    float* channels[] = {x.data()};
    EXPECT_TRUE(d.Process(channels, x.size()));
    return zentest::ToDb(zentest::Rms(x, 19200) * std::sqrt(2.0) / 0.5);
}

// What "Listen" plays at `frequency` for a mode value, band at 4 kHz, full amount.
double ListenedDb(float mode, double frequency) {
    auto d = Make({{Deesser::kRange, 4000.0f}, {Deesser::kMode, mode}, {Deesser::kAmount, 100.0f},
                   {Deesser::kListen, 1.0f}});
    return SteadyGainDb(*d, frequency);
}

}  // namespace

TEST(Deesser, ListeningPlaysTheBandOfEachMode) {
    for (float bell : {0.0f, 0.4f, 0.5f, 1.0f}) EXPECT_NEAR(ListenedDb(bell, 4000.0), 0.0, 0.1) << bell;
    // An octave away the narrow bell has dropped more than the wide one; values round to the nearest mode.
    const double narrow = ListenedDb(0.0f, 2000.0), wide = ListenedDb(1.0f, 2000.0);
    EXPECT_LT(narrow, wide - 3.0);
    EXPECT_EQ(ListenedDb(0.4f, 2000.0), narrow);
    EXPECT_EQ(ListenedDb(0.5f, 2000.0), wide);
    // "HF" is a shelf: the top of the spectrum in full, the bottom down by the 16.7 dB boost.
    for (float hf : {1.5f, 2.0f}) {
        EXPECT_NEAR(ListenedDb(hf, 16000.0), 0.0, 0.2) << hf;
        EXPECT_NEAR(ListenedDb(hf, 300.0), -100.0 / 6.0, 0.3) << hf;
    }
}

TEST(Deesser, ReactionSetsHowFastTheGainFollows) {
    // 100 ms of an ess over a low tone, then the tone alone; the meter read every millisecond.
    auto timing = [](float reaction) {
        auto d = Make({{Deesser::kRange, 6000.0f}, {Deesser::kAmount, 100.0f}, {Deesser::kReaction, reaction}});
        std::vector<float> x = zentest::Sine(300.0, 48000.0, 48000, 0.3);
        const std::vector<float> ess = zentest::Sine(6000.0, 48000.0, 4800, 0.5);
        for (std::size_t n = 0; n < ess.size(); ++n) x[n] += ess[n];
        std::size_t onset = 0, recovery = 0;
        for (std::size_t ms = 0; ms < 1000; ++ms) {
            float* channels[] = {x.data() + ms * 48};
            d->Process(channels, 48);
            const float meter = d->GetMeter(Deesser::kReductionMeter);
            if (onset == 0 && meter < -6.0f) onset = ms + 1;
            if (ms >= 100 && recovery == 0 && meter > -1.0f) recovery = ms + 1 - 100;
        }
        return std::pair{onset, recovery};
    };
    const auto [slowOnset, slow] = timing(0.0f);  // 10 ms attack, 20 ms hold, 80 ms release
    const auto [mediumOnset, medium] = timing(1.0f);
    const auto [fastOnset, fast] = timing(2.0f);  // 0.1, 1 and 1 ms
    EXPECT_LE(fast, 3u);
    EXPECT_GT(medium, fast + 10);
    EXPECT_GT(slow, 20u + 80u);  // past the hold, and a release time on
    EXPECT_LE(fastOnset, 2u);
    EXPECT_LT(mediumOnset, slowOnset);
}
