// The reducing loops of the vector forms (dot product, matrix-vector
// product, running extremes, true-peak scan), written once over a vector
// type V under the rules of simd/StreamBodies.h. Each keeps the reference
// order of its sums and comparisons, so the forms agree with `ref` bit for
// bit.
#pragma once

#include <cstddef>

namespace ora::numeric::simd {

// v's lanes folded down to the first `Lanes` by fold(v, width), which puts
// the upper half of `width` lanes onto the lower; unrolled, since the widths
// are known.
template <class V, int Lanes, class Fold>
typename V::T FoldTo(typename V::T v, Fold fold) {
    if constexpr (V::kWidth >= 8 && Lanes < 8) v = fold(v, 8);
    if constexpr (V::kWidth >= 4 && Lanes < 4) v = fold(v, 4);
    if constexpr (V::kWidth >= 2 && Lanes < 2) v = fold(v, 2);
    return v;
}

// Eight partial sums s[i % 8], (s_k + s_k+4) folded as ((t0 + t2) + (t1 + t3)),
// then the rest one by one: kDotPartials / W vectors carry the partials.
constexpr std::size_t kDotPartials = 8;

template <class V>
float Dot(const float* x, const float* y, std::size_t n) {
    constexpr std::size_t W = V::kWidth, kVectors = kDotPartials / W;
    typename V::T acc[kVectors];
    for (std::size_t v = 0; v < kVectors; ++v) acc[v] = V::Zero();
    std::size_t i = 0;
    for (; i + kDotPartials <= n; i += kDotPartials)
        for (std::size_t v = 0; v < kVectors; ++v)
            acc[v] = V::Add(acc[v], V::Mul(V::Load(x + i + v * W), V::Load(y + i + v * W)));
    typename V::T t = acc[0];
    for (std::size_t v = 1; v < kVectors; ++v) t = V::Add(t, acc[v]);
    float sum = V::First(FoldTo<V, 1>(t, [](auto v, int width) { return V::FoldAdd(v, width); }));
    for (; i < n; ++i) sum += x[i] * y[i];
    return sum;
}

// Rows from `r` on, a vector of rows at a time; returns the first row left.
template <class V>
std::size_t GemvRows(const float* a, std::size_t r, std::size_t rows, std::size_t cols, std::size_t stride,
                     const float* x, float* y) {
    constexpr std::size_t W = V::kWidth;
    for (; r + W <= rows; r += W) {
        typename V::T acc = V::Zero();
        for (std::size_t c = 0; c < cols; ++c) acc = V::Add(acc, V::Mul(V::Load(a + c * stride + r), V::Set1(x[c])));
        V::Store(y + r, acc);
    }
    return r;
}

// y = A x, column-major; the rows left by V go through Narrow, then one by one.
template <class V, class Narrow = V>
void Gemv(const float* a, std::size_t rows, std::size_t cols, std::size_t stride, const float* x, float* y) {
    std::size_t r = GemvRows<V>(a, 0, rows, cols, stride, x, y);
    if constexpr (Narrow::kWidth < V::kWidth) r = GemvRows<Narrow>(a, r, rows, cols, stride, x, y);
    for (; r < rows; ++r) {
        float acc = 0.0f;
        for (std::size_t c = 0; c < cols; ++c) acc += a[c * stride + r] * x[c];
        y[r] = acc;
    }
}

// Merges the extremes of `frames` frames of C interleaved channels into mn[]
// and mx[]. Lanes hold the channels repeated; Min(v, held) keeps the held
// value for a NaN sample, as the reference's comparisons do.
template <class V, int C>
void FindMinMaxOf(const float* x, std::size_t frames, float* mn, float* mx) {
    constexpr int W = V::kWidth;
    const std::size_t values = frames * C;
    typename V::T lo = V::LoadRepeated(mn, C), hi = V::LoadRepeated(mx, C);
    std::size_t i = 0;
    for (; i + W <= values; i += W) {
        const typename V::T v = V::Load(x + i);
        lo = V::Min(v, lo);
        hi = V::Max(v, hi);
    }
    V::StoreFirst(mn, FoldTo<V, C>(lo, [](auto v, int width) { return V::FoldMin(v, width); }), C);
    V::StoreFirst(mx, FoldTo<V, C>(hi, [](auto v, int width) { return V::FoldMax(v, width); }), C);
    for (; i < values; ++i) {
        const std::size_t c = i % C;
        if (x[i] < mn[c]) mn[c] = x[i];
        if (x[i] > mx[c]) mx[c] = x[i];
    }
}

// One, two or four channels.
template <class V>
void FindMinMax(const float* x, std::size_t frames, int channels, float* mn, float* mx) {
    if (channels == 1) return FindMinMaxOf<V, 1>(x, frames, mn, mx);
    if (channels == 2) return FindMinMaxOf<V, 2>(x, frames, mn, mx);
    FindMinMaxOf<V, 4>(x, frames, mn, mx);
}

// Largest magnitude of points[1..middles], each local maximum raised to the
// vertex of the parabola through it and its neighbours; `peak` is merged.
template <class V>
float TruePeakScan(const float* points, std::size_t middles, float peak) {
    constexpr std::size_t W = V::kWidth;
    const typename V::T zero = V::Zero(), eight = V::Set1(8.0f);
    typename V::T best = V::Set1(peak);
    std::size_t i = 1;
    for (; i + W <= middles + 1; i += W) {
        const typename V::T a = V::Abs(V::Load(points + i - 1));
        const typename V::T b = V::Abs(V::Load(points + i));
        const typename V::T c = V::Abs(V::Load(points + i + 1));
        const typename V::T d = V::Add(V::Sub(b, a), V::Sub(b, c));
        const typename V::T t = V::Sub(c, a);
        const typename V::T vertex = V::Add(b, V::Div(V::Mul(t, t), V::Mul(eight, d)));
        const typename V::T isPeak = V::And(V::And(V::Ge(b, a), V::Ge(b, c)), V::Gt(d, zero));
        best = V::Max(V::Select(isPeak, vertex, b), best);
    }
    peak = V::First(FoldTo<V, 1>(best, [](auto v, int width) { return V::FoldMax(v, width); }));
    for (; i <= middles; ++i) {
        const float a = __builtin_fabsf(points[i - 1]);
        const float b = __builtin_fabsf(points[i]);
        const float c = __builtin_fabsf(points[i + 1]);
        const float d = (b - a) + (b - c);
        float v = b;
        if (b >= a && b >= c && d > 0.0f) v = b + (c - a) * (c - a) / (8.0f * d);
        if (v > peak) peak = v;
    }
    return peak;
}

}  // namespace ora::numeric::simd
