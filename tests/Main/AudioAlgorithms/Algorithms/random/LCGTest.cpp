// random::LCG: the recurrence, the range and mean of its values, the same
// sequence from every form and any split of the calls.
#include <gtest/gtest.h>

#include <cmath>

#include "../KernelForms.h"
#include "Algorithms/random/LCG.h"

using namespace kerneltest;
using ora::numeric::random::LCG;
using ora::numeric::random::LCGConfig;

TEST(LCG, FollowsTheRecurrenceAndFillsMinusOneToOne) {
    LCG lcg(LCGConfig{12345});
    std::uint32_t state = 12345;
    for (int i = 0; i < 10; ++i) {
        state = state * 1664525u + 1013904223u;
        EXPECT_EQ(lcg.Next(), static_cast<float>(static_cast<std::int32_t>(state)) / 2147483648.0f);
    }
    EXPECT_EQ(lcg.GetState(), state);
    std::vector<float> x(100000);
    lcg.Generate(x.data(), x.size());
    double mean = 0.0, power = 0.0;
    for (float v : x) {
        ASSERT_GE(v, -1.0f);
        ASSERT_LE(v, 1.0f);
        mean += v;
        power += double(v) * v;
    }
    EXPECT_NEAR(mean / x.size(), 0.0, 0.01);
    EXPECT_NEAR(power / x.size(), 1.0 / 3.0, 0.01);  // uniform
    lcg.Reconfigure(LCGConfig{12345});
    EXPECT_EQ(lcg.GetState(), 12345u);
}

TEST(LCG, EveryFormGivesTheSameSequenceInAnySplit) {
    const std::size_t total = AwkwardTotal();
    std::vector<float> want(total);
    {
        ora::system::ScopedDispatch forced(InstructionLevel::None, false);
        LCG ref(LCGConfig{7});
        EXPECT_STREQ(ref.FormName(), "ref");
        ref.Generate(want.data(), total);
    }
    const auto& cpu = ora::system::DispatchSettings::Instance().Detected();
    struct IntegerForm {
        const char* name;
        InstructionLevel level;
        bool runnable;
    } forms[] = {{"ref", InstructionLevel::SSE2, true},
                 {"m128_sse41", InstructionLevel::SSE41, cpu.sse41},
                 {"m256_avx2", InstructionLevel::AVX2, cpu.avx2 && cpu.osAvx}};
    for (const IntegerForm& form : forms) {
        if (!form.runnable) continue;
        ora::system::ScopedDispatch forced(form.level, false);
        LCG lcg(LCGConfig{7});
        EXPECT_STREQ(lcg.FormName(), form.name);
        std::size_t position = 0;
        for (std::size_t n : AwkwardLengths()) {
            Guarded<> out(n);
            lcg.Generate(out.data(), n);
            ASSERT_TRUE(out.GuardsIntact()) << form.name;
            for (std::size_t i = 0; i < n; ++i)
                ASSERT_EQ(out[i], want[position + i]) << form.name << " at " << position + i;
            position += n;
        }
    }
}
