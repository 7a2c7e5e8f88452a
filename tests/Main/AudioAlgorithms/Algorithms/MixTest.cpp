// Mix: weighted sums in source order, into one of the sources.
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
