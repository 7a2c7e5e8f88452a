// The pitch shifter end to end: partials land where the ratio puts them,
// the output keeps the input's length and timeline, the mix law, and the
// order in which settings are applied.
#include <gtest/gtest.h>

#include <cmath>

#include "PitchMeasures.h"
#include "Retimer/PitchShiftEngine.h"
#include "Support/Signals.h"

using namespace zentest;

namespace {

constexpr std::size_t kLength = 36000;     // 0.75 s
constexpr std::size_t kMeasureFrom = 12000;
constexpr std::size_t kMeasureLength = 16384;
constexpr double kCentTolerance = 1.0;

struct Transposition {
    int coarse;
    float fine;
};

std::string Name(const Transposition& s) {
    const int value = s.coarse * 100 + static_cast<int>(s.fine);
    return (value < 0 ? "minus" : "plus") + std::to_string(std::abs(value)) + "cents";
}

std::vector<Transposition> AllShifts() {
    std::vector<Transposition> shifts;
    for (int st = -12; st <= 12; ++st) shifts.push_back({st, 0.0f});
    shifts.push_back({0, 50.0f});
    shifts.push_back({0, -50.0f});
    return shifts;
}

void ExpectPartials(const std::vector<float>& y, const std::vector<double>& inputPartials, double ratio,
                    const char* what, double tolerance = kCentTolerance) {
    for (double f : inputPartials) {
        const double expected = f * ratio;
        if (expected > 0.45 * kRate) continue;
        const double measured = PartialFrequency(y, kMeasureFrom, kMeasureLength, expected);
        EXPECT_NEAR(Cents(measured, expected), 0.0, tolerance)
            << what << ": partial " << f << " Hz should be at " << expected << " Hz, measured " << measured;
    }
}

class PitchInTune : public ::testing::TestWithParam<Transposition> {};

}  // namespace

TEST(PitchMeasures, TheFrequencyMeasureIsFarFinerThanACent) {
    const auto x = HarmonicTone(220.0, 10, kLength);
    for (int h = 1; h <= 10; ++h)
        EXPECT_NEAR(Cents(PartialFrequency(x, kMeasureFrom, kMeasureLength, 220.0 * h), 220.0 * h), 0.0, 0.01) << h;
}

TEST_P(PitchInTune, HarmonicToneAndChordLandOnTheShiftedPartialsWithTheSameLength) {
    const Transposition shift = GetParam();
    const double ratio = ora::pitchshift::Engine::Ratio(shift.coarse, shift.fine);
    ShifterSettings s;
    s.coarse = shift.coarse;
    s.fine = shift.fine;

    std::vector<double> harmonics;
    for (int h = 1; h <= 10; ++h) harmonics.push_back(220.0 * h);
    const auto tone = zentest::Shift(HarmonicTone(220.0, 10, kLength), s);
    ASSERT_EQ(tone.size(), kLength);
    ExpectPartials(tone, harmonics, ratio, "tone");

    const std::vector<double> chord = {261.63, 329.63, 392.00};
    const auto shifted = zentest::Shift(Chord(chord, kLength), s);
    ASSERT_EQ(shifted.size(), kLength);
    ExpectPartials(shifted, chord, ratio, "chord");
}

INSTANTIATE_TEST_SUITE_P(EverySemitoneAndHalfSemitones, PitchInTune, ::testing::ValuesIn(AllShifts()),
                         [](const ::testing::TestParamInfo<Transposition>& p) { return Name(p.param); });

TEST(PitchShiftEngine, EveryAlgorithmAndModeStaysInTune) {
    const auto x = HarmonicTone(220.0, 6, kLength);
    std::vector<double> harmonics;
    for (int h = 1; h <= 6; ++h) harmonics.push_back(220.0 * h);
    for (int algorithm : {0, 1}) {
        for (int mode : {0, 1, 2}) {
            ShifterSettings s;
            s.coarse = 7;
            s.algorithm = algorithm;
            s.mode = mode;
            SCOPED_TRACE(::testing::Message() << "algorithm " << algorithm << " mode " << mode);
            // Forced "PG" reads frequencies off the magnitudes of a Hann frame
            // as if it were Gaussian: a little less exact on steady partials.
            ExpectPartials(zentest::Shift(x, s), harmonics, ora::pitchshift::Engine::Ratio(7, 0.0f), "tone",
                           mode == 0 ? 1.5 : kCentTolerance);
        }
    }
}

TEST(PitchShiftEngine, AToneBurstStaysAlignedWithTheInput) {
    // A 200 ms burst: the centre of its energy envelope must not move.
    std::vector<float> x(kLength, 0.0f);
    const auto tone = HarmonicTone(330.0, 4, 9600);
    for (std::size_t i = 0; i < tone.size(); ++i)
        x[12000 + i] = tone[i] * static_cast<float>(std::pow(std::sin(M_PI * i / 9600.0), 2.0));
    auto centre = [](const std::vector<float>& y) {
        double sum = 0.0, weighted = 0.0;
        for (std::size_t i = 0; i < y.size(); ++i) {
            sum += static_cast<double>(y[i]) * y[i];
            weighted += static_cast<double>(y[i]) * y[i] * static_cast<double>(i);
        }
        return weighted / sum;
    };
    const double inputCentre = centre(x);
    for (int st : {-12, -5, 0, 5, 12}) {
        ShifterSettings s;
        s.coarse = st;
        const auto y = zentest::Shift(x, s);
        EXPECT_NEAR(centre(y), inputCentre, 48.0) << st << " semitones";  // within 1 ms
    }
}

