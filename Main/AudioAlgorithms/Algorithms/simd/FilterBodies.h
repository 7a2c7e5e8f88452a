// The filter and correlation loops of the vector forms, written once over a
// vector type V (VecM128, VecM128Fma, VecM256, VecM256Fma). Free of
// intrinsics: each form's source includes its own V and instantiates these
// templates, so every instantiation has internal linkage and is compiled for
// that form's instruction set only.
//
// Every loop sums in the order of the reference loop (term by term, starting
// from zero), so that the plain forms give the reference result bit for bit.
#pragma once

#include <cstddef>

namespace ora::numeric::simd {

// out[n] = sum_j reversed[j] * run[n + j]
template <class V>
void FirOne(const float* run, const float* reversed, std::size_t taps, float* out, std::size_t frames) {
    constexpr std::size_t W = V::kWidth;
    std::size_t n = 0;
    // Four independent sums hide the latency of the multiply-add.
    for (; n + 4 * W <= frames; n += 4 * W) {
        typename V::T a0 = V::Zero(), a1 = V::Zero(), a2 = V::Zero(), a3 = V::Zero();
        for (std::size_t j = 0; j < taps; ++j) {
            const typename V::T h = V::Set1(reversed[j]);
            const float* x = run + n + j;
            a0 = V::MulAdd(h, V::Load(x), a0);
            a1 = V::MulAdd(h, V::Load(x + W), a1);
            a2 = V::MulAdd(h, V::Load(x + 2 * W), a2);
            a3 = V::MulAdd(h, V::Load(x + 3 * W), a3);
        }
        V::Store(out + n, a0);
        V::Store(out + n + W, a1);
        V::Store(out + n + 2 * W, a2);
        V::Store(out + n + 3 * W, a3);
    }
    for (; n + W <= frames; n += W) {
        typename V::T a0 = V::Zero();
        for (std::size_t j = 0; j < taps; ++j) a0 = V::MulAdd(V::Set1(reversed[j]), V::Load(run + n + j), a0);
        V::Store(out + n, a0);
    }
    for (; n < frames; ++n) {
        float acc = 0.0f;
        for (std::size_t j = 0; j < taps; ++j) acc = V::MulAddScalar(reversed[j], run[n + j], acc);
        out[n] = acc;
    }
}

// Two channels through the same taps: one broadcast feeds both.
template <class V>
void FirTwo(const float* run0, const float* run1, const float* reversed, std::size_t taps, float* out0, float* out1,
            std::size_t frames) {
    constexpr std::size_t W = V::kWidth;
    std::size_t n = 0;
    for (; n + W <= frames; n += W) {
        typename V::T a0 = V::Zero(), a1 = V::Zero();
        for (std::size_t j = 0; j < taps; ++j) {
            const typename V::T h = V::Set1(reversed[j]);
            a0 = V::MulAdd(h, V::Load(run0 + n + j), a0);
            a1 = V::MulAdd(h, V::Load(run1 + n + j), a1);
        }
        V::Store(out0 + n, a0);
        V::Store(out1 + n, a1);
    }
    for (; n < frames; ++n) {
        float acc0 = 0.0f, acc1 = 0.0f;
        for (std::size_t j = 0; j < taps; ++j) {
            acc0 = V::MulAddScalar(reversed[j], run0[n + j], acc0);
            acc1 = V::MulAddScalar(reversed[j], run1[n + j], acc1);
        }
        out0[n] = acc0;
        out1[n] = acc1;
    }
}

// Symmetric taps: out[n] = sum_j half[j] * (run[n + j] + run[n + length - 1 - j]),
// plus the middle tap last when the length is odd.
template <class V>
void FirSymmetricOne(const float* run, const float* half, std::size_t length, float* out, std::size_t frames) {
    constexpr std::size_t W = V::kWidth;
    const std::size_t pairs = length / 2;
    const bool middle = (length % 2) != 0;
    std::size_t n = 0;
    for (; n + W <= frames; n += W) {
        typename V::T acc = V::Zero();
        for (std::size_t j = 0; j < pairs; ++j)
            acc = V::MulAdd(V::Set1(half[j]), V::Add(V::Load(run + n + j), V::Load(run + n + length - 1 - j)), acc);
        if (middle) acc = V::MulAdd(V::Set1(half[pairs]), V::Load(run + n + pairs), acc);
        V::Store(out + n, acc);
    }
    for (; n < frames; ++n) {
        float acc = 0.0f;
        for (std::size_t j = 0; j < pairs; ++j)
            acc = V::MulAddScalar(half[j], run[n + j] + run[n + length - 1 - j], acc);
        if (middle) acc = V::MulAddScalar(half[pairs], run[n + pairs], acc);
        out[n] = acc;
    }
}

template <class V>
void FirSymmetricTwo(const float* run0, const float* run1, const float* half, std::size_t length, float* out0,
                     float* out1, std::size_t frames) {
    constexpr std::size_t W = V::kWidth;
    const std::size_t pairs = length / 2;
    const bool middle = (length % 2) != 0;
    std::size_t n = 0;
    for (; n + W <= frames; n += W) {
        typename V::T a0 = V::Zero(), a1 = V::Zero();
        for (std::size_t j = 0; j < pairs; ++j) {
            const typename V::T h = V::Set1(half[j]);
            a0 = V::MulAdd(h, V::Add(V::Load(run0 + n + j), V::Load(run0 + n + length - 1 - j)), a0);
            a1 = V::MulAdd(h, V::Add(V::Load(run1 + n + j), V::Load(run1 + n + length - 1 - j)), a1);
        }
        if (middle) {
            const typename V::T h = V::Set1(half[pairs]);
            a0 = V::MulAdd(h, V::Load(run0 + n + pairs), a0);
            a1 = V::MulAdd(h, V::Load(run1 + n + pairs), a1);
        }
        V::Store(out0 + n, a0);
        V::Store(out1 + n, a1);
    }
    if (n < frames) {
        FirSymmetricOne<V>(run0 + n, half, length, out0 + n, frames - n);
        FirSymmetricOne<V>(run1 + n, half, length, out1 + n, frames - n);
    }
}

// Four points per input in time order: the input itself, delayed, then the
// three interpolating phases.
template <class V>
void UpsampleTruePeak(const float* run, const float* phases, std::size_t taps, float* out, std::size_t frames) {
    constexpr std::size_t W = V::kWidth;
    const std::size_t identity = taps / 2 - 1;
    std::size_t n = 0;
    // Two groups of inputs at once: six independent sums hide the latency of
    // the multiply-add.
    for (; n + 2 * W <= frames; n += 2 * W) {
        typename V::T a1 = V::Zero(), a2 = V::Zero(), a3 = V::Zero();
        typename V::T b1 = V::Zero(), b2 = V::Zero(), b3 = V::Zero();
        for (std::size_t j = 0; j < taps; ++j) {
            const typename V::T x = V::Load(run + n + j);
            const typename V::T y = V::Load(run + n + W + j);
            const typename V::T h1 = V::Set1(phases[j]);
            const typename V::T h2 = V::Set1(phases[taps + j]);
            const typename V::T h3 = V::Set1(phases[2 * taps + j]);
            a1 = V::MulAdd(h1, x, a1);
            b1 = V::MulAdd(h1, y, b1);
            a2 = V::MulAdd(h2, x, a2);
            b2 = V::MulAdd(h2, y, b2);
            a3 = V::MulAdd(h3, x, a3);
            b3 = V::MulAdd(h3, y, b3);
        }
        V::StoreTimeOrdered(V::Load(run + n + identity), a1, a2, a3, out + 4 * n);
        V::StoreTimeOrdered(V::Load(run + n + W + identity), b1, b2, b3, out + 4 * (n + W));
    }
    for (; n + W <= frames; n += W) {
        typename V::T p1 = V::Zero(), p2 = V::Zero(), p3 = V::Zero();
        for (std::size_t j = 0; j < taps; ++j) {
            const typename V::T x = V::Load(run + n + j);
            p1 = V::MulAdd(V::Set1(phases[j]), x, p1);
            p2 = V::MulAdd(V::Set1(phases[taps + j]), x, p2);
            p3 = V::MulAdd(V::Set1(phases[2 * taps + j]), x, p3);
        }
        V::StoreTimeOrdered(V::Load(run + n + identity), p1, p2, p3, out + 4 * n);
    }
    for (; n < frames; ++n) {
        out[4 * n] = run[n + identity];
        for (std::size_t p = 0; p < 3; ++p) {
            float acc = 0.0f;
            for (std::size_t j = 0; j < taps; ++j) acc = V::MulAddScalar(phases[p * taps + j], run[n + j], acc);
            out[4 * n + 1 + p] = acc;
        }
    }
}

// G vectors of lags from `first` on. Each x[n] broadcast once feeds them all
// while every lane has the term; then each vector goes on alone while all of
// its lanes have it, and each lane adds the few terms only its lag has, in
// the same order.
template <class V, std::size_t G>
void AutoCorrelateLags(const float* x, std::size_t frames, float* r, std::size_t first) {
    constexpr std::size_t W = V::kWidth;
    // Terms n < Common(lag) exist for every lane of the vector of lags from `lag`.
    const auto common = [frames](std::size_t lastLag) { return frames > lastLag ? frames - lastLag : 0; };
    const std::size_t shared = common(first + G * W - 1);
    typename V::T acc[G];
    for (std::size_t g = 0; g < G; ++g) acc[g] = V::Zero();
    for (std::size_t n = 0; n < shared; ++n) {
        const typename V::T xn = V::Set1(x[n]);
        for (std::size_t g = 0; g < G; ++g) acc[g] = V::MulAdd(xn, V::Load(x + n + first + g * W), acc[g]);
    }
    for (std::size_t g = 0; g < G; ++g) {
        const std::size_t lag = first + g * W, own = common(lag + W - 1);
        for (std::size_t n = shared; n < own; ++n) acc[g] = V::MulAdd(V::Set1(x[n]), V::Load(x + n + lag), acc[g]);
        V::Store(r + lag, acc[g]);
        for (std::size_t j = 0; j < W; ++j) {
            float sum = r[lag + j];
            for (std::size_t n = own; n + lag + j < frames; ++n) sum = V::MulAddScalar(x[n], x[n + lag + j], sum);
            r[lag + j] = sum;
        }
    }
}

// r[k] = sum_{n < frames - k} x[n] x[n + k] for k < lags, summed in n order.
template <class V>
void AutoCorrelate(const float* x, std::size_t frames, float* r, std::size_t lags) {
    constexpr std::size_t W = V::kWidth;
    std::size_t k = 0;
    // Eight vectors of lags at once keep both multiply-add units busy; short
    // lag counts (linear prediction) still take two.
    for (; k + 8 * W <= lags; k += 8 * W) AutoCorrelateLags<V, 8>(x, frames, r, k);
    for (; k + 2 * W <= lags; k += 2 * W) AutoCorrelateLags<V, 2>(x, frames, r, k);
    for (; k + W <= lags; k += W) AutoCorrelateLags<V, 1>(x, frames, r, k);
    for (; k < lags; ++k) {
        float sum = 0.0f;
        for (std::size_t n = 0; n + k < frames; ++n) sum = V::MulAddScalar(x[n], x[n + k], sum);
        r[k] = sum;
    }
}

}  // namespace ora::numeric::simd
