// LoudnessMeter against EBU Tech 3341 (loudness, true peak) and Tech 3342
// (loudness range), with the test signals made here from the documents'
// definitions, every reading within half the published tolerance; then
// channel weights, block splits, bad samples, silence and reset.
#include <gtest/gtest.h>

#include <cmath>
#include <functional>
#include <limits>
#include <memory>

#include "Common/Algorithms/LoudnessMeter.h"
#include "Support/Signals.h"
#include "Support/ToneProgram.h"

namespace {

using zentest::ToneProgram;
using zentest::ToneSegment;
using Planar = std::vector<std::vector<float>>;

constexpr double kSilence = -std::numeric_limits<double>::infinity();

std::unique_ptr<LoudnessMeter> MakeMeter(double rate, std::size_t channels, bool truePeak = false) {
    auto meter = std::make_unique<LoudnessMeter>();
    meter->SetChannelCount(channels);
    meter->Prepare(static_cast<float>(rate), 4800);
    meter->SetTruePeakEnabled(truePeak);
    return meter;
}

void Feed(LoudnessMeter& meter, Planar& x, std::size_t frames) {
    std::vector<float*> pointers;
    for (auto& ch : x) pointers.push_back(ch.data());
    meter.Process(pointers.data(), frames);
}

// Streams the programme in blocks of `block` frames, calling `observe` with
// the time after each block.
void Stream(LoudnessMeter& meter, ToneProgram& program, std::size_t block,
            const std::function<void(double)>& observe = {}, double rate = 48000.0) {
    Planar x;
    while (program.Position() < program.Frames()) {
        const std::size_t n = program.Next(x, block);
        Feed(meter, x, n);
        if (observe) observe(static_cast<double>(program.Position()) / rate);
    }
}

// A stereo 1 kHz programme read by a fresh meter.
std::unique_ptr<LoudnessMeter> Measured(const std::vector<ToneSegment>& segments, double rate = 48000.0,
                                        std::size_t channels = 2) {
    auto meter = MakeMeter(rate, channels);
    ToneProgram program(rate, channels, segments);
    Stream(*meter, program, 4096, {}, rate);
    return meter;
}

double Db(float linear) { return 20.0 * std::log10(static_cast<double>(linear)); }

// Half the published tolerances.
constexpr double kLoudnessTolerance = 0.05;  // LU, of +-0.1
constexpr double kRangeTolerance = 0.5;      // LU, of +-1
constexpr double kTruePeakOver = 0.1;        // dB, of +0.2
constexpr double kTruePeakUnder = 0.2;       // dB, of -0.4

}  // namespace

TEST(LoudnessMeter, Tech3341SteadyTonesReadTheirLevelMomentaryShortTermAndIntegrated) {
    // Cases 1 and 2: stereo 1 kHz at -23 and -33 dBFS for 20 s; at 44.1 and 96 kHz too.
    for (double rate : {48000.0, 44100.0, 96000.0})
        for (double level : {-23.0, -33.0}) {
            auto meter = Measured({{20.0, {level}}}, rate);
            EXPECT_NEAR(meter->Momentary(), level, kLoudnessTolerance) << rate;
            EXPECT_NEAR(meter->ShortTerm(), level, kLoudnessTolerance) << rate;
            EXPECT_NEAR(meter->Integrated(), level, kLoudnessTolerance) << rate;
        }
}

TEST(LoudnessMeter, Tech3341GatedProgrammesIntegrateToMinus23) {
    struct Case {
        int number;
        std::vector<ToneSegment> segments;
    };
    const Case cases[] = {
        // The relative gate leaves out the -36 dBFS parts.
        {3, {{10, {-36}}, {60, {-23}}, {10, {-36}}}},
        // The absolute gate leaves out the -72 dBFS parts as well.
        {4, {{10, {-72}}, {10, {-36}}, {60, {-23}}, {10, {-36}}, {10, {-72}}}},
        // Nothing gated: the energy mean of -26 and -20 dBFS, 20.1 s in the middle.
        {5, {{20, {-26}}, {20.1, {-20}}, {20, {-26}}}},
    };
    for (const Case& c : cases) EXPECT_NEAR(Measured(c.segments)->Integrated(), -23.0, kLoudnessTolerance) << c.number;
}

