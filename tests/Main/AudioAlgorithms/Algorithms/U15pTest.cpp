// The 15-line mixing matrix: orthogonality, losslessness, every form against ref.
#include <gtest/gtest.h>

#include <cmath>
#include <vector>

#include "Algorithms/U15p.h"
#include "KernelForms.h"

using namespace ora::numeric;
using ora::system::ScopedDispatch;

namespace {

// Column j of U: U applied to the unit frame e_j.
std::vector<std::vector<double>> MatrixOf(const U15p& u15) {
    std::vector<std::vector<double>> U(15, std::vector<double>(15));
    for (int j = 0; j < 15; ++j) {
        float d[16] = {}, u[16] = {}, m[16] = {};
        d[j] = 1.0f;
        u15.Process(d, u, m, 1);
        for (int r = 0; r < 15; ++r) U[r][j] = m[r];
    }
    return U;
}

}  // namespace

TEST(U15p, MatrixIsTheDifferenceSetDesignAndOrthogonal) {
    U15p u15;
    const auto U = MatrixOf(u15);
    for (int r = 0; r < 15; ++r) {
        for (int c = 0; c < 15; ++c) {
            bool incident = false;
            for (int k : U15p::kColumns) incident |= (k + r) % 15 == c;
            EXPECT_NEAR(U[r][c], incident ? 0.2 : -0.3, 1e-7) << r << "," << c;
        }
    }
    for (int i = 0; i < 15; ++i)
        for (int j = 0; j < 15; ++j) {
            double dot = 0.0;
            for (int k = 0; k < 15; ++k) dot += U[i][k] * U[j][k];
            EXPECT_NEAR(dot, i == j ? 1.0 : 0.0, 1e-6) << i << "," << j;
        }
}

TEST(U15p, KeepsTheEnergyOfAnyFrameAndIgnoresLane15) {
    U15p u15;
    const auto d = kerneltest::RandomFloats(16 * 50, 3);
    const auto u = kerneltest::RandomFloats(16 * 50, 4);
    std::vector<float> m(16 * 50, 7.0f);
    u15.Process(d.data(), u.data(), m.data(), 50);
    for (int f = 0; f < 50; ++f) {
        double in = 0.0, out = 0.0;
        for (int i = 0; i < 15; ++i) {
            in += std::pow(double(d[f * 16 + i]) + u[f * 16 + i], 2);
            out += std::pow(double(m[f * 16 + i]), 2);
        }
        EXPECT_NEAR(out / in, 1.0, 1e-5) << f;
        EXPECT_EQ(m[f * 16 + 15], 7.0f);  // left as it was
    }
}

class U15pForms : public kerneltest::FormTest {};

TEST_P(U15pForms, AgreeWithRefBitForBit) {
    for (std::size_t frames : {0u, 1u, 2u, 3u, 17u, 65u}) {
        const auto d = kerneltest::RandomFloats(16 * frames, 10 + frames, 3.0f);
        const auto u = kerneltest::RandomFloats(16 * frames, 20 + frames, 3.0f);
        std::vector<float> expected(16 * frames, -1.0f);
        {
            ScopedDispatch forced(ora::system::InstructionLevel::None, false);
            U15p ref;
            ref.Process(d.data(), u.data(), expected.data(), frames);
        }
        ScopedDispatch forced(GetParam().level, GetParam().fma);
        U15p form;
        kerneltest::GuardedBuffer out(16 * frames);
        std::fill(out.data(), out.data() + 16 * frames, -1.0f);
        form.Process(d.data(), u.data(), out.data(), frames);
        EXPECT_EQ(out.Values(), expected) << frames << " frames, " << form.FormName();
        EXPECT_TRUE(out.GuardIntact());
        // In place over d.
        std::vector<float> inPlace = d;
        form.Process(inPlace.data(), u.data(), inPlace.data(), frames);
        for (std::size_t f = 0; f < frames; ++f)
            for (int i = 0; i < 15; ++i) ASSERT_EQ(inPlace[f * 16 + i], expected[f * 16 + i]);
    }
}

INSTANTIATE_TEST_SUITE_P(Forms, U15pForms, testing::ValuesIn(kerneltest::AllForms()), kerneltest::Name);
