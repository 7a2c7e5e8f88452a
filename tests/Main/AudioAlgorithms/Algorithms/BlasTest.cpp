// Blas1 and Blas2: products against double-precision sums, the fixed
// summation order that makes every form agree bit for bit, and the forms.
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

TEST(Blas, EveryFormGivesTheReferenceResult) {
    const std::size_t total = AwkwardTotal();
    const std::vector<float> x = RandomFloats(total, 3), y = RandomFloats(total, 4);
    std::vector<float> dots, axpy(y);
    {
        ora::system::ScopedDispatch forced(InstructionLevel::None, false);
        const Blas1 ref;
        std::size_t position = 0;
        for (std::size_t n : AwkwardLengths()) {
            dots.push_back(ref.Dot(x.data() + position, y.data() + position, n));
            position += n;
        }
        ref.Axpy(-0.3f, x.data(), axpy.data(), total);
    }
    // Matrices of every awkward row count, 7 columns of stride rows + 3.
    const std::size_t cols = 7;
    const std::vector<float> matrix = RandomFloats((4095 + 3) * cols, 5), v = RandomFloats(cols, 6);
    std::vector<std::vector<float>> products;
    {
        ora::system::ScopedDispatch forced(InstructionLevel::None, false);
        for (std::size_t rows : AwkwardLengths()) {
            products.emplace_back(rows);
            Blas2().Gemv(matrix.data(), rows, cols, rows + 3, v.data(), products.back().data());
        }
    }
    ForEachForm(false, [&](const Form&, const std::string& name) {
        const Blas1 blas;
        const Blas2 product;
        EXPECT_EQ(blas.FormName(), name);
        EXPECT_EQ(product.FormName(), name);
        std::size_t position = 0, step = 0;
        for (std::size_t n : AwkwardLengths()) {
            Guarded<> p(n), q(n), r(n);
            std::copy_n(x.begin() + position, n, p.data());
            std::copy_n(y.begin() + position, n, q.data());
            ASSERT_EQ(blas.Dot(p.data(), q.data(), n), dots[step]) << name << " length " << n;
            blas.Axpy(-0.3f, p.data(), q.data(), n);
            ASSERT_TRUE(q.GuardsIntact());
            for (std::size_t i = 0; i < n; ++i) ASSERT_EQ(q[i], axpy[position + i]) << name;
            product.Gemv(matrix.data(), n, cols, n + 3, v.data(), r.data());
            ASSERT_TRUE(r.GuardsIntact());
            for (std::size_t i = 0; i < n; ++i) ASSERT_EQ(r[i], products[step][i]) << name << " rows " << n;
            position += n;
            ++step;
        }
    });
}