TEST(LoudnessMeter, Tech3341FiveChannelsWeighTheSurroundsUp) {
    // Case 6: L, R at -28, C at -24, Ls, Rs at -30 dBFS (1.41 each), 20 s.
    auto meter = Measured({{20.0, {-28, -28, -24, -30, -30}}}, 48000.0, 5);
    EXPECT_NEAR(meter->Integrated(), -23.0, kLoudnessTolerance);
    // The same as 5.1 with a loud LFE, which counts for nothing.
    meter = Measured({{20.0, {-28, -28, -24, 0, -30, -30}}}, 48000.0, 6);
    EXPECT_NEAR(meter->Integrated(), -23.0, kLoudnessTolerance);
}

TEST(LoudnessMeter, Tech3341ShortTermAndMomentaryHoldWhileTheirWindowSpansOnePeriod) {
    // Case 9: 1.34 s at -20 and 1.66 s at -30 dBFS, five times: the 3 s
    // window always holds one period, -23.0 LUFS from 3 s on. Case 12: the
    // same with 0.18 s and 0.22 s for the 400 ms window, from 1 s on.
    struct Case {
        int number;
        double high, low, from;
        bool shortTerm;
    } cases[] = {{9, 1.34, 1.66, 3.0, true}, {12, 0.18, 0.22, 1.0, false}};
    for (const Case& c : cases) {
        std::vector<ToneSegment> segments;
        for (int i = 0; i < 5; ++i) {
            segments.push_back({c.high, {-20}});
            segments.push_back({c.low, {-30}});
        }
        auto meter = MakeMeter(48000.0, 2);
        ToneProgram program(48000.0, 2, segments);
        double lowest = 0.0, highest = -100.0;
        // Every sub-block's reading (5 ms).
        Stream(*meter, program, 240, [&](double t) {
            if (t < c.from + 1e-9) return;
            const double reading = c.shortTerm ? meter->ShortTerm() : meter->Momentary();
            lowest = std::min(lowest, reading);
            highest = std::max(highest, reading);
        });
        EXPECT_NEAR(lowest, -23.0, kLoudnessTolerance) << c.number;
        EXPECT_NEAR(highest, -23.0, kLoudnessTolerance) << c.number;
    }
}

TEST(LoudnessMeter, Tech3341MaximaCatchBurstsAtAnyOffsetAndLevel) {
    // Cases 10 and 13: a -23 dBFS burst as long as the window (3 s, 400 ms),
    // starting anywhere against the 100 ms grid, reads -23.0 at its maximum.
    // Cases 11 and 14: bursts from -38 to -19 dBFS read their own level.
    for (int k = 0; k < 20; ++k) {
        const double offset = 0.5 + 0.0051 * k;
        const double level = -38.0 + k;
        for (bool shortTerm : {true, false}) {
            const double window = shortTerm ? 3.0 : 0.4;
            for (double db : {-23.0, level}) {
                auto meter = Measured({{offset, {kSilence}}, {window, {db}}, {0.5, {kSilence}}});
                EXPECT_NEAR(shortTerm ? meter->MaxShortTerm() : meter->MaxMomentary(), db, kLoudnessTolerance)
                    << (shortTerm ? "short-term" : "momentary") << ", offset " << offset;
            }
        }
    }
}

TEST(LoudnessMeter, Tech3341TruePeaksOfTonesBetweenSamples) {
    // Cases 15 to 23: fs/4 tones whose crests fall at 0, 45, 60 and 67.5
    // degrees between samples, at a true peak of -6 dBTP, and with the
    // samples themselves reaching full scale (+3.01, +1.25, +0.69, 0 dBTP);
    // and a 1 kHz tone at 0 dBTP. Raised-cosine fades keep the edges from
    // adding overshoot of their own.
    struct Case {
        double frequency, degrees, amplitude;
    };
    std::vector<Case> cases;
    for (double degrees : {0.0, 45.0, 60.0, 67.5}) {
        cases.push_back({12000.0, degrees, 0.5});
        const double samplePeak = degrees == 0.0 ? 1.0 : std::max(std::fabs(std::sin(degrees * zentest::kPi / 180.0)),
                                                                  std::fabs(std::cos(degrees * zentest::kPi / 180.0)));
        cases.push_back({12000.0, degrees, 1.0 / samplePeak});
    }
    cases.push_back({1000.0, 10.0, 1.0});
    for (const Case& c : cases) {
        std::vector<float> x = zentest::Sine(c.frequency, 48000.0, 48000, c.amplitude, c.degrees * zentest::kPi / 180.0);
        for (std::size_t n = 0; n < 480; ++n) {
            const auto g = static_cast<float>(0.5 - 0.5 * std::cos(zentest::kPi * static_cast<double>(n) / 480.0));
            x[n] *= g;
            x[x.size() - 1 - n] *= g;
        }
        auto meter = MakeMeter(48000.0, 2, true);
        Planar stereo{x, x};
        Feed(*meter, stereo, x.size());
        const double expected = Db(static_cast<float>(c.amplitude));
        for (std::size_t ch = 0; ch < 2; ++ch) {
            EXPECT_LE(Db(meter->TruePeak(ch)), expected + kTruePeakOver) << c.frequency << " Hz at " << c.degrees;
            EXPECT_GE(Db(meter->TruePeak(ch)), expected - kTruePeakUnder) << c.frequency << " Hz at " << c.degrees;
        }
    }
}

