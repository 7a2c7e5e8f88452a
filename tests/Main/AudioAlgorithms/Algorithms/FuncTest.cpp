// Func: each function within its stated error of the double-precision
// std:: function over its whole domain, in every form; the special values
// each one gives, also with denormals flushed. (Fused forms against ref are
// in FormEquivalenceTest.)
#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <limits>

#include "Algorithms/Func.h"
#include "Common/ScopedDenormalFlush.h"
#include "KernelForms.h"

using namespace kerneltest;
using ora::numeric::Func;

namespace {

using Function = void (Func::*)(const float*, float*, std::size_t) const noexcept;

constexpr float kInf = std::numeric_limits<float>::infinity();
constexpr float kDenormMin = std::numeric_limits<float>::denorm_min();

struct Law {
    const char* name;
    Function function;
    double (*exact)(double);
    float lowest, highest;  // the domain swept
    double ulps;            // the stated bound
};

const Law kLaws[] = {
    {"Log10", &Func::Log10, [](double x) { return std::log10(x); }, kDenormMin, 3.4e38f, 4.0},
    {"Pow10", &Func::Pow10, [](double x) { return std::pow(10.0, x); }, -45.6f, 38.5f, 2.0},
    {"Exp", &Func::Exp, [](double x) { return std::exp(x); }, -104.0f, 88.7f, 2.0},
    {"Tanh", &Func::Tanh, [](double x) { return std::tanh(x); }, -12.0f, 12.0f, 3.0},
    {"Sqrt", &Func::Sqrt, [](double x) { return std::sqrt(x); }, 0.0f, 3.4e38f, 0.5},
};

// The error of `got` in units in the last place of the float nearest `exact`
// (denormal results in units of the smallest denormal).
double Ulps(float got, double exact) {
    if (std::isinf(got) && std::fabs(exact) > std::numeric_limits<float>::max()) return 0.0;
    const float nearest = static_cast<float>(exact);
    int exponent = 0;
    std::frexp(nearest == 0.0f ? kDenormMin : nearest, &exponent);
    return std::fabs(got - exact) / std::ldexp(1.0, std::max(exponent - 24, -149));
}

// Every float from lowest to highest by bit pattern, thinned to about `count`.
std::vector<float> Sweep(float lowest, float highest, std::size_t count) {
    auto ordered = [](float x) {
        std::int32_t i;
        std::memcpy(&i, &x, 4);
        return i < 0 ? -static_cast<std::int64_t>(i & 0x7FFFFFFF) : static_cast<std::int64_t>(i);
    };
    const std::int64_t a = ordered(lowest), b = ordered(highest);
    std::vector<float> x;
    for (std::int64_t k = a; k <= b; k += std::max<std::int64_t>(1, (b - a) / static_cast<std::int64_t>(count))) {
        const std::int32_t bits = k < 0 ? static_cast<std::int32_t>(-k) | INT32_MIN : static_cast<std::int32_t>(k);
        float v;
        std::memcpy(&v, &bits, 4);
        x.push_back(v);
    }
    return x;
}

}  // namespace

TEST(Func, EachFunctionIsWithinItsStatedErrorOverItsDomainInEveryForm) {
    for (const Law& law : kLaws) {
        const std::vector<float> x = Sweep(law.lowest, law.highest, 60000);
        ForEachForm(true, [&](const Form&, const std::string& name) {
            std::vector<float> y(x.size());
            (Func().*law.function)(x.data(), y.data(), x.size());
            double worst = 0.0;
            float at = 0.0f;
            for (std::size_t i = 0; i < x.size(); ++i) {
                const double e = Ulps(y[i], law.exact(x[i]));
                if (!(e <= worst)) worst = e, at = x[i];
            }
            EXPECT_LE(worst, law.ulps) << law.name << " " << name << ": " << worst << " ulp at " << at;
        });
    }
}

TEST(Func, SpecialValuesInEveryForm) {
    const float nan = std::nanf("");
    const std::vector<float> x = {0.0f, -0.0f, -1.0f, kInf, -kInf, nan, kDenormMin, 1e-40f, 100.0f, -200.0f, 1.0f};
    struct Expected {
        Function function;
        std::vector<float> y;  // NaN where NaN is expected
    } expected[] = {
        {&Func::Log10, {-kInf, -kInf, nan, kInf, nan, nan, -44.8534698f, -40.0f, 2.0f, nan, 0.0f}},
        {&Func::Pow10, {1.0f, 1.0f, 0.1f, kInf, 0.0f, nan, 1.0f, 1.0f, kInf, 0.0f, 10.0f}},
        {&Func::Exp, {1.0f, 1.0f, 0.36787945f, kInf, 0.0f, nan, 1.0f, 1.0f, kInf, 0.0f, 2.71828175f}},
        {&Func::Tanh, {0.0f, -0.0f, -0.76159418f, 1.0f, -1.0f, nan, kDenormMin, 1e-40f, 1.0f, -1.0f, 0.76159418f}},
        {&Func::Sqrt, {0.0f, -0.0f, nan, kInf, nan, nan, std::sqrt(kDenormMin), std::sqrt(1e-40f), 10.0f, nan, 1.0f}},
    };
    ForEachForm(true, [&](const Form&, const std::string& name) {
        for (const Expected& e : expected) {
            std::vector<float> y(x.size());
            (Func().*e.function)(x.data(), y.data(), x.size());
            for (std::size_t i = 0; i < x.size(); ++i) {
                if (std::isnan(e.y[i]))
                    EXPECT_TRUE(std::isnan(y[i])) << name << " input " << x[i] << " gives " << y[i];
                else
                    EXPECT_TRUE((y[i] == e.y[i] && std::signbit(y[i]) == std::signbit(e.y[i])) ||
                                (y[i] != 0.0f && Ulps(y[i], e.y[i]) <= 1.0))
                        << name << " input " << x[i] << " gives " << y[i] << ", not " << e.y[i];
            }
        }
    });
}

TEST(Func, DenormalsReadAsZeroWhenFlushed) {
    const std::vector<float> x = {kDenormMin, -1e-40f, -100.0f};
    std::vector<float> log(3), tanh(3), exp(3);
    {
        zen::ScopedDenormalFlush flush;
        const Func func;
        func.Log10(x.data(), log.data(), 3);
        func.Tanh(x.data(), tanh.data(), 3);
        func.Exp(x.data(), exp.data(), 3);
    }
    EXPECT_EQ(log[0], -kInf);
    EXPECT_EQ(log[1], -kInf);  // -0 after the flush
    EXPECT_EQ(tanh[0], 0.0f);
    EXPECT_EQ(exp[2], 0.0f);  // e^-100 is a denormal
}
