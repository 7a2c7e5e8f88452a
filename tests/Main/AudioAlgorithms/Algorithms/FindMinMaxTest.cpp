// FindMinMax: running extremes per interleaved channel, merged across
// blocks, NaN skipped; every form against ref.
#include <gtest/gtest.h>

#include <cmath>
#include <limits>

#include "Algorithms/FindMinMax.h"
#include "KernelForms.h"

using namespace kerneltest;
using ora::numeric::FindMinMax;
using ora::numeric::FindMinMaxConfig;

TEST(FindMinMax, MergesBlocksPerInterleavedChannel) {
    for (int channels : {1, 2, 3, 4}) {
        const std::vector<float> x = RandomFloats(999 * static_cast<std::size_t>(channels), 7);
        FindMinMax finder(FindMinMaxConfig{channels});
        EXPECT_EQ(finder.GetMin(0), std::numeric_limits<float>::infinity());
        EXPECT_EQ(finder.GetPeak(0), 0.0f);
        finder.Process(x.data(), 500);
        finder.Process(x.data() + 500 * channels, 499);
        for (int c = 0; c < channels; ++c) {
            float lo = x[c], hi = x[c];
            for (std::size_t n = 0; n < 999; ++n) {
                lo = std::min(lo, x[n * channels + c]);
                hi = std::max(hi, x[n * channels + c]);
            }
            EXPECT_EQ(finder.GetMin(c), lo) << channels << " channels, channel " << c;
            EXPECT_EQ(finder.GetMax(c), hi);
            EXPECT_EQ(finder.GetPeak(c), std::max(-lo, hi));
        }
        finder.Reset();
        EXPECT_EQ(finder.GetMax(0), -std::numeric_limits<float>::infinity());
    }
}

TEST(FindMinMax, SkipsNaNAndReconfigureKeepsChannels) {
    std::vector<float> x = {0.5f, std::nanf(""), -0.25f, 0.75f, std::nanf(""), 0.1f, 0.2f, 0.3f, 0.4f};
    FindMinMax finder;
    finder.Process(x.data(), x.size());
    EXPECT_EQ(finder.GetMin(0), -0.25f);
    EXPECT_EQ(finder.GetMax(0), 0.75f);
    // Two channels now: channel 0 keeps what it held.
    finder.Reconfigure(FindMinMaxConfig{2});
    EXPECT_EQ(finder.GetMax(0), 0.75f);
    EXPECT_EQ(finder.GetMax(1), -std::numeric_limits<float>::infinity());
}

TEST(FindMinMax, EveryFormGivesTheReferenceResult) {
    for (int channels : {1, 2, 4, 3}) {
        const std::size_t total = AwkwardTotal();
        const std::vector<float> x = RandomFloats(total * static_cast<std::size_t>(channels), 12);
        std::vector<std::vector<float>> wantMin, wantMax;  // after each length
        {
            ora::system::ScopedDispatch forced(InstructionLevel::None, false);
            FindMinMax ref(FindMinMaxConfig{channels});
            std::size_t position = 0;
            for (std::size_t n : AwkwardLengths()) {
                ref.Process(x.data() + position * channels, n);
                position += n;
                wantMin.emplace_back();
                wantMax.emplace_back();
                for (int c = 0; c < channels; ++c) {
                    wantMin.back().push_back(ref.GetMin(c));
                    wantMax.back().push_back(ref.GetMax(c));
                }
            }
        }
        ForEachForm(false, [&](const Form&, const std::string& name) {
            FindMinMax finder(FindMinMaxConfig{channels});
            EXPECT_EQ(finder.FormName(), channels == 3 ? std::string("ref") : name);
            std::size_t position = 0, step = 0;
            for (std::size_t n : AwkwardLengths()) {
                Guarded<> in(n * channels);
                std::copy_n(x.begin() + position * channels, n * channels, in.data());
                finder.Process(in.data(), n);
                for (int c = 0; c < channels; ++c) {
                    ASSERT_EQ(finder.GetMin(c), wantMin[step][c]) << name << " length " << n;
                    ASSERT_EQ(finder.GetMax(c), wantMax[step][c]) << name << " length " << n;
                }
                position += n;
                ++step;
            }
        });
    }
}
