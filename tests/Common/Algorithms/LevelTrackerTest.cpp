// LevelTracker: the envelope its owners read, with floor, attack, hold
// (carried across blocks) and release.
#include <gtest/gtest.h>

#include <cmath>

#include "Common/Algorithms/LevelTracker.h"

TEST(LevelTracker, FloorAttackHoldAndRelease) {
    for (float rate : {44100.0f, 192000.0f}) {
        LevelTracker t;
        t.SetChannelCount(2);
        t.Prepare(rate, 256);
        for (const auto& [index, value] : {std::pair{LevelTracker::kFloor, -60.0f}, {LevelTracker::kAttack, 10.0f},
                                           {LevelTracker::kHold, 100.0f}, {LevelTracker::kRelease, 200.0f}})
            t.SetParameter(index, value);
        t.Reset();
        const double perMs = rate / 1000.0;
        const float step = static_cast<float>(1.0 - std::exp(-1.0)) * 3.0f;  // 63.2 % of floor to full scale
        EXPECT_FLOAT_EQ(t.Update(), -3.0f);  // silence reads as the floor
        std::size_t n = 1;
        for (t.Feed(-1.0f); t.Update() < -3.0f + step; ++n) t.Feed(-1.0f);
        EXPECT_NEAR(static_cast<double>(n), 10.0 * perMs, 1.0) << rate;

        std::vector<float> left(256, 0.5f), right(256, -1.0f);  // linked: the louder magnitude counts
        float* channels[] = {left.data(), right.data()};
        for (int block = 0; block < 200; ++block) t.Process(channels, 256);
        EXPECT_NEAR(t.GetEnvelope(), 0.0f, 1e-5f);
        EXPECT_EQ(left[0], 0.5f);  // a detector only
        // Silence: held for 100 ms across blocks, then released toward the floor.
        std::fill(left.begin(), left.end(), 0.0f);
        std::fill(right.begin(), right.end(), 0.0f);
        const float open = t.GetEnvelope();
        const auto holdFrames = static_cast<std::size_t>(100.0 * perMs);
        for (n = 0; n + 256 <= holdFrames; n += 256) t.Process(channels, 256);
        EXPECT_EQ(t.GetEnvelope(), open) << rate;
        for (; t.GetEnvelope() > open - step; ++n) t.Update();
        // Single-precision coefficients: within 0.1 % at 38400 samples.
        EXPECT_NEAR(static_cast<double>(n), holdFrames + 200.0 * perMs, 0.001 * 200.0 * perMs + 1.0) << rate;
    }
}
