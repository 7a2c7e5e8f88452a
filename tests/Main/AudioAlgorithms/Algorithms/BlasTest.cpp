// Blas1 and Blas2: products against double-precision sums, and the fixed
// summation order that makes every form's dot and product agree bit for bit
// (Axpy's forms are in FormEquivalenceTest).
#include <gtest/gtest.h>

#include <cmath>

#include "Algorithms/Blas1.h"
#include "Algorithms/Blas2.h"
#include "KernelForms.h"

using namespace kerneltest;
using ora::numeric::Blas1;
using ora::numeric::Blas2;

TEST(Blas1, DotAxpyAndNormAgreeWithDoublePrecision) {
    for (std::size_t n : {0u, 1u, 7u, 8u, 9u, 1000u}) {
        const std::vector<float> x = RandomFloats(n, 1), y = RandomFloats(n, 2);
        double dot = 0.0, magnitude = 0.0, norm = 0.0;
        for (std::size_t i = 0; i < n; ++i) {
            dot += double(x[i]) * y[i];
            magnitude += std::fabs(double(x[i]) * y[i]);
            norm += double(x[i]) * x[i];
        }
        const Blas1 blas;
        EXPECT_NEAR(blas.Dot(x.data(), y.data(), n), dot, 1e-6 * magnitude + 1e-30) << n;
        EXPECT_NEAR(blas.Norm2(x.data(), n), std::sqrt(norm), 1e-6 * std::sqrt(norm) + 1e-30);
        std::vector<float> z = y;
        blas.Axpy(0.5f, x.data(), z.data(), n);
        for (std::size_t i = 0; i < n; ++i) EXPECT_EQ(z[i], y[i] + 0.5f * x[i]);
    }
}

TEST(Blas2, GemvOverAColumnMajorMatrix) {
    // A 5 x 3 matrix in columns of stride 8; identity-like check and a sum.
    const std::size_t rows = 5, cols = 3, stride = 8;
    std::vector<float> a(stride * cols, 99.0f);  // padding must not be read into y
    for (std::size_t c = 0; c < cols; ++c)
        for (std::size_t r = 0; r < rows; ++r) a[c * stride + r] = static_cast<float>(r + 10 * c);
    const std::vector<float> x = {1.0f, -2.0f, 0.5f};
    std::vector<float> y(rows);
    Blas2().Gemv(a.data(), rows, cols, stride, x.data(), y.data());
    for (std::size_t r = 0; r < rows; ++r) EXPECT_EQ(y[r], r * 1.0f + (r + 10.0f) * -2.0f + (r + 20.0f) * 0.5f) << r;
}

TEST(Blas, EveryFormGivesTheReferenceDotAndProduct) {
    // Dots over the awkward lengths; matrices of as many rows, 7 columns of stride rows + 3.
    const std::size_t cols = 7;
    const std::vector<float> x = RandomFloats(AwkwardTotal(), 3), y = RandomFloats(AwkwardTotal(), 4);
    const std::vector<float> matrix = RandomFloats((4095 + 3) * cols, 5), v = RandomFloats(cols, 6);
    auto run = [&](const std::string& name) {
        std::vector<float> results;
        std::size_t position = 0;
        for (std::size_t n : AwkwardLengths()) {
            Guarded<> p(n), q(n), r(n);
            std::copy_n(x.begin() + position, n, p.data());
            std::copy_n(y.begin() + position, n, q.data());
            results.push_back(Blas1().Dot(p.data(), q.data(), n));
            Blas2().Gemv(matrix.data(), n, cols, n + 3, v.data(), r.data());
            EXPECT_TRUE(r.GuardsIntact()) << name << " rows " << n;
            const auto rows = r.Values();
            results.insert(results.end(), rows.begin(), rows.end());
            position += n;
        }
        return results;
    };
    std::vector<float> want;
    {
        ora::system::ScopedDispatch forced(InstructionLevel::None, false);
        want = run("ref");
    }
    ForEachForm(false, [&](const Form&, const std::string& name) {
        EXPECT_EQ(Blas1().FormName(), name);
        EXPECT_EQ(Blas2().FormName(), name);
        EXPECT_EQ(run(name), want) << name;
    });
}
