// Element functions of Func and Rect2Polar on one vector of a vector type V
// (VecScalar for `ref`, VecM128, VecM256 and their fused types), written once
// so that the plain forms and `ref` take the same steps and agree bit for
// bit. The errors and special values they give are stated in Func.h and
// Rect2Polar.h. Always inlined: a call per vector would cost more than some
// of them.
#pragma once

#include <cstdint>

namespace ora::numeric::simd {

constexpr std::uint32_t kSignBit = 0x80000000u;
constexpr std::uint32_t kExponentBits = 0x7F800000u;
constexpr std::uint32_t kMantissaBits = 0x007FFFFFu;
constexpr std::uint32_t kOneBits = 0x3F800000u;  // 1.0f
constexpr std::uint32_t kQuietNaNBits = 0x7FC00000u;
constexpr std::uint32_t kInfinityBits = 0x7F800000u;
constexpr float kSmallestNormal = 1.17549435e-38f;  // 2^-126
constexpr float kTwoTo23 = 8388608.0f;
constexpr float kTwoToMinus23 = 1.0f / 8388608.0f;
// Denormals are scaled into the normal range before their exponent is read.
constexpr float kDenormalScale = 16777216.0f;  // 2^24
constexpr float kDenormalScaleLog2 = 24.0f;

// log10(2) and ln(2) split: the high parts have at most 16 significant bits,
// so that k times them is exact for the |k| <= 256 that occur.
constexpr float kLog10Of2Hi = 0.301025390625f;
constexpr float kLog10Of2Lo = 4.605039066518657e-06f;
constexpr float kLn2Hi = 0.693145751953125f;
constexpr float kLn2Lo = 1.428606765330187e-06f;
constexpr float kLog2OfE = 1.44269502f;
constexpr float kLog2Of10 = 3.32192802f;
constexpr float kLn10 = 2.30258512f;
constexpr float kTwoOverLn10 = 0.868588984f;
constexpr float kSqrt2 = 1.41421354f;
// pi and pi/2 as the float nearest and the rest.
constexpr float kPi = 3.14159274f;
constexpr float kPiLo = -8.74227766e-08f;
constexpr float kHalfPi = 1.57079637f;
constexpr float kHalfPiLo = -4.37113883e-08f;

// Inputs beyond these give +inf or 0 in float; clamping keeps the exponent
// arithmetic in range (and turns NaN into a finite value, restored after).
constexpr float kExpLowest = -104.0f;
constexpr float kExpHighest = 88.8f;
constexpr float kPow10Lowest = -45.6f;
constexpr float kPow10Highest = 38.6f;
// tanh(x) rounds to 1 in float from 9.02 on.
constexpr float kTanhSaturation = 10.0f;

// atan(a) = a P(a^2) on 0 <= a <= 1: a Chebyshev fit of degree 8 in a^2,
// within 1.8e-8 of atan before float rounding.
constexpr float kAtan[] = {0.00276628346f, -0.015731249f,  0.0421376228f, -0.0745685473f, 0.106183708f,
                           -0.141977981f,  0.199918717f, -0.333330363f, 1.0f};

// 2^k for integer k in [-126, 127]: the exponent field built from k.
template <class V>
__attribute__((always_inline)) inline typename V::T Pow2(typename V::T k) {
    const typename V::T field = V::Mul(V::Add(k, V::Set1(127.0f)), V::Set1(kTwoTo23));
    return V::AsFloat(V::RoundToInt(field));
}

// v * 2^k for integer k in [-252, 254], in two exact steps and one rounding,
// so that results in the denormal range round once.
template <class V>
__attribute__((always_inline)) inline typename V::T ScaleByPow2(typename V::T v, typename V::T k) {
    const typename V::T k1 = V::ToFloat(V::RoundToInt(V::Mul(k, V::Set1(0.5f))));
    return V::Mul(V::Mul(v, Pow2<V>(k1)), Pow2<V>(V::Sub(k, k1)));
}

// e^r - 1 for |r| <= ln(2)/2 (Taylor to r^7), exact in relative terms near 0.
template <class V>
__attribute__((always_inline)) inline typename V::T ExpM1Reduced(typename V::T r) {
    typename V::T p = V::MulAdd(r, V::Set1(1.0f / 5040.0f), V::Set1(1.0f / 720.0f));
    p = V::MulAdd(p, r, V::Set1(1.0f / 120.0f));
    p = V::MulAdd(p, r, V::Set1(1.0f / 24.0f));
    p = V::MulAdd(p, r, V::Set1(1.0f / 6.0f));
    p = V::MulAdd(p, r, V::Set1(0.5f));
    return V::MulAdd(V::Mul(r, r), p, r);
}

// y = k ln2 + r, |r| <= ln(2)/2; returns k, sets r.
template <class V>
__attribute__((always_inline)) inline typename V::T ReduceByLn2(typename V::T y, typename V::T& r) {
    const typename V::T k = V::ToFloat(V::RoundToInt(V::Mul(y, V::Set1(kLog2OfE))));
    r = V::Sub(V::Sub(y, V::Mul(k, V::Set1(kLn2Hi))), V::Mul(k, V::Set1(kLn2Lo)));
    return k;
}

template <class V>
__attribute__((always_inline)) inline typename V::T RestoreNaN(typename V::T x, typename V::T y) {
    return V::Select(V::Ordered(x, x), y, x);
}

template <class V>
__attribute__((always_inline)) inline typename V::T Exp(typename V::T x) {
    typename V::T r;
    const typename V::T y = V::Min(V::Max(x, V::Set1(kExpLowest)), V::Set1(kExpHighest));
    const typename V::T k = ReduceByLn2<V>(y, r);
    return RestoreNaN<V>(x, ScaleByPow2<V>(V::Add(ExpM1Reduced<V>(r), V::Set1(1.0f)), k));
}

// 10^x = 2^k 10^r with x = k log10(2) + r, e^(r ln10) from the same series.
template <class V>
__attribute__((always_inline)) inline typename V::T Pow10(typename V::T x) {
    const typename V::T y = V::Min(V::Max(x, V::Set1(kPow10Lowest)), V::Set1(kPow10Highest));
    const typename V::T k = V::ToFloat(V::RoundToInt(V::Mul(y, V::Set1(kLog2Of10))));
    const typename V::T r = V::Sub(V::Sub(y, V::Mul(k, V::Set1(kLog10Of2Hi))), V::Mul(k, V::Set1(kLog10Of2Lo)));
    const typename V::T e = V::Add(ExpM1Reduced<V>(V::Mul(r, V::Set1(kLn10))), V::Set1(1.0f));
    return RestoreNaN<V>(x, ScaleByPow2<V>(e, k));
}

// x = 2^e m with sqrt(1/2) < m <= sqrt(2); ln m = 2 atanh(t), t = (m - 1) / (m + 1),
// |t| <= 0.172, from its series to t^9.
template <class V>
__attribute__((always_inline)) inline typename V::T Log10(typename V::T x) {
    using T = typename V::T;
    const T tiny = V::Lt(x, V::Set1(kSmallestNormal));
    const T xs = V::Select(tiny, V::Mul(x, V::Set1(kDenormalScale)), x);
    const T biased = V::Mul(V::ToFloat(V::AsInt(V::And(xs, V::Bits(kExponentBits)))), V::Set1(kTwoToMinus23));
    T e = V::Sub(biased, V::Add(V::Set1(127.0f), V::And(tiny, V::Set1(kDenormalScaleLog2))));
    T m = V::Or(V::And(xs, V::Bits(kMantissaBits)), V::Bits(kOneBits));
    const T high = V::Gt(m, V::Set1(kSqrt2));
    m = V::Select(high, V::Mul(m, V::Set1(0.5f)), m);
    e = V::Add(e, V::And(high, V::Set1(1.0f)));
    const T t = V::Div(V::Sub(m, V::Set1(1.0f)), V::Add(m, V::Set1(1.0f)));
    const T t2 = V::Mul(t, t);
    T p = V::MulAdd(t2, V::Set1(1.0f / 9.0f), V::Set1(1.0f / 7.0f));
    p = V::MulAdd(p, t2, V::Set1(1.0f / 5.0f));
    p = V::MulAdd(p, t2, V::Set1(1.0f / 3.0f));
    p = V::MulAdd(p, t2, V::Set1(1.0f));
    const T logM = V::Mul(V::Mul(t, V::Set1(kTwoOverLn10)), p);
    T y = V::MulAdd(e, V::Set1(kLog10Of2Hi), V::MulAdd(e, V::Set1(kLog10Of2Lo), logM));
    y = V::Select(V::Eq(x, V::Bits(kInfinityBits)), x, y);
    y = V::Select(V::Eq(x, V::Zero()), V::Bits(kSignBit | kInfinityBits), y);
    return V::Select(V::Ge(x, V::Zero()), y, V::Bits(kQuietNaNBits));
}

// tanh |x| = E / (E + 2) with E = e^(2|x|) - 1, the sign put back.
template <class V>
__attribute__((always_inline)) inline typename V::T Tanh(typename V::T x) {
    using T = typename V::T;
    const T a = V::Min(V::Abs(x), V::Set1(kTanhSaturation));
    T r;
    const T k = ReduceByLn2<V>(V::Add(a, a), r);
    const T scale = Pow2<V>(k);
    const T e = V::MulAdd(scale, ExpM1Reduced<V>(r), V::Sub(scale, V::Set1(1.0f)));
    const T t = V::Div(e, V::Add(e, V::Set1(2.0f)));
    return RestoreNaN<V>(x, V::Or(t, V::And(x, V::Bits(kSignBit))));
}

// atan2(y, x) from atan of the smaller over the larger magnitude, moved to
// its octant as offset +- atan with the offset (0, pi/2 or pi) in two parts,
// so that the result rounds once. 0 for 0 + 0i (signed as y), NaN where a
// part is NaN or both are infinite.
template <class V>
__attribute__((always_inline)) inline typename V::T Atan2(typename V::T y, typename V::T x) {
    using T = typename V::T;
    const T ax = V::Abs(x), ay = V::Abs(y);
    const T larger = V::Max(ax, ay);
    const T a = V::Select(V::Gt(larger, V::Zero()), V::Div(V::Min(ax, ay), larger), V::Zero());
    const T s = V::Mul(a, a);
    T p = V::Set1(kAtan[0]);
    for (int i = 1; i < static_cast<int>(sizeof(kAtan) / sizeof(kAtan[0])); ++i) p = V::MulAdd(p, s, V::Set1(kAtan[i]));
    const T swapped = V::Gt(ay, ax), left = V::Lt(x, V::Zero());
    // pi/2 - t, pi/2 + t, pi - t or t
    const T turned = V::Xor(V::Mul(a, p), V::And(V::Xor(swapped, left), V::Bits(kSignBit)));
    const T hi = V::Select(swapped, V::Set1(kHalfPi), V::And(left, V::Set1(kPi)));
    const T lo = V::Select(swapped, V::Set1(kHalfPiLo), V::And(left, V::Set1(kPiLo)));
    const T angle = V::Xor(V::Add(hi, V::Add(turned, lo)), V::And(y, V::Bits(kSignBit)));
    return V::Select(V::Ordered(x, y), angle, V::Bits(kQuietNaNBits));
}

}  // namespace ora::numeric::simd
