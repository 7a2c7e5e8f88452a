// Interleave and Deinterleave: layout and round trip; counts other than two
// always use ref.
#include <gtest/gtest.h>

#include "Algorithms/Deinterleave.h"
#include "Algorithms/Interleave.h"
#include "KernelForms.h"

using namespace kerneltest;
using ora::numeric::Deinterleave;
using ora::numeric::DeinterleaveConfig;
using ora::numeric::Interleave;
using ora::numeric::InterleaveConfig;

TEST(Interleave, LaysFramesOutChannelByChannelAndBack) {
    for (int channels : {1, 2, 3, 6}) {
        std::vector<std::vector<float>> planar;
        std::vector<const float*> in;
        for (int c = 0; c < channels; ++c) planar.push_back(RandomFloats(101, c + 1));
        for (auto& p : planar) in.push_back(p.data());
        std::vector<float> interleaved(101 * channels);
        Interleave(InterleaveConfig{channels}).Process(in.data(), interleaved.data(), 101);
        for (std::size_t n = 0; n < 101; ++n)
            for (int c = 0; c < channels; ++c) ASSERT_EQ(interleaved[n * channels + c], planar[c][n]);
        std::vector<std::vector<float>> back(channels, std::vector<float>(101));
        std::vector<float*> out;
        for (auto& b : back) out.push_back(b.data());
        Deinterleave deinterleave(DeinterleaveConfig{channels});
        if (channels != 2) {
            EXPECT_STREQ(deinterleave.FormName(), "ref");
        }
        deinterleave.Process(interleaved.data(), out.data(), 101);
        EXPECT_EQ(back, planar);
    }
}
