// The low-frequency oscillator: each shape's range, rate and start, the
// sine's accuracy, the random walk's smoothness and the tempo law.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>

#include "Common/Algorithms/Lfo.h"
#include "Support/Modulation.h"
#include "Support/Signals.h"

namespace {

std::vector<float> Cycle(Lfo& lfo, std::size_t frames) {
    std::vector<float> out(frames);
    for (float& v : out) v = lfo.Next();
    return out;
}

}  // namespace

TEST(Lfo, SineIsAccurateAndEachShapeRunsAtItsRateFromItsPhase) {
    for (double p = -2.0; p <= 2.0; p += 0.001)
        ASSERT_NEAR(Lfo::Sine(p), std::sin(2.0 * zentest::kPi * p), 1e-7) << p;

    Lfo lfo;
    lfo.SetSampleRate(48000.0);
    lfo.SetRate(100.0);  // 480 samples a cycle
    lfo.Reset();
    std::vector<float> sine = Cycle(lfo, 4800);
    EXPECT_NEAR(std::abs(zentest::Tone(sine, 100.0, 48000.0, 0, 4800)), 1.0, 1e-6);
    EXPECT_NEAR(sine[120], 1.0f, 1e-6f);

    lfo.SetShape(Lfo::kTriangle);
    lfo.SetPhase(0.25);
    lfo.Reset();
    const std::vector<float> triangle = Cycle(lfo, 480);
    EXPECT_FLOAT_EQ(triangle[0], 1.0f);
    EXPECT_FLOAT_EQ(triangle[240], -1.0f);
    EXPECT_NEAR(triangle[120], 0.0f, 1e-6f);
    EXPECT_NEAR(triangle[60], 0.5f, 1e-6f);  // straight lines between the corners
}

TEST(Lfo, TheRandomWalkStaysInRangeMovesSmoothlyAndDependsOnThePhase) {
    Lfo a, b;
    for (Lfo* lfo : {&a, &b}) {
        lfo->SetSampleRate(48000.0);
        lfo->SetShape(Lfo::kRandom);
        lfo->SetRate(5.0);
    }
    b.SetPhase(0.5);
    a.Reset();
    b.Reset();
    const std::vector<float> x = Cycle(a, 48000), y = Cycle(b, 48000);
    EXPECT_LE(zentest::Peak(x), 1.0f);
    EXPECT_GT(zentest::Peak(x), 0.3f);
    // A step between values a cycle apart, 9600 samples, eased: no jumps, no corners.
    EXPECT_LT(zentest::LargestStep(x), 2.0f * zentest::kPi / 9600.0f);
    EXPECT_LT(zentest::LargestSecondDifference(x), 1e-6f);
    EXPECT_NE(x, y);
}

TEST(Lfo, SyncedRateIsOneCyclePerNoteValue) {
    EXPECT_DOUBLE_EQ(Lfo::SyncedRate(120.0, 1.0), 2.0);   // quarter notes at 120 BPM
    EXPECT_DOUBLE_EQ(Lfo::SyncedRate(120.0, 4.0), 0.5);   // a bar of 4/4
    EXPECT_DOUBLE_EQ(Lfo::SyncedRate(90.0, 0.5), 3.0);    // eighths at 90
}
