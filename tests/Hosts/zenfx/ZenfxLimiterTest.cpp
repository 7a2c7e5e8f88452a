// The "Limiter" through zenfx: its latency is compensated, so the output
// lines up with the input sample for sample.
#include <gtest/gtest.h>

#include <cmath>

#include "ZenfxRunner.h"

using zentest::ReadAudio;
using zentest::RunZenfx;
using zentest::TempFolder;
using zentest::WriteAudio;

TEST(ZenfxLimiter, OutputIsAlignedWithTheInput) {
    TempFolder folder;
    const int rate = 44100;
    // Quiet, then an isolated click above the ceiling, then quiet again.
    std::vector<float> input(20000);
    for (std::size_t n = 0; n < input.size(); ++n) input[n] = 0.2f * std::sin(0.013f * static_cast<float>(n));
    input[10000] = 1.0f;
    WriteAudio(folder / "in.wav", {input, input}, rate);
    auto result = RunZenfx({"process", folder / "in.wav", "-o", folder / "out.wav", "--plugin", "Limiter", "--set",
                            "Ceiling=-6", "--block", "100"});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    const auto output = ReadAudio(folder / "out.wav");
    ASSERT_EQ(output.info.frames, static_cast<sf_count_t>(input.size()));
    const std::vector<float> left = output.Channel(0);
    // Untouched before the click's gain ramp reaches it: identical samples.
    for (std::size_t n = 0; n < 9000; ++n) ASSERT_EQ(left[n], input[n]) << n;
    // The click comes out where it went in, brought under the ceiling.
    // The sample that stands out most from its neighbours:
    auto excess = [&](std::size_t n) { return std::fabs(left[n] - 0.5f * (left[n - 1] + left[n + 1])); };
    std::size_t loudest = 1;
    for (std::size_t n = 1; n + 1 < left.size(); ++n)
        if (excess(n) > excess(loudest)) loudest = n;
    EXPECT_EQ(loudest, 10000u);
    EXPECT_LT(std::fabs(left[10000]), std::pow(10.0f, -6.0f / 20.0f));
}
