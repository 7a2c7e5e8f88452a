// StripStage and ChannelStrip: a switch cross-fades between a stage's input
// and its result, a stage switched out restarts cleared, and controls are
// handed on at the same samples however the host splits the stream.
#include <gtest/gtest.h>

#include <vector>

#include "Common/Algorithms/ChannelStrip.h"
#include "Common/Algorithms/StripStage.h"
#include "Support/Signals.h"

namespace {

// A stage with memory: adds the running sum of its input.
class RunningSum : public ZenAudioAlgorithm {
public:
    bool Process(float* const* channels, std::uint64_t count) override {
        ++calls;
        for (std::uint64_t n = 0; n < count; ++n) channels[0][n] += (sum += channels[0][n]);
        return true;
    }
    void Reset() override { sum = 0.0f; }
    float sum = 0.0f;
    int calls = 0;
};

std::vector<float> Through(zen::StripStage& stage, std::vector<float> x, const zen::SmoothedRamp& fade) {
    float* channels[] = {x.data()};
    stage.Process(channels, 1, 0, static_cast<std::uint32_t>(x.size()), fade);
    return x;
}

}  // namespace

TEST(StripStage, CrossFadesRestartsClearedAndMeasures) {
    RunningSum algorithm;
    zen::StripStage stage(algorithm, zen::StripStage::Measure::kChange);
    stage.Prepare(1, 64);
    const std::vector<float> x = {1.0f, 2.0f, 3.0f, 4.0f};
    zen::SmoothedRamp fade;
    fade.Hold(1.0f);
    EXPECT_EQ(Through(stage, x, fade), (std::vector<float>{2.0f, 5.0f, 9.0f, 14.0f}));
    EXPECT_EQ(stage.TakePeak(), 10.0f);
    fade.Hold(0.25f);
    EXPECT_EQ(Through(stage, x, fade), (std::vector<float>{1.0f + 0.25f * 11.0f, 2.0f + 0.25f * 13.0f,
                                                           3.0f + 0.25f * 16.0f, 4.0f + 0.25f * 20.0f}));
    fade.Hold(0.0f);
    EXPECT_EQ(Through(stage, x, fade), x);
    EXPECT_FALSE(stage.IsRunning());
    EXPECT_EQ(algorithm.calls, 2);
    fade.Hold(1.0f);  // back in: from cleared state, as when fresh
    EXPECT_EQ(Through(stage, x, fade), (std::vector<float>{2.0f, 5.0f, 9.0f, 14.0f}));
}

TEST(ChannelStrip, HandsControlsOnAtTheSameSamplesWhateverTheSplit) {
    const std::vector<float> x = zentest::Noise(2000, 0.5);
    auto run = [&](std::uint32_t block, bool settled, std::vector<std::size_t>& points) {
        RunningSum algorithm;
        zen::StripStage stage(algorithm);
        zen::SmoothedRamp fade;
        fade.Hold(1.0f);
        zen::ChannelStrip strip;
        strip.Add(stage, fade);
        strip.Prepare(1, 512);
        std::vector<float> y = x;
        for (std::size_t done = 0; done < y.size(); done += block) {
            float* channels[] = {y.data() + done};
            const auto frames = static_cast<std::uint32_t>(std::min<std::size_t>(block, y.size() - done));
            strip.Process(channels, 1, frames, settled, [&](std::uint32_t i) { points.push_back(done + i); });
        }
        return std::make_pair(y, algorithm.calls);
    };
    std::vector<std::size_t> whole, pieces, steady;
    const auto [reference, calls] = run(512, false, whole);
    EXPECT_EQ(run(7, false, pieces).first, reference);
    EXPECT_EQ(pieces, whole);
    for (std::size_t k = 0; k < whole.size(); ++k) ASSERT_EQ(whole[k], k * zen::ChannelStrip::kControlInterval);
    EXPECT_EQ(calls, 125);  // one run per grid cell
    // Nothing moving: one run per block, and the same output.
    const auto [same, steadyCalls] = run(512, true, steady);
    EXPECT_EQ(same, reference);
    EXPECT_EQ(steadyCalls, 4);
    EXPECT_TRUE(steady.empty());
}
