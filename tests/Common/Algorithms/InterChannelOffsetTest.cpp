// InterChannelOffset: the lag of a delayed copy found to the sample in
// either direction and through an inverted channel, at the rates' range
// ends, and the readings of silent and dead channels.
#include <gtest/gtest.h>

#include <cmath>

#include "Common/Algorithms/InterChannelOffset.h"
#include "Support/Signals.h"

namespace {

// Right is left delayed by `lag` samples (earlier when negative) times `gain`.
InterChannelOffset::Estimate Measure(int lag, float gain, float rate = 48000.0f, std::size_t frames = 24000) {
    const std::vector<float> source = zentest::Noise(frames + 4000, 0.5, 21);
    std::vector<float> left(source.begin() + 2000, source.begin() + 2000 + frames);
    std::vector<float> right(frames);
    for (std::size_t n = 0; n < frames; ++n) right[n] = gain * source[2000 + n - lag];
    InterChannelOffset offset;
    offset.Prepare(rate, 512);
    for (std::size_t done = 0; done < frames; done += 512) {
        float* p[2] = {left.data() + done, right.data() + done};
        EXPECT_TRUE(offset.Process(p, std::min<std::size_t>(512, frames - done)));
    }
    return offset.Current();
}

}  // namespace

TEST(InterChannelOffset, FindsTheLagToTheSampleEitherWayAndThroughInversion) {
    for (int lag : {0, 1, 154, -154, -300, 479, -480})
        for (float gain : {1.0f, -0.63f}) {
            const InterChannelOffset::Estimate e = Measure(lag, gain);
            ASSERT_TRUE(e.valid);
            EXPECT_EQ(e.lag, lag) << "gain " << gain;
            // The frames overlap by all but the lag.
            EXPECT_NEAR(std::fabs(e.correlation), 1.0, 0.15) << lag;
            EXPECT_EQ(e.correlation < 0.0, gain < 0.0f) << lag;
            EXPECT_NEAR(10.0 * std::log10(e.rightPower / e.leftPower), zentest::ToDb(std::fabs(gain)), 0.2) << lag;
        }
    // The range is in time: 10 ms is 1920 samples at 192 kHz.
    EXPECT_EQ(Measure(-1900, 1.0f, 192000.0f, 96000).lag, -1900);
}

TEST(InterChannelOffset, SilenceAndADeadChannelGiveNoCorrelation) {
    const InterChannelOffset::Estimate dead = Measure(10, 0.0f);
    EXPECT_TRUE(dead.valid);
    EXPECT_EQ(dead.correlation, 0.0);
    EXPECT_EQ(dead.rightPower, 0.0);
    EXPECT_GT(dead.leftPower, 0.05);

    InterChannelOffset offset;
    offset.Prepare(48000.0f, 512);
    EXPECT_FALSE(offset.Current().valid);
    EXPECT_EQ(offset.FramesToEstimate(), 4096u);  // eight times the 480-sample range, to a power of two
    std::vector<float> left(4096, 0.0f), right(4096, 0.0f);
    left[7] = NAN;
    right[9] = INFINITY;
    float* p[2] = {left.data(), right.data()};
    offset.Process(p, 4096);
    EXPECT_TRUE(offset.Current().valid);
    EXPECT_EQ(offset.Current().correlation, 0.0);
    EXPECT_EQ(offset.Current().leftPower, 0.0);
}
