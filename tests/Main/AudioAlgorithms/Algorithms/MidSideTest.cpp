// LR2MS and MS2LR: the sum/difference law, the round trip, and every form
// against ref, in place and out of place.
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

TEST(MidSide, EveryFormGivesTheReferenceResult) {
    const std::size_t total = AwkwardTotal();
    const std::vector<float> a = RandomFloats(total, 3), b = RandomFloats(total, 4);
    std::vector<float> m(total), s(total), l(total), r(total);
    {
        ora::system::ScopedDispatch forced(InstructionLevel::None, false);
        LR2MS().Process(a.data(), b.data(), m.data(), s.data(), total);
        MS2LR().Process(a.data(), b.data(), l.data(), r.data(), total);
    }
    ForEachForm(false, [&](const Form&, const std::string& name) {
        LR2MS toMidSide;
        MS2LR toLeftRight;
        EXPECT_EQ(toMidSide.FormName(), name);
        EXPECT_EQ(toLeftRight.FormName(), name);
        std::size_t position = 0;
        for (std::size_t n : AwkwardLengths()) {
            Guarded<> x(n), y(n), p(n), q(n);
            std::copy_n(a.begin() + position, n, x.data());
            std::copy_n(b.begin() + position, n, y.data());
            toMidSide.Process(x.data(), y.data(), p.data(), q.data(), n);
            toLeftRight.Process(x.data(), y.data(), x.data(), y.data(), n);  // in place
            ASSERT_TRUE(p.GuardsIntact() && q.GuardsIntact() && x.GuardsIntact() && y.GuardsIntact()) << name;
            for (std::size_t i = 0; i < n; ++i) {
                ASSERT_EQ(p[i], m[position + i]) << name;
                ASSERT_EQ(q[i], s[position + i]) << name;
                ASSERT_EQ(x[i], l[position + i]) << name;
                ASSERT_EQ(y[i], r[position + i]) << name;
            }
            position += n;
        }
    });
}
