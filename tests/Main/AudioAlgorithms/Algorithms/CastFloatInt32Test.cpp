// CastFloatInt32: rounding to nearest even, saturation, NaN, exact PCM
// round trips, and every form against ref.
#include <gtest/gtest.h>

#include <cmath>
#include <limits>

#include "Algorithms/CastFloatInt32.h"
#include "KernelForms.h"

using namespace kerneltest;
using ora::numeric::CastFloatInt32;

TEST(CastFloatInt32, RoundsTiesToEvenSaturatesAndSendsNaNToZero) {
    const std::vector<float> in = {0.5f, 1.5f,  2.5f, -0.5f, -1.5f,         1.4999999f,
                                   3e9f, -3e9f, 1.0f, -1.0f, std::nanf(""), INFINITY};
    std::vector<std::int32_t> out(in.size());
    const CastFloatInt32 cast;
    cast.ToInt32(in.data(), out.data(), in.size(), 1.0f);
    const std::int32_t top = std::numeric_limits<std::int32_t>::max() - 127;  // the largest float below 2^31
    const std::int32_t bottom = std::numeric_limits<std::int32_t>::min();
    EXPECT_EQ(out, (std::vector<std::int32_t>{0, 2, 2, 0, -2, 1, top, bottom, 1, -1, 0, top}));
    // Full scale at the PCM scale: +1.0 saturates just below 2^31, -1.0 is exact.
    const float ends[2] = {1.0f, -1.0f};
    std::int32_t pcm[2];
    cast.ToInt32(ends, pcm, 2, CastFloatInt32::kPcm32Scale);
    EXPECT_EQ(pcm[0], top);
    EXPECT_EQ(pcm[1], bottom);
}

TEST(CastFloatInt32, TwentyFourBitSamplesRoundTripExactly) {
    std::vector<float> in(4096);
    for (std::size_t i = 0; i < in.size(); ++i)
        in[i] = static_cast<float>(static_cast<int>(i * 4093 % 16777216) - 8388608) / 8388608.0f;
    std::vector<std::int32_t> pcm(in.size());
    std::vector<float> back(in.size());
    const CastFloatInt32 cast;
    cast.ToInt32(in.data(), pcm.data(), in.size(), 8388608.0f);
    cast.ToFloat(pcm.data(), back.data(), in.size(), 1.0f / 8388608.0f);
    EXPECT_EQ(back, in);
}

TEST(CastFloatInt32, EveryFormGivesTheReferenceResult) {
    const std::size_t total = AwkwardTotal();
    std::vector<float> x = RandomFloats(total, 8);
    x[5] = std::nanf("");
    x[40] = 5.0f;  // saturates
    x[41] = -5.0f;
    std::vector<std::int32_t> ints(total);
    std::vector<float> floats(total);
    {
        ora::system::ScopedDispatch forced(InstructionLevel::None, false);
        CastFloatInt32().ToInt32(x.data(), ints.data(), total, CastFloatInt32::kPcm32Scale);
        CastFloatInt32().ToFloat(ints.data(), floats.data(), total, 0.25f);
    }
    ForEachForm(false, [&](const Form&, const std::string& name) {
        const CastFloatInt32 cast;
        EXPECT_EQ(cast.FormName(), name);
        std::size_t position = 0;
        for (std::size_t n : AwkwardLengths()) {
            Guarded<> in(n), back(n);
            Guarded<std::int32_t> out(n);
            std::copy_n(x.begin() + position, n, in.data());
            cast.ToInt32(in.data(), out.data(), n, CastFloatInt32::kPcm32Scale);
            cast.ToFloat(out.data(), back.data(), n, 0.25f);
            ASSERT_TRUE(out.GuardsIntact() && back.GuardsIntact()) << name;
            for (std::size_t i = 0; i < n; ++i) {
                ASSERT_EQ(out[i], ints[position + i]) << name << " at " << position + i;
                ASSERT_EQ(back[i], floats[position + i]) << name << " at " << position + i;
            }
            position += n;
        }
    });
}
