// A shifted track stays in time with the rest of a mix: clicks (a shift of
// a click is still a click) come out exactly the latency late at every
// semitone up and down, with every algorithm and mode, through a round
// trip, and while the shift is automated.
#include <gtest/gtest.h>

#include <cmath>
#include <string>

#include "PitchMeasures.h"
#include "Retimer/PitchShiftEngine.h"
#include "Support/Signals.h"

using namespace zentest;

namespace {

constexpr std::size_t kLength = 20000;  // three clicks
constexpr int kMaxLag = 64;
constexpr double kTolerance = 1.0;  // samples

struct Method {
    int algorithm;
    int mode;
};

const char* MethodName(const Method& m) {
    static const char* names[2][3] = {{"PLPV/PG", "PLPV/PV", "PLPV/Auto"}, {"PGHI/PG", "PGHI/PV", "PGHI/Auto"}};
    return names[m.algorithm][m.mode];
}

double ShiftedLag(int coarse, float fine, const Method& m) {
    const auto x = Clicks(kLength);
    ShifterSettings s;
    s.coarse = coarse;
    s.fine = fine;
    s.algorithm = m.algorithm;
    s.mode = m.mode;
    return EnvelopeLag(x, Shift(x, s), kMaxLag);
}

class EverySemitone : public ::testing::TestWithParam<int> {};

}  // namespace

TEST_P(EverySemitone, ClicksComeOutTheLatencyLateWithBothAlgorithms) {
    for (const Method m : {Method{1, 2}, Method{0, 2}}) {
        const double lag = ShiftedLag(GetParam(), 0.0f, m);
        EXPECT_NEAR(lag, 0.0, kTolerance) << MethodName(m) << " at " << GetParam() << " semitones";
    }
}

INSTANTIATE_TEST_SUITE_P(PitchAlignment, EverySemitone, ::testing::Range(-12, 13),
                         [](const ::testing::TestParamInfo<int>& p) {
                             return (p.param < 0 ? "minus" : "plus") + std::to_string(std::abs(p.param));
                         });

TEST(PitchAlignment, EveryModeAndFineTuningKeepsTheClicksInPlace) {
    struct Case {
        int coarse;
        float fine;
    };
    for (const Method m : {Method{1, 0}, Method{1, 1}, Method{0, 0}, Method{0, 1}})
        for (const Case c : {Case{-12, 0.0f}, Case{-5, -37.5f}, Case{7, 0.0f}, Case{12, 0.0f}}) {
            const double lag = ShiftedLag(c.coarse, c.fine, m);
            EXPECT_NEAR(lag, 0.0, kTolerance) << MethodName(m) << " at " << c.coarse << " st " << c.fine << " cents";
        }
}

TEST(PitchAlignment, ARoundTripThroughTwoShiftersInAChainLinesUp) {
    // The second shifter takes the first one's output as a host chain
    // passes it, latency and all; the pair is twice the latency late.
    const std::size_t latency = ShifterLatency();
    auto x = Clicks(kLength);
    x.resize(kLength + 2 * latency, 0.0f);
    struct Trip {
        int there;
        int algorithm;
    };
    for (const Trip t : {Trip{5, 1}, Trip{-7, 1}, Trip{5, 0}, Trip{-7, 0}}) {
        ShifterSettings s;
        s.algorithm = t.algorithm;
        s.coarse = t.there;
        const auto away = Stream(x, s);
        s.coarse = -t.there;
        auto back = Stream(away, s);
        back.erase(back.begin(), back.begin() + static_cast<std::ptrdiff_t>(2 * latency));
        EXPECT_NEAR(EnvelopeLag(x, back, kMaxLag), 0.0, kTolerance)
            << t.there << " then " << -t.there << " semitones, algorithm " << t.algorithm;
    }
}

TEST(PitchAlignment, ClicksStayInPlaceWhileTheShiftSweepsBothWays) {
    // Semitones and cents swept from -12 to +12 and back every 200 ms,
    // changed every 128 samples.
    const std::size_t latency = ShifterLatency();
    const auto x = Clicks(40000);
    for (int algorithm : {1, 0}) {
        ora::pitchshift::EngineParam param(4096, 4, 4096, 2);
        ora::pitchshift::Engine engine(param);
        ASSERT_TRUE(engine.Configure(1));
        ora::pitchshift::Engine::Settings wanted;
        wanted.algorithmType = algorithm;
        std::vector<float> in = x, out(x.size() + latency, 0.0f);
        in.resize(out.size(), 0.0f);
        const std::size_t block = 128;
        for (std::size_t done = 0; done < in.size(); done += block) {
            const double phase = std::fmod(static_cast<double>(done) / 9600.0, 1.0);
            const double semitones = phase < 0.5 ? -12.0 + 48.0 * phase : 36.0 - 48.0 * phase;
            wanted.coarse = static_cast<int>(std::floor(semitones));
            wanted.fine = static_cast<float>(100.0 * (semitones - std::floor(semitones)));
            engine.Apply(wanted, engine.Changes(wanted));
            const float* ip[1] = {in.data() + done};
            float* op[1] = {out.data() + done};
            engine.Process(ip, op, std::min(block, in.size() - done));
        }
        out.erase(out.begin(), out.begin() + static_cast<std::ptrdiff_t>(latency));
        EXPECT_NEAR(EnvelopeLag(x, out, kMaxLag), 0.0, kTolerance) << "algorithm " << algorithm;
        // Every click on its own, not only on average.
        for (std::size_t at = 0; at < x.size(); ++at) {
            if (x[at] == 0.0f) continue;
            const std::vector<float> one(x.begin() + static_cast<std::ptrdiff_t>(at - 2000),
                                         x.begin() + static_cast<std::ptrdiff_t>(at + 2000));
            const std::vector<float> shifted(out.begin() + static_cast<std::ptrdiff_t>(at - 2000),
                                             out.begin() + static_cast<std::ptrdiff_t>(at + 2000));
            EXPECT_NEAR(EnvelopeLag(one, shifted, kMaxLag), 0.0, kTolerance)
                << "algorithm " << algorithm << ", click at " << at;
        }
    }
}
