// The 15-line mixing matrix: its design, orthogonality and losslessness
// (the forms are in FormEquivalenceTest).
#include <gtest/gtest.h>

#include <cmath>
#include <vector>

#include "Algorithms/U15p.h"
#include "KernelForms.h"

using namespace ora::numeric;

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
