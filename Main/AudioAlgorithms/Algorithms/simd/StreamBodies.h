// The streaming loops of the vector forms (element-wise maps, conversions,
// channel layouts, mixing, complex bins, the random generator), written once
// over a vector type V (VecM128, VecM256 and their fused and integer types;
// VecScalar for the `ref` of the families whose element arithmetic is
// shared). Free of intrinsics: each form's source includes its own V and
// instantiates these templates, so every instantiation has internal linkage
// and is compiled for that form's instruction set only. No std:: helper may
// be called here: an inline function emitted in a vector source could be
// the copy every caller links to.
#pragma once

#include <cstddef>
#include <cstdint>

#include "Algorithms/simd/CastFloatInt32Kernels.h"
#include "Algorithms/simd/FuncKernels.h"
#include "Algorithms/simd/LCGKernels.h"
#include "Algorithms/simd/MathBodies.h"
#include "Algorithms/simd/VecKernels.h"

namespace ora::numeric::simd {

// The last partial vector of Stream, `rest` elements from in[k] and out[k],
// through zero-padded copies; out of line, so that the loop of whole
// vectors needs no stack frame.
template <class V, std::size_t Ins, std::size_t Outs, class Op>
__attribute__((noinline)) void StreamTail(const float* const* in, float* const* out, std::size_t rest, const Op& op) {
    typename V::T x[Ins], y[Outs];
    float pad[V::kWidth] = {};
    for (std::size_t k = 0; k < Ins; ++k) {
        for (std::size_t j = 0; j < rest; ++j) pad[j] = in[k][j];
        x[k] = V::Load(pad);
    }
    op(x, y);
    for (std::size_t k = 0; k < Outs; ++k) {
        V::Store(pad, y[k]);
        for (std::size_t j = 0; j < rest; ++j) out[k][j] = pad[j];
    }
}

// op(x, y) maps Ins input vectors to Outs output vectors. Whole vectors are
// read in place; the last partial one goes through zero-padded copies, so
// every element takes the same lane arithmetic. Outputs may be inputs. Ops
// capture scalars, not vectors (their constants are hoisted out of the
// loop), so that handing the op to the tail spills nothing.
template <class V, std::size_t Ins, std::size_t Outs, class Op>
void Stream(const float* const (&in)[Ins], float* const (&out)[Outs], std::size_t n, Op op) {
    constexpr std::size_t W = V::kWidth;
    typename V::T x[Ins], y[Outs];
    std::size_t i = 0;
    for (; i + W <= n; i += W) {
        for (std::size_t k = 0; k < Ins; ++k) x[k] = V::Load(in[k] + i);
        op(x, y);
        for (std::size_t k = 0; k < Outs; ++k) V::Store(out[k] + i, y[k]);
    }
    if (i == n) return;
    const float* tailIn[Ins];
    float* tailOut[Outs];
    for (std::size_t k = 0; k < Ins; ++k) tailIn[k] = in[k] + i;
    for (std::size_t k = 0; k < Outs; ++k) tailOut[k] = out[k] + i;
    StreamTail<V, Ins, Outs>(tailIn, tailOut, n - i, op);
}

// The last partial vector of StreamComplex.
template <class V, std::size_t Outs, class Op>
__attribute__((noinline)) void StreamComplexTail(const float* bins, float* const* out, std::size_t rest,
                                                 const Op& op) {
    constexpr std::size_t W = V::kWidth;
    typename V::T re, im, y[Outs];
    float pad[2 * W] = {};
    for (std::size_t j = 0; j < 2 * rest; ++j) pad[j] = bins[j];
    V::Deinterleave(V::Load(pad), V::Load(pad + W), re, im);
    op(re, im, y);
    for (std::size_t k = 0; k < Outs; ++k) {
        V::Store(pad, y[k]);
        for (std::size_t j = 0; j < rest; ++j) out[k][j] = pad[j];
    }
}

// The same over complex bins (re, im pairs): op(re, im, y).
template <class V, std::size_t Outs, class Op>
void StreamComplex(const float* bins, float* const (&out)[Outs], std::size_t n, Op op) {
    constexpr std::size_t W = V::kWidth;
    typename V::T re, im, y[Outs];
    std::size_t i = 0;
    for (; i + W <= n; i += W) {
        V::Deinterleave(V::Load(bins + 2 * i), V::Load(bins + 2 * i + W), re, im);
        op(re, im, y);
        for (std::size_t k = 0; k < Outs; ++k) V::Store(out[k] + i, y[k]);
    }
    if (i == n) return;
    float* tailOut[Outs];
    for (std::size_t k = 0; k < Outs; ++k) tailOut[k] = out[k] + i;
    StreamComplexTail<V, Outs>(bins + 2 * i, tailOut, n - i, op);
}

// m = (l + r) * 0.5, s = (l - r) * 0.5
template <class V>
void LR2MS(const float* l, const float* r, float* m, float* s, std::size_t frames) {
    Stream<V, 2, 2>({l, r}, {m, s}, frames, [](const auto& x, auto& y) {
        y[0] = V::Mul(V::Add(x[0], x[1]), V::Set1(0.5f));
        y[1] = V::Mul(V::Sub(x[0], x[1]), V::Set1(0.5f));
    });
}

// l = m + s, r = m - s
template <class V>
void MS2LR(const float* m, const float* s, float* l, float* r, std::size_t frames) {
    Stream<V, 2, 2>({m, s}, {l, r}, frames, [](const auto& x, auto& y) {
        y[0] = V::Add(x[0], x[1]);
        y[1] = V::Sub(x[0], x[1]);
    });
}

template <class V>
void Add(const float* a, const float* b, float* out, std::size_t n) {
    Stream<V, 2, 1>({a, b}, {out}, n, [](const auto& x, auto& y) { y[0] = V::Add(x[0], x[1]); });
}

template <class V>
void Subtract(const float* a, const float* b, float* out, std::size_t n) {
    Stream<V, 2, 1>({a, b}, {out}, n, [](const auto& x, auto& y) { y[0] = V::Sub(x[0], x[1]); });
}

template <class V>
void Multiply(const float* a, const float* b, float* out, std::size_t n) {
    Stream<V, 2, 1>({a, b}, {out}, n, [](const auto& x, auto& y) { y[0] = V::Mul(x[0], x[1]); });
}

template <class V>
void Scale(const float* a, float s, float* out, std::size_t n) {
    Stream<V, 1, 1>({a}, {out}, n, [s](const auto& x, auto& y) { y[0] = V::Mul(x[0], V::Set1(s)); });
}

template <class V>
void Abs(const float* a, float* out, std::size_t n) {
    Stream<V, 1, 1>({a}, {out}, n, [](const auto& x, auto& y) { y[0] = V::Abs(x[0]); });
}

// Max(x, lo) is x > lo ? x : lo, which sends NaN to lo as the reference does.
template <class V>
void Clamp(const float* a, float lo, float hi, float* out, std::size_t n) {
    Stream<V, 1, 1>({a}, {out}, n,
                    [lo, hi](const auto& x, auto& y) { y[0] = V::Min(V::Max(x[0], V::Set1(lo)), V::Set1(hi)); });
}

// |x| <= limit passes; a larger finite x is held at the limit with its sign;
// NaN and infinities (false in both ordered comparisons) become 0.
template <class V>
void Sanitize(const float* a, float limit, float* out, std::size_t n) {
    Stream<V, 1, 1>({a}, {out}, n, [limit](const auto& x, auto& y) {
        const auto magnitude = V::Abs(x[0]);
        const auto within = V::Ge(V::Set1(limit), magnitude);
        const auto finite = V::Ge(V::Set1(__FLT_MAX__), magnitude);
        const auto held = V::And(finite, V::Or(V::And(V::Set1(-0.0f), x[0]), V::Set1(limit)));
        y[0] = V::Select(within, x[0], held);
    });
}

template <class V>
constexpr kernels::VecKernels VecTable() {
    return {Add<V>, Subtract<V>, Multiply<V>, Scale<V>, Abs<V>, Clamp<V>, Sanitize<V>};
}

// y += a * x
template <class V>
void Axpy(float a, const float* x, float* y, std::size_t n) {
    Stream<V, 2, 1>({x, y}, {y}, n,
                    [a](const auto& in, auto& out) { out[0] = V::Add(in[1], V::Mul(V::Set1(a), in[0])); });
}

// out[n] = sum_i weights[i] * sources[i][n], in source order.
template <class V>
void Mix(const float* const* sources, const float* weights, std::size_t count, float* out, std::size_t frames) {
    constexpr std::size_t W = V::kWidth;
    std::size_t n = 0;
    if (count == 0) {
        for (; n < frames; ++n) out[n] = 0.0f;
        return;
    }
    for (; n + W <= frames; n += W) {
        typename V::T acc = V::Mul(V::Set1(weights[0]), V::Load(sources[0] + n));
        for (std::size_t i = 1; i < count; ++i)
            acc = V::Add(acc, V::Mul(V::Set1(weights[i]), V::Load(sources[i] + n)));
        V::Store(out + n, acc);
    }
    for (; n < frames; ++n) {
        float acc = weights[0] * sources[0][n];
        for (std::size_t i = 1; i < count; ++i) acc += weights[i] * sources[i][n];
        out[n] = acc;
    }
}

template <class V>
void InterleaveTwo(const float* a, const float* b, float* interleaved, std::size_t frames) {
    constexpr std::size_t W = V::kWidth;
    std::size_t n = 0;
    for (; n + W <= frames; n += W) {
        typename V::T low, high;
        V::Interleave(V::Load(a + n), V::Load(b + n), low, high);
        V::Store(interleaved + 2 * n, low);
        V::Store(interleaved + 2 * n + W, high);
    }
    for (; n < frames; ++n) {
        interleaved[2 * n] = a[n];
        interleaved[2 * n + 1] = b[n];
    }
}

template <class V>
void DeinterleaveTwo(const float* interleaved, float* a, float* b, std::size_t frames) {
    constexpr std::size_t W = V::kWidth;
    std::size_t n = 0;
    for (; n + W <= frames; n += W) {
        typename V::T x, y;
        V::Deinterleave(V::Load(interleaved + 2 * n), V::Load(interleaved + 2 * n + W), x, y);
        V::Store(a + n, x);
        V::Store(b + n, y);
    }
    for (; n < frames; ++n) {
        a[n] = interleaved[2 * n];
        b[n] = interleaved[2 * n + 1];
    }
}

// x * scale, NaN to 0, saturated, rounded to nearest even.
template <class V>
typename V::I ToInt32(typename V::T v, typename V::T factor) {
    v = V::Mul(v, factor);
    v = V::And(v, V::Ordered(v, v));
    return V::RoundToInt(V::Min(V::Max(v, V::Set1(kernels::kInt32Low)), V::Set1(kernels::kInt32High)));
}

template <class V>
__attribute__((noinline)) void FloatToInt32Tail(const float* in, std::int32_t* out, std::size_t i, std::size_t n,
                                                float scale) {
    float pad[V::kWidth] = {};
    std::int32_t result[V::kWidth];
    for (std::size_t j = 0; i + j < n; ++j) pad[j] = in[i + j];
    V::StoreInt(result, ToInt32<V>(V::Load(pad), V::Set1(scale)));
    for (std::size_t j = 0; i + j < n; ++j) out[i + j] = result[j];
}

template <class V>
void FloatToInt32(const float* in, std::int32_t* out, std::size_t n, float scale) {
    constexpr std::size_t W = V::kWidth;
    const typename V::T factor = V::Set1(scale);
    std::size_t i = 0;
    for (; i + W <= n; i += W) V::StoreInt(out + i, ToInt32<V>(V::Load(in + i), factor));
    if (i < n) FloatToInt32Tail<V>(in, out, i, n, scale);
}

template <class V>
void Int32ToFloat(const std::int32_t* in, float* out, std::size_t n, float scale) {
    constexpr std::size_t W = V::kWidth;
    const typename V::T factor = V::Set1(scale);
    std::size_t i = 0;
    for (; i + W <= n; i += W) V::Store(out + i, V::Mul(V::ToFloat(V::LoadInt(in + i)), factor));
    for (; i < n; ++i) out[i] = static_cast<float>(in[i]) * scale;
}

// W consecutive states per vector, all stepped W places at once:
// state * multiplier^W + increment * (multiplier^(W-1) + ... + 1).
template <class V>
std::uint32_t Lcg(std::uint32_t state, float* out, std::size_t n) {
    constexpr std::size_t W = V::kWidth;
    if (n < W) return kernels::LCG_ref(state, out, n);
    std::int32_t start[W];
    std::uint32_t multiplier = 1;
    std::uint32_t increment = 0;
    for (std::size_t i = 0; i < W; ++i) {
        multiplier *= kernels::kLcgMultiplier;
        increment = increment * kernels::kLcgMultiplier + kernels::kLcgIncrement;
        start[i] = static_cast<std::int32_t>(state * multiplier + increment);
    }
    const typename V::I jumpMultiplier = V::Set1Int(multiplier);
    const typename V::I jumpIncrement = V::Set1Int(increment);
    const typename V::T scale = V::Set1(kernels::kLcgScale);
    typename V::I lanes = V::LoadInt(start);
    std::size_t i = 0;
    for (; i + W <= n; i += W) {
        V::Store(out + i, V::Mul(V::ToFloat(lanes), scale));
        state = V::LastInt(lanes);
        lanes = V::AddInt(V::MulInt(lanes, jumpMultiplier), jumpIncrement);
    }
    return kernels::LCG_ref(state, out + i, n - i);
}

// |z|^2 = re * re + im * im
template <class V>
void CSquareMagnitude(const float* bins, float* out, std::size_t n) {
    StreamComplex<V, 1>(bins, {out}, n, [](auto re, auto im, auto& y) { y[0] = V::Add(V::Mul(re, re), V::Mul(im, im)); });
}

template <class V>
void Rect2Polar(const float* bins, float* magnitude, float* phase, std::size_t n) {
    StreamComplex<V, 2>(bins, {magnitude, phase}, n, [](auto re, auto im, auto& y) {
        y[0] = V::Sqrt(V::Add(V::Mul(re, re), V::Mul(im, im)));
        y[1] = Atan2<V>(im, re);
    });
}

// out[i] = F(x[i])
template <class V, typename V::T (*F)(typename V::T)>
void Map(const float* x, float* out, std::size_t n) {
    Stream<V, 1, 1>({x}, {out}, n, [](const auto& in, auto& y) { y[0] = F(in[0]); });
}

template <class V>
constexpr kernels::FuncKernels FuncTable() {
    return {Map<V, Log10<V>>, Map<V, Pow10<V>>, Map<V, Exp<V>>, Map<V, Tanh<V>>, Map<V, V::Sqrt>};
}

// One frame of ModulatedTap, as its reference computes it (a template, so
// each form keeps its own copy).
template <class V>
float ModulatedTapFrame(const float* x, float delay, float depth, float s, float weight, std::ptrdiff_t f) {
    const float swing = depth * s;
    const float p = delay + swing > 1.0f ? delay + swing : 1.0f;
    const auto whole = static_cast<std::ptrdiff_t>(p);
    const float fraction = p - static_cast<float>(whole);
    const float a = x[f - whole];
    const float b = x[f - whole - 1];
    return weight * (a + fraction * (b - a));
}

// ModulatedTap, V::kWidth frames at a time: a run whose whole delay stays
// put (nearly always) is two plain loads; any other goes frame by frame.
template <class V>
void ModulatedTap(const float* x, const float* s, float delay, float depth, float weight, float* out,
                  std::size_t count, bool accumulate) {
    constexpr std::size_t W = V::kWidth;
    const typename V::T one = V::Set1(1.0f), centre = V::Set1(delay), swing = V::Set1(depth), w = V::Set1(weight);
    std::size_t f = 0;
    for (; f + W <= count; f += W) {
        const typename V::T p = V::Max(V::Add(centre, V::Mul(swing, V::Load(s + f))), one);
        const typename V::T whole = V::Truncate(p);
        const float first = V::First(whole);
        if (V::All(V::Eq(whole, V::Set1(first)))) {
            const float* at = x + static_cast<std::ptrdiff_t>(f) - static_cast<std::ptrdiff_t>(first);
            const typename V::T a = V::Load(at), b = V::Load(at - 1);
            typename V::T v = V::Mul(w, V::Add(a, V::Mul(V::Sub(p, whole), V::Sub(b, a))));
            if (accumulate) v = V::Add(V::Load(out + f), v);
            V::Store(out + f, v);
        } else {
            for (std::size_t j = f; j < f + W; ++j) {
                const float v = ModulatedTapFrame<V>(x, delay, depth, s[j], weight, static_cast<std::ptrdiff_t>(j));
                out[j] = accumulate ? out[j] + v : v;
            }
        }
    }
    for (; f < count; ++f) {
        const float v = ModulatedTapFrame<V>(x, delay, depth, s[f], weight, static_cast<std::ptrdiff_t>(f));
        out[f] = accumulate ? out[f] + v : v;
    }
}

}  // namespace ora::numeric::simd
