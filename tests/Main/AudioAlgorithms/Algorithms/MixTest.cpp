// Mix: weighted sums in source order, into one of the sources, and every
// form against ref.
#include <gtest/gtest.h>

#include "Algorithms/Mix.h"
#include "KernelForms.h"

using namespace kerneltest;
using ora::numeric::Mix;
using ora::numeric::MixConfig;

TEST(Mix, WeightsEachSourceAndMayWriteIntoOne) {
    std::vector<float> a = {1, 2, 3, 4, 5}, b = {10, 20, 30, 40, 50};
    const float* sources[2] = {a.data(), b.data()};
    Mix mix(MixConfig{{0.5f, -0.1f}});
    EXPECT_EQ(mix.GetSourceCount(), 2u);
    mix.Process(sources, a.data(), 5);
    for (int n = 0; n < 5; ++n) EXPECT_FLOAT_EQ(a[n], 0.5f * (n + 1) - 0.1f * 10.0f * (n + 1));
    // No sources: silence.
    Mix none;
    none.Process(sources, b.data(), 5);
    for (float v : b) EXPECT_EQ(v, 0.0f);
    EXPECT_TRUE(mix == Mix(MixConfig{{0.5f, -0.1f}}));
}

TEST(Mix, EveryFormGivesTheReferenceResult) {
    const std::size_t total = AwkwardTotal();
    for (std::size_t count : {1u, 3u, 8u}) {
        std::vector<std::vector<float>> signals;
        std::vector<float> weights;
        for (std::size_t i = 0; i < count; ++i) {
            signals.push_back(RandomFloats(total, static_cast<std::uint32_t>(i + 1)));
            weights.push_back(0.3f * static_cast<float>(i) - 0.7f);
        }
        std::vector<const float*> pointers;
        for (auto& s : signals) pointers.push_back(s.data());
        std::vector<float> want(total);
        {
            ora::system::ScopedDispatch forced(InstructionLevel::None, false);
            Mix(MixConfig{weights}).Process(pointers.data(), want.data(), total);
        }
        ForEachForm(false, [&](const Form&, const std::string& name) {
            Mix mix(MixConfig{weights});
            EXPECT_EQ(mix.FormName(), name);
            std::size_t position = 0;
            for (std::size_t n : AwkwardLengths()) {
                std::vector<Guarded<>> in;
                std::vector<const float*> ip;
                for (std::size_t i = 0; i < count; ++i) {
                    in.emplace_back(n);
                    std::copy_n(signals[i].begin() + position, n, in.back().data());
                }
                for (auto& g : in) ip.push_back(g.data());
                Guarded<> out(n);
                mix.Process(ip.data(), out.data(), n);
                ASSERT_TRUE(out.GuardsIntact()) << name;
                for (std::size_t i = 0; i < n; ++i)
                    ASSERT_EQ(out[i], want[position + i]) << name << " at " << position + i;
                position += n;
            }
        });
    }
}
