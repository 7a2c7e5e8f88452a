// The backlog of input the pitch engine missed: order, capacity, overflow.
#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <vector>

#include "Plugins/ZenAudioPitchShift/InputBacklog.h"

namespace {

std::vector<float> Ramp(std::size_t frames, float from) {
    std::vector<float> x(frames);
    for (std::size_t i = 0; i < frames; ++i) x[i] = from + static_cast<float>(i);
    return x;
}

}  // namespace

TEST(InputBacklog, GivesBackEveryChannelInOrderAcrossPushesAndPops) {
    zen::InputBacklog backlog;
    backlog.Allocate(2, 100);
    ASSERT_GE(backlog.Capacity(), 100u);
    const auto a = Ramp(60, 0.0f), b = Ramp(60, -1000.0f);
    const float* in[2] = {a.data(), b.data()};
    backlog.Push(in, 2, 60);
    std::vector<float> l(50), r(50);
    float* out[2] = {l.data(), r.data()};
    backlog.Pop(out, 2, 50);
    EXPECT_EQ(l, std::vector<float>(a.begin(), a.begin() + 50));
    EXPECT_EQ(r, std::vector<float>(b.begin(), b.begin() + 50));
    backlog.Push(in, 2, 60);
    EXPECT_EQ(backlog.Size(), 70u);
    backlog.Pop(out, 2, 50);
    EXPECT_EQ(l[9], 59.0f);
    EXPECT_EQ(l[10], 0.0f);
    EXPECT_EQ(r[49], -1000.0f + 39.0f);
    EXPECT_FALSE(backlog.Overflowed());
}

TEST(InputBacklog, OverflowKeepsTheNewestAndKeepTrimsToThem) {
    zen::InputBacklog backlog;
    backlog.Allocate(1, 64);
    const std::size_t capacity = backlog.Capacity();
    const auto x = Ramp(capacity + 10, 0.0f);
    const float* in[1] = {x.data()};
    backlog.Push(in, 1, x.size());
    EXPECT_TRUE(backlog.Overflowed());
    EXPECT_EQ(backlog.Size(), capacity);

    backlog.Keep(5);
    EXPECT_FALSE(backlog.Overflowed());
    std::vector<float> y(5);
    float* out[1] = {y.data()};
    backlog.Pop(out, 1, 5);
    EXPECT_EQ(y, std::vector<float>(x.end() - 5, x.end()));
    EXPECT_TRUE(backlog.Empty());
}

TEST(InputBacklog, NonFiniteSamplesEnterAsSilenceAndClearEmpties) {
    zen::InputBacklog backlog;
    backlog.Allocate(1, 16);
    const std::vector<float> x = {1.0f, std::numeric_limits<float>::quiet_NaN(),
                                  std::numeric_limits<float>::infinity(), -2.0f};
    const float* in[1] = {x.data()};
    backlog.Push(in, 1, x.size());
    std::vector<float> y(4);
    float* out[1] = {y.data()};
    backlog.Pop(out, 1, 4);
    EXPECT_EQ(y, (std::vector<float>{1.0f, 0.0f, 0.0f, -2.0f}));
    backlog.Push(in, 1, x.size());
    backlog.Clear();
    EXPECT_TRUE(backlog.Empty());
    EXPECT_EQ(backlog.Size(), 0u);
}
