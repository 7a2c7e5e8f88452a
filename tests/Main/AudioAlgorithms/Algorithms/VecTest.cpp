// Vec: element-wise operations against their definitions, NaN through
// Clamp, and every form against ref bit for bit.
#include <gtest/gtest.h>

#include <cmath>
#include <functional>

#include "Algorithms/Vec.h"
#include "KernelForms.h"

using namespace kerneltest;
using ora::numeric::Vec;

namespace {

// Each operation on (a, b) into out, by name.
const std::vector<
    std::pair<const char*, std::function<void(const Vec&, const float*, const float*, float*, std::size_t)>>>&
Operations() {
    static const std::vector<
        std::pair<const char*, std::function<void(const Vec&, const float*, const float*, float*, std::size_t)>>>
        ops = {
            {"add", [](const Vec& v, const float* a, const float* b, float* o, std::size_t n) { v.Add(a, b, o, n); }},
            {"subtract",
             [](const Vec& v, const float* a, const float* b, float* o, std::size_t n) { v.Subtract(a, b, o, n); }},
            {"multiply",
             [](const Vec& v, const float* a, const float* b, float* o, std::size_t n) { v.Multiply(a, b, o, n); }},
            {"scale",
             [](const Vec& v, const float* a, const float*, float* o, std::size_t n) { v.Scale(a, -1.7f, o, n); }},
            {"abs", [](const Vec& v, const float* a, const float*, float* o, std::size_t n) { v.Abs(a, o, n); }},
            {"clamp", [](const Vec& v, const float* a, const float*, float* o,
                         std::size_t n) { v.Clamp(a, -0.5f, 0.25f, o, n); }},
        };
    return ops;
}

}  // namespace

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

TEST(Vec, EveryFormGivesTheReferenceResult) {
    const std::size_t total = AwkwardTotal();
    std::vector<float> a = RandomFloats(total, 5), b = RandomFloats(total, 6);
    a[3] = std::nanf("");  // NaN must take the same path in every form
    for (const auto& [name, op] : Operations()) {
        std::vector<float> want(total);
        {
            ora::system::ScopedDispatch forced(InstructionLevel::None, false);
            op(Vec(), a.data(), b.data(), want.data(), total);
        }
        ForEachForm(false, [&](const Form&, const std::string& form) {
            const Vec vec;
            EXPECT_EQ(vec.FormName(), form);
            std::size_t position = 0;
            for (std::size_t n : AwkwardLengths()) {
                Guarded<> x(n), y(n), out(n);
                std::copy_n(a.begin() + position, n, x.data());
                std::copy_n(b.begin() + position, n, y.data());
                op(vec, x.data(), y.data(), out.data(), n);
                op(vec, x.data(), y.data(), x.data(), n);  // in place
                ASSERT_TRUE(out.GuardsIntact() && x.GuardsIntact()) << name << " " << form;
                for (std::size_t i = 0; i < n; ++i) {
                    const float w = want[position + i];
                    ASSERT_TRUE(out[i] == w || (std::isnan(out[i]) && std::isnan(w))) << name << " " << form;
                    ASSERT_TRUE(x[i] == w || (std::isnan(x[i]) && std::isnan(w))) << name << " " << form;
                }
                position += n;
            }
        });
    }
}
