// Interleave and Deinterleave: layout, round trip, and every form against
// ref for two channels (other counts always use ref).
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

TEST(Interleave, EveryFormGivesTheReferenceResult) {
    const std::size_t total = AwkwardTotal();
    const std::vector<float> a = RandomFloats(total, 1), b = RandomFloats(total, 2);
    ForEachForm(false, [&](const Form&, const std::string& name) {
        Interleave interleave(InterleaveConfig{2});
        Deinterleave deinterleave(DeinterleaveConfig{2});
        EXPECT_EQ(interleave.FormName(), name);
        EXPECT_EQ(deinterleave.FormName(), name);
        std::size_t position = 0;
        for (std::size_t n : AwkwardLengths()) {
            Guarded<> x(n), y(n), both(2 * n), p(n), q(n);
            std::copy_n(a.begin() + position, n, x.data());
            std::copy_n(b.begin() + position, n, y.data());
            const float* in[2] = {x.data(), y.data()};
            interleave.Process(in, both.data(), n);
            float* out[2] = {p.data(), q.data()};
            deinterleave.Process(both.data(), out, n);
            ASSERT_TRUE(both.GuardsIntact() && p.GuardsIntact() && q.GuardsIntact()) << name;
            for (std::size_t i = 0; i < n; ++i) {
                ASSERT_EQ(both[2 * i], x[i]) << name;
                ASSERT_EQ(both[2 * i + 1], y[i]) << name;
                ASSERT_EQ(p[i], x[i]) << name;
                ASSERT_EQ(q[i], y[i]) << name;
            }
            position += n;
        }
    });
}
