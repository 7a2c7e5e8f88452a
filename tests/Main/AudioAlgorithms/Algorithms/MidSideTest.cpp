// LR2MS and MS2LR: the sum/difference law and the round trip (the forms
// are in FormEquivalenceTest).
#include <gtest/gtest.h>

#include "Algorithms/LR2MS.h"
#include "Algorithms/MS2LR.h"
#include "KernelForms.h"

using namespace kerneltest;
using ora::numeric::LR2MS;
using ora::numeric::MS2LR;

TEST(MidSide, MonoHasNoSideAndTheRoundTripRestoresLeftAndRight) {
    const std::vector<float> l = RandomFloats(1000, 1), r = RandomFloats(1000, 2);
    std::vector<float> m(1000), s(1000), l2(1000), r2(1000);
    LR2MS().Process(l.data(), l.data(), m.data(), s.data(), 1000);
    for (std::size_t n = 0; n < 1000; ++n) {
        EXPECT_EQ(m[n], l[n]);
        EXPECT_EQ(s[n], 0.0f);
    }
    LR2MS().Process(l.data(), r.data(), m.data(), s.data(), 1000);
    MS2LR().Process(m.data(), s.data(), l2.data(), r2.data(), 1000);
    for (std::size_t n = 0; n < 1000; ++n) {
        EXPECT_NEAR(l2[n], l[n], 1.2e-7f);
        EXPECT_NEAR(r2[n], r[n], 1.2e-7f);
        EXPECT_EQ(m[n], (l[n] + r[n]) * 0.5f);
    }
}
