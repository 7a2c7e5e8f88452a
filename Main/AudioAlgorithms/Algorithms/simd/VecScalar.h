// A "vector" of one float with the lane semantics of VecM128 and VecM256
// (Min/Max and NaN, all-ones masks, rounding to nearest even), so that a
// shared body instantiated with it is the `ref` form, step for step the
// arithmetic of every lane of the plain vector forms. Plain C++; included
// only by sources compiled for the baseline.
#pragma once

#include <cmath>
#include <cstdint>
#include <cstring>

namespace {

struct VecScalar {
    using T = float;
    using I = std::int32_t;
    static constexpr int kWidth = 1;
    static T Zero() { return 0.0f; }
    static T Set1(float v) { return v; }
    static T Bits(std::uint32_t bits) { return AsFloat(static_cast<I>(bits)); }
    static T Load(const float* p) { return *p; }
    static void Store(float* p, T v) { *p = v; }
    static float First(T v) { return v; }

    static T Add(T a, T b) { return a + b; }
    static T Sub(T a, T b) { return a - b; }
    static T Mul(T a, T b) { return a * b; }
    static T Div(T a, T b) { return a / b; }
    static T Sqrt(T a) { return std::sqrt(a); }
    static T MulAdd(T a, T b, T c) { return a * b + c; }
    static float MulAddScalar(float a, float b, float c) { return a * b + c; }
    static T Min(T a, T b) { return a < b ? a : b; }
    static T Max(T a, T b) { return a > b ? a : b; }

    static T And(T a, T b) { return AsFloat(AsInt(a) & AsInt(b)); }
    static T Or(T a, T b) { return AsFloat(AsInt(a) | AsInt(b)); }
    static T Xor(T a, T b) { return AsFloat(AsInt(a) ^ AsInt(b)); }
    static T Abs(T a) { return std::fabs(a); }
    static T Lt(T a, T b) { return Mask(a < b); }
    static T Gt(T a, T b) { return Mask(a > b); }
    static T Ge(T a, T b) { return Mask(a >= b); }
    static T Eq(T a, T b) { return Mask(a == b); }
    static T Ordered(T a, T b) { return Mask(a == a && b == b); }
    static T Select(T mask, T a, T b) { return AsInt(mask) != 0 ? a : b; }

    // To nearest, ties to even, as cvtps2dq: adding and removing 1.5 * 2^52
    // leaves a double no fraction (and inlines, where lrint is a call).
    static I RoundToInt(T a) {
        constexpr double kRound = 6755399441055744.0;
        return static_cast<I>((static_cast<double>(a) + kRound) - kRound);
    }
    static T ToFloat(I a) { return static_cast<float>(a); }
    static I AsInt(T a) {
        I i;
        std::memcpy(&i, &a, sizeof i);
        return i;
    }
    static T AsFloat(I a) {
        T f;
        std::memcpy(&f, &a, sizeof f);
        return f;
    }

    static T Mask(bool on) { return on ? Bits(0xFFFFFFFFu) : 0.0f; }
    static void Deinterleave(T low, T high, T& a, T& b) {
        a = low;
        b = high;
    }
};

}  // namespace
