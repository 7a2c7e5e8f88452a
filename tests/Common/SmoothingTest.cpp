// One-pole smoothers, the shared 200 ms smoother and smoothed value groups.
#include <gtest/gtest.h>

#include <atomic>
#include <cmath>

#include "Common/GlobalSmoothing.h"
#include "Common/OnePoleSmoother.h"
#include "Common/SmoothedValueGroup.h"

namespace {
constexpr double kTwoPi = 6.283185307179586;
}

TEST(OnePoleSmoother, FreshSmootherFollowsItsInputAtOnce) {
    zen::OnePoleSmoother smoother(50);
    EXPECT_EQ(smoother.Next(0.7), 0.7);
}

TEST(OnePoleSmoother, ReachesOneMinusOneOverEAfterItsTimeConstantAtEveryRate) {
    // The coefficient's time constant is T / (2 pi).
    for (double rate : {48000.0, 96000.0}) {
        zen::OnePoleSmoother smoother(200);
        smoother.SetSampleRate(rate);
        const int samples = static_cast<int>(std::lround(rate * 0.2 / kTwoPi));
        double y = 0.0;
        for (int i = 0; i < samples; ++i) y = smoother.Next(1.0);
        EXPECT_NEAR(y, 1.0 - std::exp(-1.0), 1e-3) << rate;
    }
}

TEST(OnePoleSmoother, RefreshAllReachesEveryRegisteredSmootherAndTheSharedOne) {
    zen::OnePoleSmoother a(5), b(400);
    zen::OnePoleSmoother::RefreshAll(96000.0);
    zen::OnePoleSmoother expectedA(5), expectedB(400), expectedShared(200);
    for (auto* s : {&expectedA, &expectedB, &expectedShared}) s->SetSampleRate(96000.0);
    EXPECT_EQ(a.GetA(), expectedA.GetA());
    EXPECT_EQ(b.GetA(), expectedB.GetA());
    EXPECT_EQ(zen::GlobalSmoothing::SharedSmoother().GetA(), expectedShared.GetA());
    zen::OnePoleSmoother::RefreshAll(48000.0);
}

TEST(SmoothedValueGroup, TargetTakesEffectAtOnceWhenNotProcessing) {
    ASSERT_FALSE(zen::GlobalSmoothing::IsRunning());
    zen::SmoothedValueGroup group(3, 1.0f);
    group.SetTarget(0.25f);
    for (std::size_t i = 0; i < group.GetSize(); ++i) {
        EXPECT_EQ(group[i].target.load(), 0.25f);
        EXPECT_EQ(group[i].current.load(), 0.25);
    }
}

TEST(SmoothedValueGroup, RampsWhileItsOwnerProcesses) {
    zen::OnePoleSmoother::RefreshAll(48000.0);
    std::atomic<bool> processing{true};
    zen::SmoothedValueGroup group(1, 0.0f);
    group.SetRampingFlag(&processing);
    zen::GlobalSmoothing::EnterProcessing();
    group.SetTarget(1.0f);
    zen::GlobalSmoothing::LeaveProcessing();
    EXPECT_EQ(group[0].current.load(), 0.0);

    const double a = std::exp(-kTwoPi / 9600.0);
    {
        auto cursor = group.Track(0);
        EXPECT_NEAR(cursor.Next(), 1.0 - a, 1e-12);
        EXPECT_NEAR(cursor.Next(), a * (1.0 - a) + (1.0 - a), 1e-12);
    }
    EXPECT_NEAR(group[0].current.load(), a * (1.0 - a) + (1.0 - a), 1e-12);  // stored back
}

TEST(SmoothedValueGroup, StaysStillWhenItsOwnerIsNotProcessing) {
    std::atomic<bool> processing{false};
    zen::SmoothedValueGroup group(1, 0.0f);
    group.SetRampingFlag(&processing);
    zen::GlobalSmoothing::EnterProcessing();  // another instance runs
    group.SetTarget(1.0f);
    zen::GlobalSmoothing::LeaveProcessing();
    EXPECT_EQ(group[0].current.load(), 1.0);
}

TEST(SmoothedValueGroup, SettlesExactlyOnItsTarget) {
    zen::OnePoleSmoother::RefreshAll(48000.0);
    std::atomic<bool> processing{true};
    zen::SmoothedValueGroup group(1, 1.0f);
    group.SetRampingFlag(&processing);
    zen::GlobalSmoothing::EnterProcessing();
    group.SetTarget(0.0f);
    zen::GlobalSmoothing::LeaveProcessing();
    for (int block = 0; block < 2000; ++block) {
        auto cursor = group.Track(0);
        for (int i = 0; i < 512; ++i) cursor.Next();
    }
    // No creeping toward denormals: the value lands on the target.
    EXPECT_EQ(group[0].current.load(), 0.0);
}

TEST(SmoothedValueGroup, ASettledCursorsValueIsEveryValueOfItsBlockBitForBit) {
    // Ramps up, down and back, block after block, past the fixed point: the
    // cursor says it settled only there, and from then on its Value() is
    // what the plain recursion gives for every sample of the block.
    zen::OnePoleSmoother::RefreshAll(44100.0);
    const double a = zen::GlobalSmoothing::SharedSmoother().GetA(), b = zen::GlobalSmoothing::SharedSmoother().GetB();
    std::atomic<bool> processing{true};
    zen::SmoothedValueGroup group(1, 1.0f);
    group.SetRampingFlag(&processing);
    double expected = 1.0;
    for (float target : {2.818383f, 0.0617f, 1.0f}) {
        zen::GlobalSmoothing::EnterProcessing();
        group.SetTarget(target);
        zen::GlobalSmoothing::LeaveProcessing();
        int settledBlocks = 0;
        for (int block = 0; block < 200; ++block) {
            auto cursor = group.Track(0);
            const bool fixedPoint = a * expected + b * target == expected;
            ASSERT_EQ(cursor.IsSettled(), fixedPoint) << target << " block " << block;
            settledBlocks += fixedPoint;
            const double constant = cursor.Value();
            for (int i = 0; i < 509; ++i) {
                expected = a * expected + b * target;
                ASSERT_EQ(cursor.Next(), expected) << target << " block " << block << " sample " << i;
                if (fixedPoint) {
                    ASSERT_EQ(constant, expected) << target << " block " << block << " sample " << i;
                }
            }
        }
        EXPECT_GT(settledBlocks, 50) << target;  // about a second in
        EXPECT_EQ(static_cast<float>(expected), target);
    }
    zen::OnePoleSmoother::RefreshAll(48000.0);
}