TEST(LoudnessMeter, TwelveKilohertzAtMinusOneDbtpReadsMinusOneAt48And44k1) {
    for (double rate : {48000.0, 44100.0}) {
        ToneProgram program(rate, 2, {{2.0, {-1.0}}}, 12000.0, zentest::kPi / 4.0);
        Planar x = program.All();
        for (auto& ch : x)
            for (std::size_t n = 0; n < 480; ++n) {
                const auto g = static_cast<float>(0.5 - 0.5 * std::cos(zentest::kPi * static_cast<double>(n) / 480.0));
                ch[n] *= g;
                ch[ch.size() - 1 - n] *= g;
            }
        auto meter = MakeMeter(rate, 2, true);
        Feed(*meter, x, x[0].size());
        EXPECT_NEAR(Db(meter->TruePeak(0)), -1.0, 0.1) << rate;
        // At 48 kHz every sample misses the crest by 45 degrees.
        if (rate == 48000.0) {
            EXPECT_NEAR(Db(meter->SamplePeak(0)), -4.01, 0.01);
        }
    }
}

TEST(LoudnessMeter, Tech3342RangesOfSteppedTones) {
    struct Case {
        int number;
        std::vector<double> levels;  // 20 s each
        double range;
    } cases[] = {
        {1, {-20, -30}, 10.0},
        {2, {-20, -15}, 5.0},
        {3, {-40, -20}, 20.0},
        {4, {-50, -35, -20, -35, -50}, 15.0},
    };
    for (const Case& c : cases) {
        std::vector<ToneSegment> segments;
        for (double level : c.levels) segments.push_back({20.0, {level}});
        EXPECT_NEAR(Measured(segments)->Range(), c.range, kRangeTolerance) << c.number;
    }
}

TEST(LoudnessMeter, EveryReadingIsTheSameForAnyBlockSplit) {
    // Level steps and noise over 4 s of stereo, in blocks from 1 frame up,
    // with true peaks on: every reading equal, bit for bit.
    Planar x = ToneProgram(48000.0, 2, {{1.3, {-20, -26}}, {1.0, {-40}}, {1.7, {-14, -30}}}, 997.0).All();
    const std::vector<float> noise = zentest::Noise(x[0].size(), 0.05, 3);
    for (std::size_t n = 0; n < noise.size(); ++n) x[1][n] += noise[n];
    auto read = [&](std::size_t block, bool irregular) {
        auto meter = MakeMeter(48000.0, 2, true);
        std::size_t step = block;
        for (std::size_t done = 0; done < x[0].size();) {
            const std::size_t n = std::min(step, x[0].size() - done);
            float* p[2] = {x[0].data() + done, x[1].data() + done};
            meter->Process(p, n);
            done += n;
            if (irregular) step = 1 + (step * 7919) % 3001;
        }
        return std::vector<double>{meter->Momentary(),    meter->ShortTerm(),   meter->MaxMomentary(),
                                   meter->MaxShortTerm(), meter->Integrated(),  meter->Range(),
                                   meter->TruePeak(0),    meter->TruePeak(1),   meter->SamplePeak(1),
                                   meter->Rms(0),         meter->AverageRms(1), meter->ChannelMomentary(1)};
    };
    const std::vector<double> whole = read(x[0].size(), false);
    for (std::size_t block : {1u, 64u, 240u, 511u, 4800u})
        EXPECT_EQ(read(block, false), whole) << "blocks of " << block;
    EXPECT_EQ(read(100, true), whole) << "irregular blocks";
}

