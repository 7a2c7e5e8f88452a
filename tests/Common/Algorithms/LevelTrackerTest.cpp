// LevelTracker: the envelope its owners read, with floor, attack, hold
// (carried across blocks) and release.
#include <gtest/gtest.h>

#include <cmath>

#include "Common/Algorithms/LevelTracker.h"
#include "Support/Signals.h"

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

TEST(LevelTracker, FollowsItsLawSampleForSampleThroughHoldsReleasesAndTheFloor) {
    // The law stated plainly, a logarithm every sample, against the tracker,
    // which skips the logarithm where it cannot matter: bursts, decays,
    // silence and single spikes, with holds shorter and longer than the gaps.
    std::vector<float> x = zentest::Noise(48000, 1.0, 9);
    for (std::size_t n = 0; n < x.size(); ++n) {
        const std::size_t phase = n % 4000;
        x[n] *= phase < 500 ? 1.0f : (phase < 1500 ? 0.01f : (phase < 2500 ? std::exp(-0.004f * (phase - 1500)) : 0.0f));
        if (n % 1777 == 0) x[n] = 0.9f;
    }
    for (const auto& [floorDb, holdMs] : {std::pair{-50.0f, 10.5f}, {-20.0f, 0.0f}, {-70.0f, 1.0f}}) {
        LevelTracker t;
        t.SetChannelCount(1);
        t.Prepare(48000.0f, 512);
        t.SetParameter(LevelTracker::kFloor, floorDb);
        t.SetParameter(LevelTracker::kAttack, 5.05f);
        t.SetParameter(LevelTracker::kHold, holdMs);
        t.SetParameter(LevelTracker::kRelease, 40.5f);
        t.Reset();
        const float floor = floorDb / 20.0f;
        const float attack = std::exp(-1.0f / (48000.0f * 5.05f / 1000.0f));
        const float release = std::exp(-1.0f / (48000.0f * 40.5f / 1000.0f));
        const auto holdLength = static_cast<std::int32_t>(48000.0f * holdMs / 1000.0f);
        float envelope = floor;
        std::int32_t hold = holdLength;
        const auto log = [](float m) { return std::log10(std::min(std::max(m, 1e-5f), 1e4f)); };
        for (std::size_t n = 0; n < x.size(); ++n) {
            // Now and then exactly the largest magnitude that cannot lift the
            // envelope, or the next one up, which must.
            float sample = x[n];
            if (n % 50 == 7 && envelope < 4.0f) {
                sample = std::max(static_cast<float>(std::pow(10.0, envelope)), 1e-5f);
                while (log(sample) > envelope) sample = std::nextafter(sample, 0.0f);
                while (log(std::nextafter(sample, 1e9f)) <= envelope) sample = std::nextafter(sample, 1e9f);
                if (n % 100 == 57) sample = std::nextafter(sample, 1e9f);
            }
            const float magnitude = std::min(std::max(std::fabs(sample), 1e-5f), 1e4f);
            const float level = std::max(floor, std::log10(magnitude));
            if (level > envelope) {
                envelope = attack * envelope + (1.0f - attack) * level;
                hold = holdLength;
            } else if (hold > 0) {
                --hold;
            } else {
                envelope = release * envelope + (1.0f - release) * level;
            }
            t.Feed(sample);
            ASSERT_EQ(t.Update(), envelope) << "floor " << floorDb << " dB, hold " << holdMs << " ms, sample " << n;
        }
    }
}
