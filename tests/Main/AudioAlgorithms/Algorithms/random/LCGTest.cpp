// random::LCG: the range and moments of its values, the same sequence from
// a new seed, from every form and from any split of the calls.
#include <gtest/gtest.h>

#include <algorithm>

#include "../KernelForms.h"
#include "Algorithms/random/LCG.h"

using namespace kerneltest;
using ora::numeric::random::LCG;
using ora::numeric::random::LCGConfig;

TEST(LCG, FillsMinusOneToOneUniformlyAndReseedingRepeatsTheSequence) {
    LCG lcg(LCGConfig{12345});
    std::vector<float> x(100000), again(100);
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
    lcg.Generate(again.data(), again.size());
    EXPECT_TRUE(std::equal(again.begin(), again.end(), x.begin()));
    EXPECT_EQ(LCG(LCGConfig{12345}).Next(), x[0]);
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