TEST(LoudnessMeter, NonFiniteSamplesAreSkippedAndCounted) {
    // NaN and infinities sprinkled over a tone read as the same tone with
    // silence in their place, and are counted; the meter stays finite.
    Planar clean = ToneProgram(48000.0, 2, {{5.0, {-23}}}).All();
    Planar dirty = clean;
    const float bad[] = {std::numeric_limits<float>::quiet_NaN(), std::numeric_limits<float>::infinity(),
                         -std::numeric_limits<float>::infinity()};
    std::size_t count = 0;
    for (std::size_t n = 1000; n < clean[0].size(); n += 7919, ++count) {
        dirty[count % 2][n] = bad[count % 3];
        clean[count % 2][n] = 0.0f;
    }
    auto a = MakeMeter(48000.0, 2, true);
    auto b = MakeMeter(48000.0, 2, true);
    Feed(*a, clean, clean[0].size());
    Feed(*b, dirty, dirty[0].size());
    EXPECT_EQ(b->InvalidSamples(), count);
    EXPECT_EQ(a->InvalidSamples(), 0u);
    EXPECT_EQ(b->Integrated(), a->Integrated());
    EXPECT_EQ(b->MaxMomentary(), a->MaxMomentary());
    for (std::size_t c = 0; c < 2; ++c) {
        EXPECT_EQ(b->TruePeak(c), a->TruePeak(c));
        EXPECT_EQ(b->SamplePeak(c), a->SamplePeak(c));
        EXPECT_EQ(b->AverageRms(c), a->AverageRms(c));
    }
    EXPECT_NEAR(b->Integrated(), -23.0, 0.05);
}

TEST(LoudnessMeter, SilenceReadsMinusInfinityAndShortProgrammesHaveNoRange) {
    auto meter = Measured({{5.0, {kSilence}}});
    EXPECT_EQ(meter->Momentary(), kSilence);
    EXPECT_EQ(meter->MaxShortTerm(), kSilence);
    EXPECT_EQ(meter->Integrated(), kSilence);
    EXPECT_EQ(meter->Range(), 0.0);
    EXPECT_EQ(meter->TruePeak(0), 0.0f);
    EXPECT_EQ(meter->Rms(1), 0.0);
    // Below the absolute gate is as good as silence for the integrated loudness.
    EXPECT_EQ(Measured({{5.0, {-75.0}}})->Integrated(), kSilence);
    // Under 400 ms there is no gating block; under 3 s no range, while the
    // momentary and short-term windows read what they hold.
    meter = Measured({{0.35, {-23}}});
    EXPECT_EQ(meter->Integrated(), kSilence);
    EXPECT_NEAR(meter->MaxMomentary(), -23.0 + 10.0 * std::log10(0.35 / 0.4), 0.05);
    meter = Measured({{2.9, {-23}}});
    EXPECT_NEAR(meter->Integrated(), -23.0, 0.05);
    EXPECT_EQ(meter->Range(), 0.0);
    EXPECT_EQ(meter->Hops(), 29u);
}

TEST(LoudnessMeter, ResetStartsAfreshAndRmsFollowsTheLevel) {
    auto meter = MakeMeter(48000.0, 2, true);
    ToneProgram loud(48000.0, 2, {{4.0, {-6}}});
    Stream(*meter, loud, 4096);
    // A sine of peak -6 dBFS has an RMS 3.01 dB lower.
    EXPECT_NEAR(20.0 * std::log10(meter->Rms(0)), -9.01, 0.01);
    EXPECT_NEAR(20.0 * std::log10(meter->AverageRms(1)), -9.01, 0.01);
    EXPECT_NEAR(Db(meter->SamplePeak(0)), -6.0, 0.01);
    meter->Reset();
    ToneProgram quiet(48000.0, 2, {{4.0, {-30}}});
    Stream(*meter, quiet, 4096);
    auto fresh = MakeMeter(48000.0, 2, true);
    ToneProgram again(48000.0, 2, {{4.0, {-30}}});
    Stream(*fresh, again, 4096);
    EXPECT_EQ(meter->MaxMomentary(), fresh->MaxMomentary());
    EXPECT_EQ(meter->Integrated(), fresh->Integrated());
    EXPECT_EQ(meter->TruePeak(0), fresh->TruePeak(0));
    EXPECT_EQ(meter->FramesMeasured(), fresh->FramesMeasured());
}
