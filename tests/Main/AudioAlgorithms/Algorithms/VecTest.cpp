// Vec: element-wise operations against their definitions, and NaN and
// infinities through Clamp, Abs and Sanitize.
#include <gtest/gtest.h>

#include <cmath>
#include <limits>

#include "Algorithms/Vec.h"
#include "KernelForms.h"

using namespace kerneltest;
using ora::numeric::Vec;

TEST(Vec, OperationsFollowTheirDefinitions) {
    const std::vector<float> a = RandomFloats(37, 1), b = RandomFloats(37, 2);
    std::vector<float> out(37);
    const Vec vec;
    vec.Add(a.data(), b.data(), out.data(), 37);
    for (int i = 0; i < 37; ++i) EXPECT_EQ(out[i], a[i] + b[i]);
    vec.Multiply(a.data(), b.data(), out.data(), 37);
    for (int i = 0; i < 37; ++i) EXPECT_EQ(out[i], a[i] * b[i]);
    vec.Clamp(a.data(), -0.5f, 0.25f, out.data(), 37);
    for (int i = 0; i < 37; ++i) EXPECT_EQ(out[i], std::min(std::max(a[i], -0.5f), 0.25f));
    const std::vector<float> special = {std::nanf(""), -0.0f, INFINITY, -INFINITY,    0.3f,
                                        -2.0f,         1.0f,  0.0f,     std::nanf("")};
    vec.Clamp(special.data(), -0.5f, 0.25f, out.data(), special.size());
    EXPECT_EQ(out[0], -0.5f);  // NaN goes to the low bound
    EXPECT_EQ(out[2], 0.25f);
    EXPECT_EQ(out[3], -0.5f);
    EXPECT_EQ(out[8], -0.5f);
    vec.Abs(special.data(), out.data(), special.size());
    EXPECT_FALSE(std::signbit(out[1]));
    EXPECT_EQ(out[3], INFINITY);
}

TEST(Vec, SanitizeSilencesNanAndInfinitiesAndHoldsHugeValuesInEveryForm) {
    const float big = std::numeric_limits<float>::max();
    const std::vector<float> in = {std::nanf(""), -std::nanf(""), INFINITY, -INFINITY, big,  -big,    3e38f, -1e19f,
                                   1e10f,         -1e10f,         0.5f,     -0.0f,     1e-40f, 1.00001e10f, 2.0f};
    const std::vector<float> expected = {0.0f,  0.0f,   0.0f, 0.0f,  1e10f,  -1e10f, 1e10f, -1e10f,
                                         1e10f, -1e10f, 0.5f, -0.0f, 1e-40f, 1e10f,  2.0f};
    ForEachForm(false, [&](const Form&, const std::string& name) {
        // Every position of a vector, and the scalar tail.
        for (std::size_t shift = 0; shift < 9; ++shift) {
            std::vector<float> x(shift, 0.25f), want(shift, 0.25f);
            x.insert(x.end(), in.begin(), in.end());
            want.insert(want.end(), expected.begin(), expected.end());
            std::vector<float> out(x.size());
            const Vec vec;
            vec.Sanitize(x.data(), 1e10f, out.data(), x.size());
            for (std::size_t i = 0; i < x.size(); ++i) {
                ASSERT_EQ(out[i], want[i]) << name << " shift " << shift << " input " << x[i];
                ASSERT_EQ(std::signbit(out[i]), std::signbit(want[i])) << name << " input " << x[i];
            }
        }
    });
}