TEST(PitchShiftEngine, ZeroShiftIsNearlyTransparentAndTheMixIsLinearFromDryToWet) {
    const auto x = SpeechLike(kLength);
    ShifterSettings s;
    const auto y = zentest::Shift(x, s);
    double err = 0.0, ref = 0.0;
    for (std::size_t i = 5000; i < kLength; ++i) {
        err += (y[i] - x[i]) * (y[i] - x[i]);
        ref += x[i] * x[i];
    }
    const double differenceDb = 10.0 * std::log10(err / ref);
    std::printf("0 semitones, 0 cents, PGHI Auto: difference %.1f dB below the signal\n", -differenceDb);
    EXPECT_LT(differenceDb, -60.0);

    s.coarse = 5;
    const auto wet = zentest::Shift(x, s);
    s.dryWet = 25.0f;
    const auto mixed = zentest::Shift(x, s);
    for (std::size_t i = 0; i < kLength; i += 97) EXPECT_NEAR(mixed[i], 0.25f * wet[i] + 0.75f * x[i], 1e-5f) << i;
    s.dryWet = 0.0f;
    const auto dry = zentest::Shift(x, s);
    for (std::size_t i = 0; i < kLength; ++i) ASSERT_EQ(dry[i], x[i]) << i;
}

TEST(PitchShiftEngine, HugeFiniteInputComesOutFiniteAndTheShifterRecovers) {
    // 100 samples at each level, both signs on the right; a tone follows.
    for (int algorithm : {0, 1}) {
        for (float level : {1e18f, 1e19f, 3e38f}) {
            std::vector<float> left(20000, 0.0f), right(20000, 0.0f);
            for (std::size_t i = 0; i < 100; ++i) {
                left[1000 + i] = level;
                right[1000 + i] = i % 2 != 0 ? level : -level;
            }
            const auto tone = zentest::Sine(300.0, kRate, 18000, 0.5);
            std::copy(tone.begin(), tone.end(), left.begin() + 2000);
            ShifterSettings s;
            s.coarse = 5;
            s.algorithm = algorithm;
            s.dryWet = 60.0f;
            const auto out = zentest::Stream({left, right}, s);
            for (const auto& channel : out)
                for (std::size_t i = 0; i < channel.size(); ++i)
                    ASSERT_TRUE(std::isfinite(channel[i])) << level << ", algorithm " << algorithm << ", sample " << i;
            // Once the burst has passed through, the tone is back at its level.
            EXPECT_NEAR(zentest::Rms(out[0], 16000, 20000), 0.5 / std::sqrt(2.0), 0.1) << level;
        }
    }
}

TEST(PitchShiftEngine, BlockSizeDoesNotChangeTheResult) {
    const auto x = SpeechLike(20000);
    ShifterSettings s;
    s.coarse = -4;
    const auto a = zentest::Shift(x, s, 512);
    const auto b = zentest::Shift(x, s, 1);
    const auto c = zentest::Shift(x, s, 4000);
    for (std::size_t i = 0; i < x.size(); ++i) {
        ASSERT_EQ(a[i], b[i]) << i;
        ASSERT_EQ(a[i], c[i]) << i;
    }
}

TEST(PitchShiftEngine, LatencyIsTheLeastTheLowestRatioNeedsAndNoOverlapIsRefused) {
    ora::pitchshift::EngineParam param(4096, 4, 4096, 2);
    ora::pitchshift::Engine engine(param);
    ASSERT_TRUE(engine.Configure(2));
    // Half a frame, plus half a frame and the look-ahead (2) read at 13
    // semitones down, plus 8: 2048 + ceil(2050 * 2^(13/12)) + 8.
    EXPECT_EQ(engine.Latency(), 6400u);
    ora::pitchshift::EngineParam noOverlap(4096, 0, 4096, 2);
    EXPECT_FALSE(noOverlap.m_stretch.IsValid());
    EXPECT_FALSE(ora::pitchshift::Engine(noOverlap).Configure(1));
}

TEST(PitchShiftEngine, SettingsApplyInOrderUntilNoChangeIsPending) {
    ora::pitchshift::EngineParam param(4096, 4, 4096, 2);
    ora::pitchshift::Engine engine(param);
    EXPECT_EQ(engine.Pending(), 7u);  // everything, before the first application
    ASSERT_TRUE(engine.Configure(1));
    EXPECT_EQ(engine.Pending(), 0u);

    ora::pitchshift::Engine::Settings wanted;
    wanted.coarse = -3;
    wanted.fine = 12.5f;
    EXPECT_EQ(engine.Changes(wanted), ora::pitchshift::Engine::kPitchChanged);
    wanted.dryWet = 40.0f;
    wanted.algorithmMode = 1;
    EXPECT_EQ(engine.Changes(wanted), 7u);
    engine.Apply(wanted, engine.Changes(wanted));
    EXPECT_EQ(engine.Pending(), 0u);
    EXPECT_EQ(engine.Changes(wanted), 0u);
    EXPECT_EQ(param.m_stretch.mode, ora::fft::stretch::pv::Mode::PV);
    // Tiny differences are no change.
    wanted.fine += 1e-8f;
    EXPECT_EQ(engine.Changes(wanted), 0u);
}
