// LevelTracker: the envelope its owners read, with floor, attack, hold and
// release, fed and updated sample by sample or through Process.
#include <gtest/gtest.h>

#include <cmath>

#include "Common/Algorithms/LevelTracker.h"

namespace {

std::unique_ptr<LevelTracker> Make(float rate, float floorDb, float attack, float hold, float release) {
    auto t = std::make_unique<LevelTracker>();
    t->SetChannelCount(2);
    t->Prepare(rate, 256);
    t->SetParameter(LevelTracker::kFloor, floorDb);
    t->SetParameter(LevelTracker::kAttack, attack);
    t->SetParameter(LevelTracker::kHold, hold);
    t->SetParameter(LevelTracker::kRelease, release);
    t->Reset();
    return t;
}

// Samples until the envelope has covered 63.2 % of the way from `from` to `to` (log units).
std::size_t TimeConstant(LevelTracker& t, float magnitude, float from, float to) {
    const float target = from + static_cast<float>(1.0 - std::exp(-1.0)) * (to - from);
    for (std::size_t n = 1; n < 1000000; ++n) {
        t.Feed(magnitude);
        const float e = t.Update();
        if (to > from ? e >= target : e <= target) return n;
    }
    return 0;
}

}  // namespace

TEST(LevelTracker, AttackHoldAndReleaseTimesAndTheFloor) {
    for (float rate : {44100.0f, 192000.0f}) {
        auto t = Make(rate, -60.0f, 10.0f, 0.0f, 200.0f);
        EXPECT_FLOAT_EQ(t->Update(), -3.0f);  // silence reads as the floor
        EXPECT_NEAR(TimeConstant(*t, -1.0f, -3.0f, 0.0f), 10.0 * rate / 1000.0, 1.0) << rate;  // magnitude, not sign
        for (int i = 0; i < 20000; ++i) t->Feed(1.0f), t->Update();
        // Single-precision coefficients: 0.1 % at 38400 samples.
        EXPECT_NEAR(TimeConstant(*t, 0.0f, 0.0f, -3.0f), 200.0 * rate / 1000.0, 0.001 * 200.0 * rate / 1000.0) << rate;
    }
}

TEST(LevelTracker, HoldLongerThanABlockCarriesAcrossBlocks) {
    auto t = Make(48000.0f, -40.0f, 0.1f, 100.0f, 50.0f);  // hold 4800 samples
    std::vector<float> left(256, 0.5f), right(256, -0.9f);  // linked: the louder channel counts
    float* channels[] = {left.data(), right.data()};
    for (int i = 0; i < 20; ++i) t->Process(channels, 256);
    const float open = t->GetEnvelope();
    EXPECT_NEAR(open, std::log10(0.9f), 1e-4f);
    EXPECT_EQ(left, std::vector<float>(256, 0.5f));  // a detector only
    std::fill(left.begin(), left.end(), 0.0f);
    std::fill(right.begin(), right.end(), 0.0f);
    for (int block = 0; block < 18; ++block) t->Process(channels, 256);  // 4608 samples: still held
    EXPECT_EQ(t->GetEnvelope(), open);
    t->Process(channels, 256);  // the hold runs out inside this block
    EXPECT_LT(t->GetEnvelope(), open);
    EXPECT_NEAR(t->GetMeter(LevelTracker::kEnvelopeMeter), 20.0f * t->GetEnvelope(), 1e-4f);
}
