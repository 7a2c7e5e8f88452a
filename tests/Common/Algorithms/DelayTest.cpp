#include <gtest/gtest.h>

#include "Common/Algorithms/Delay.h"
#include "Support/Signals.h"

TEST(Delay, DelaysEachChannelBySetLength) {
    zen::Delay delay;
    delay.Dimension(2, 64, 5);
    std::vector<float> a = zentest::Noise(100, 1.0, 1), b = zentest::Noise(100, 1.0, 2);
    const auto a0 = a, b0 = b;
    float* channels[2] = {a.data(), b.data()};
    ASSERT_TRUE(delay.Process(channels, 100));
    for (std::size_t n = 0; n < 100; ++n) {
        EXPECT_EQ(a[n], n < 5 ? 0.0f : a0[n - 5]);
        EXPECT_EQ(b[n], n < 5 ? 0.0f : b0[n - 5]);
    }
}

TEST(Delay, AnyBlockSplitOrSampleBySampleGivesTheSameOutput) {
    const std::vector<float> input = zentest::Noise(1000);
    std::vector<float> whole = input;
    zen::Delay reference, perSample;
    reference.Dimension(1, 1000, 37);
    reference.ProcessChannel(0, whole.data(), whole.size());
    perSample.Dimension(1, 1, 37);
    for (std::size_t n = 0; n < input.size(); ++n) ASSERT_EQ(perSample.ReadWrite(0, input[n]), whole[n]) << n;

    for (std::size_t block : {1u, 3u, 36u, 37u, 38u, 512u}) {
        zen::Delay delay;
        delay.Dimension(1, static_cast<std::uint32_t>(block), 37);
        std::vector<float> split = input;
        for (std::size_t done = 0; done < split.size(); done += block)
            delay.ProcessChannel(0, split.data() + done, std::min(block, split.size() - done));
        EXPECT_EQ(split, whole) << "block " << block;
    }
    // Blocks longer and shorter than the line in turn, and single samples.
    zen::Delay mixed;
    mixed.Dimension(1, 100, 37);
    std::vector<float> split = input;
    const std::size_t lengths[] = {5, 80, 1, 37, 36, 38, 100, 2};
    for (std::size_t done = 0, k = 0; done < split.size(); ++k) {
        const std::size_t n = std::min(lengths[k % 8], split.size() - done);
        if (n == 1) split[done] = mixed.ReadWrite(0, split[done]);
        else mixed.ProcessChannel(0, split.data() + done, n);
        done += n;
    }
    EXPECT_EQ(split, whole);
}

TEST(Delay, ZeroLengthPassesThroughAndResetClearsEveryLine) {
    zen::Delay wire;
    wire.Dimension(1, 8, 0);
    std::vector<float> x = {1, 2, 3};
    wire.ProcessChannel(0, x.data(), 3);
    EXPECT_EQ(x, (std::vector<float>{1, 2, 3}));
    EXPECT_EQ(wire.ReadWrite(0, 4.0f), 4.0f);

    zen::Delay delay;
    delay.Dimension(1, 8, 4);
    for (float v : {1.0f, 2.0f, 3.0f}) delay.ReadWrite(0, v);
    delay.Reset();
    for (int i = 0; i < 4; ++i) EXPECT_EQ(delay.ReadWrite(0, 9.0f), 0.0f);
}

TEST(Delay, GrowingTheChannelCountKeepsExistingLines) {
    zen::Delay delay;
    delay.Dimension(1, 8, 2);
    delay.ReadWrite(0, 5.0f);
    delay.SetChannelCount(3);
    EXPECT_EQ(delay.ReadWrite(2, 1.0f), 0.0f);  // new channel starts silent
    EXPECT_EQ(delay.ReadWrite(0, 6.0f), 0.0f);
    EXPECT_EQ(delay.ReadWrite(0, 7.0f), 5.0f);
    EXPECT_FALSE(delay.ProcessChannel(3, nullptr, 0));
}
