// Phase arithmetic shared by the frame plug-ins, and the per-bin functions
// they spend their time in, four bins at a time (the compiler's generic
// vectors, so the baseline instruction set runs them) and without branches:
// a frame takes thousands of each, and the library's scalar versions are
// many times slower for precision the phases have no use for.
#pragma once

#include <cmath>
#include <cstdint>
#include <cstring>

namespace ora::fft {

constexpr double kTwoPi = 6.283185307179586;

// The principal argument: the phase wrapped into [-pi, pi], for |phase| <
// 2^50 (adding and taking away 1.5 * 2^52 rounds to a whole number of turns).
inline double Princarg(double phase) {
    const double turns = (phase * (1.0 / kTwoPi) + 6755399441055744.0) - 6755399441055744.0;
    return phase - kTwoPi * turns;
}

using Float4 = float __attribute__((vector_size(16)));
using Int4 = std::int32_t __attribute__((vector_size(16)));

inline Float4 Splat(float v) { return Float4{v, v, v, v}; }
inline Float4 Load4(const float* p) {
    Float4 v;
    std::memcpy(&v, p, sizeof v);
    return v;
}
inline void Store4(float* p, Float4 v) { std::memcpy(p, &v, sizeof v); }
inline Float4 Abs4(Float4 x) { return reinterpret_cast<Float4>(reinterpret_cast<Int4>(x) & 0x7fffffff); }
// Lanes of `a` where `mask` is set, of `b` elsewhere.
inline Float4 Select4(Int4 mask, Float4 a, Float4 b) {
    return reinterpret_cast<Float4>((mask & reinterpret_cast<Int4>(a)) | (~mask & reinterpret_cast<Int4>(b)));
}
// To the nearest whole number, for |x| < 2^22: adding and taking away
// 1.5 * 2^23 leaves no fraction to keep.
inline Float4 Round4(Float4 x) { return (x + 12582912.0f) - 12582912.0f; }

// The principal argument, [-pi, pi], within 2e-7 rad of that of the float
// given, for |phase| < 1e4 (2 pi in two parts, the first short enough to be
// multiplied exactly).
inline Float4 Princarg4(Float4 phase) {
    const Float4 turns = Round4(phase * 0.159154943f);
    return (phase - turns * 6.28125f) - turns * 1.935307179586e-3f;
}
inline float Princarg1(float phase) { return Princarg4(Splat(phase))[0]; }

// atan2(y, x) within 3e-7 rad for finite parts; (0, 0) gives 0. The atan of
// the smaller part over the larger, taken to within pi/8 of 0 or pi/4 (one
// division), by a polynomial of degree 9 fitted there (2.3e-8), then placed
// in its octant.
inline Float4 Atan2(Float4 y, Float4 x) {
    const Float4 ax = Abs4(x);
    const Float4 ay = Abs4(y);
    const Int4 xLarger = ax >= ay;
    const Float4 big = Select4(xLarger, ax, ay);
    const Float4 small = Select4(xLarger, ay, ax);
    const Int4 upper = small > big * 0.41421356f;  // beyond tan(pi/8)
    const Float4 num = Select4(upper, small - big, small);
    const Float4 den = Select4(upper, small + big, big);
    const Float4 t = num / Select4(den > 0.0f, den, Splat(1.0f));
    const Float4 z = t * t;
    const Float4 p = ((7.905837083e-2f * z - 1.382563673e-1f) * z + 1.997201490e-1f) * z - 3.333276141e-1f;
    Float4 angle = t + t * z * p + Select4(upper, Splat(0.78539816f), Splat(0.0f));
    angle = Select4(xLarger, angle, 1.57079633f - angle);
    angle = Select4(x < 0.0f, 3.14159265f - angle, angle);
    return Select4(y < 0.0f, -angle, angle);
}

// sin and cos within 1.2e-7 for |phase| < 8000: reduced by quarter turns
// (pi/2 in three parts, the first two short enough to be multiplied
// exactly), polynomials fitted on [-pi/4, pi/4].
inline void SinCos(Float4 phase, Float4& sine, Float4& cosine) {
    const Float4 quarters = Round4(phase * 0.63661977f);
    const Float4 r = ((phase - quarters * 1.5703125f) - quarters * 4.837512969970703e-4f) - quarters * 7.549790126e-8f;
    const Float4 z = r * r;
    const Float4 s = r + r * z * ((-1.951379832e-4f * z + 8.332124370e-3f) * z - 1.666665330e-1f);
    const Float4 c = 1.0f - 0.5f * z + z * z * ((2.445496825e-5f * z - 1.388750841e-3f) * z + 4.166664965e-2f);
    const Int4 quadrant = __builtin_convertvector(quarters, Int4) & 3;
    const Int4 odd = (quadrant & 1) != 0;
    const Float4 sinOfQuadrant = Select4(odd, c, s);
    const Float4 cosOfQuadrant = Select4(odd, s, c);
    sine = Select4((quadrant & 2) != 0, -sinOfQuadrant, sinOfQuadrant);
    cosine = Select4(((quadrant + 1) & 2) != 0, -cosOfQuadrant, cosOfQuadrant);
}

// ln(x) for normal x > 0 within 1.5e-7 (absolute near 1, relative
// elsewhere): x = 2^e m with m in [sqrt(1/2), sqrt(2)), ln m = 2 atanh(s),
// s = (m - 1) / (m + 1), to s^9.
inline Float4 Log4(Float4 x) {
    const Int4 bits = reinterpret_cast<Int4>(x);
    const Int4 fraction = bits & 0x007fffff;
    const Int4 high = fraction > 0x003504f3;  // mantissa above sqrt(2): halve it
    const Int4 exponent = ((bits >> 23) & 0xff) - 127 - high;
    const Float4 m = reinterpret_cast<Float4>(fraction | (high & 0x3f000000) | (~high & 0x3f800000));
    const Float4 s = (m - 1.0f) / (m + 1.0f);
    const Float4 z = s * s;
    const Float4 series = (((z * (1.0f / 9.0f) + 1.0f / 7.0f) * z + 1.0f / 5.0f) * z + 1.0f / 3.0f) * z + 1.0f;
    return __builtin_convertvector(exponent, Float4) * 0.69314718f + 2.0f * s * series;
}

}  // namespace ora::fft
