// Kernel bodies shared by the vector forms, written once over a vector type V
// (VecM128, VecM128Fma, VecM256, VecM256Fma). Free of intrinsics: each form's
// source includes its own V and instantiates these templates, so every
// instantiation is compiled for that form's instruction set only.
#pragma once

#include <cstddef>

#include "Algorithms/Downsampler.h"
#include "Algorithms/Lpf16.h"
#include "Algorithms/Lpfm16.h"
#include "Algorithms/Upsampler.h"

namespace ora::numeric::simd {

template <class V>
class Lpf16Vec final : public Lpf16Impl {
public:
    void Process(Lpf16State& state, const float* in, float* out, std::size_t frames) const noexcept override {
        constexpr int kVectors = static_cast<int>(kLaneCount) / V::kWidth;
        typename V::T s[kVectors], c[kVectors], g[kVectors];
        for (int v = 0; v < kVectors; ++v) {
            s[v] = V::Load(state.s + v * V::kWidth);
            c[v] = V::Load(state.c + v * V::kWidth);
            g[v] = V::Load(state.g + v * V::kWidth);
        }
        const typename V::T guard = V::Set1(kDenormalGuard);
        for (std::size_t f = 0; f < frames; ++f, in += kLaneCount, out += kLaneCount) {
            for (int v = 0; v < kVectors; ++v) {
                const typename V::T m = V::Load(in + v * V::kWidth);
                typename V::T y = V::MulAdd(c[v], V::Sub(m, s[v]), m);
                y = V::Sub(V::Add(y, guard), guard);
                s[v] = y;
                V::Store(out + v * V::kWidth, V::Mul(y, g[v]));
            }
        }
        for (int v = 0; v < kVectors; ++v) V::Store(state.s + v * V::kWidth, s[v]);
    }
};

template <class V>
class Lpfm16Vec final : public Lpfm16Impl {
public:
    void Process(Lpfm16State& state, const float* in, float* out, std::size_t frames) const noexcept override {
        constexpr int kVectors = static_cast<int>(kLaneCount) / V::kWidth;
        typename V::T s[kVectors], c[kVectors];
        for (int v = 0; v < kVectors; ++v) {
            s[v] = V::Load(state.s + v * V::kWidth);
            c[v] = V::Load(state.c + v * V::kWidth);
        }
        const typename V::T guard = V::Set1(kDenormalGuard);
        for (std::size_t f = 0; f < frames; ++f, in += kLaneCount, out += kLaneCount) {
            for (int v = 0; v < kVectors; ++v) {
                const typename V::T x = V::Load(in + v * V::kWidth);
                typename V::T y = V::MulAdd(c[v], V::Sub(x, s[v]), x);
                y = V::Sub(V::Add(y, guard), guard);
                s[v] = y;
                V::Store(out + v * V::kWidth, y);
            }
        }
        for (int v = 0; v < kVectors; ++v) V::Store(state.s + v * V::kWidth, s[v]);
    }
};

// Each of `frames` inputs L times in a row, L a constant so that the copies unroll.
template <std::size_t L>
inline void RepeatEach(const float* in, float* out, std::size_t frames) noexcept {
    for (std::size_t n = 0; n < frames; ++n, out += L)
        for (std::size_t j = 0; j < L; ++j) out[j] = in[n];
}

template <class V>
class UpsamplerVec final : public UpsamplerImpl {
public:
    // One channel: phases side by side, each input sample repeated per phase.
    void Process(UpsamplerState& st, const float* in, float* out, std::size_t frames) const noexcept override {
        constexpr std::size_t W = V::kWidth;
        const std::size_t L = st.factor, P = st.taps, w = st.tableWidth;
        float* xe = st.scratch.data();
        float* history = st.history.data();
        for (std::size_t i = 0; i + 1 < P; ++i)
            for (std::size_t j = 0; j < L; ++j) xe[i * L + j] = history[i];
        const std::size_t base = (P - 1) * L;
        switch (L) {
            case 2: RepeatEach<2>(in, xe + base, frames); break;
            case 4: RepeatEach<4>(in, xe + base, frames); break;
            default: RepeatEach<8>(in, xe + base, frames); break;
        }
        const std::size_t outputs = frames * L;
        const float* table = st.table.data();
        // Four groups of outputs at once: four independent sums keep the
        // pipeline busy, and each output is still summed tap by tap.
        std::size_t o0 = 0;
        for (; o0 + 4 * W <= outputs; o0 += 4 * W) {
            typename V::T a0 = V::Zero(), a1 = V::Zero(), a2 = V::Zero(), a3 = V::Zero();
            const float* c0 = table + o0 % w;
            const float* c1 = table + (o0 + W) % w;
            const float* c2 = table + (o0 + 2 * W) % w;
            const float* c3 = table + (o0 + 3 * W) % w;
            const float* x = xe + base + o0;
            for (std::size_t k = 0; k < P; ++k, c0 += w, c1 += w, c2 += w, c3 += w, x -= L) {
                a0 = V::MulAdd(V::Load(c0), V::Load(x), a0);
                a1 = V::MulAdd(V::Load(c1), V::Load(x + W), a1);
                a2 = V::MulAdd(V::Load(c2), V::Load(x + 2 * W), a2);
                a3 = V::MulAdd(V::Load(c3), V::Load(x + 3 * W), a3);
            }
            V::Store(out + o0, a0);
            V::Store(out + o0 + W, a1);
            V::Store(out + o0 + 2 * W, a2);
            V::Store(out + o0 + 3 * W, a3);
        }
        for (; o0 < outputs; o0 += W) {
            const float* coefficients = table + o0 % w;
            const float* x = xe + base + o0;
            typename V::T acc = V::Zero();
            for (std::size_t k = 0; k < P; ++k) acc = V::MulAdd(V::Load(coefficients + k * w), V::Load(x - k * L), acc);
            if (o0 + W <= outputs) {
                V::Store(out + o0, acc);
            } else {
                alignas(64) float last[W];
                V::Store(last, acc);
                for (std::size_t j = 0; o0 + j < outputs; ++j) out[o0 + j] = last[j];
            }
        }
        // The last P - 1 inputs, read ahead of the writes.
        for (std::size_t i = 0; i + 1 < P; ++i) {
            const std::size_t m = frames + i;
            history[i] = m < P - 1 ? history[m] : in[m - (P - 1)];
        }
    }
};

// Each group of M inputs to the M phase streams, the group's last sample
// to phase 0; M a constant so that the copies unroll.
template <std::size_t M>
inline void SplitPhases(const float* in, float* streams, std::size_t stride, std::size_t outputs) noexcept {
    for (std::size_t n = 0; n < outputs; ++n, in += M)
        for (std::size_t p = 0; p < M; ++p) streams[p * stride + n] = in[M - 1 - p];
}

template <class V>
class DownsamplerVec final : public DownsamplerImpl {
public:
    // One channel: the input split into its M phase streams, outputs side by side.
    void Process(DownsamplerState& st, const float* in, float* out, std::size_t frames) const noexcept override {
        constexpr std::size_t W = V::kWidth;
        const std::size_t M = st.factor, Q = st.taps, stride = st.streamStride;
        const std::size_t kept = (Q - 1) * M;
        const std::size_t outputs = frames / M;
        float* history = st.history.data();
        float* streams = st.scratch.data();
        // Phase p holds every M-th sample from M - 1 - p on: the history's, then the block's.
        for (std::size_t p = 0; p < M; ++p) {
            const float* h = history + (M - 1 - p);
            for (std::size_t i = 0; i + 1 < Q; ++i) streams[p * stride + i] = h[i * M];
        }
        float* blockStreams = streams + (Q - 1);
        switch (M) {
            case 2: SplitPhases<2>(in, blockStreams, stride, outputs); break;
            case 4: SplitPhases<4>(in, blockStreams, stride, outputs); break;
            case 8: SplitPhases<8>(in, blockStreams, stride, outputs); break;
            default:
                for (std::size_t p = 0; p < M; ++p)
                    for (std::size_t n = 0; n < outputs; ++n) blockStreams[p * stride + n] = in[n * M + M - 1 - p];
                break;
        }
        const float* table = st.table.data();
        // Four groups of outputs at once, each summed phase by phase, tap by tap.
        std::size_t n0 = 0;
        for (; n0 + 4 * W <= outputs; n0 += 4 * W) {
            typename V::T a0 = V::Zero(), a1 = V::Zero(), a2 = V::Zero(), a3 = V::Zero();
            for (std::size_t p = 0; p < M; ++p) {
                const float* x = streams + p * stride + n0 + Q - 1;
                const float* h = table + p * Q;
                for (std::size_t q = 0; q < Q; ++q, --x) {
                    const typename V::T c = V::Set1(h[q]);
                    a0 = V::MulAdd(c, V::Load(x), a0);
                    a1 = V::MulAdd(c, V::Load(x + W), a1);
                    a2 = V::MulAdd(c, V::Load(x + 2 * W), a2);
                    a3 = V::MulAdd(c, V::Load(x + 3 * W), a3);
                }
            }
            V::Store(out + n0, a0);
            V::Store(out + n0 + W, a1);
            V::Store(out + n0 + 2 * W, a2);
            V::Store(out + n0 + 3 * W, a3);
        }
        for (; n0 < outputs; n0 += W) {
            typename V::T acc = V::Zero();
            for (std::size_t p = 0; p < M; ++p) {
                const float* x = streams + p * stride + n0 + Q - 1;
                const float* h = table + p * Q;
                for (std::size_t q = 0; q < Q; ++q) acc = V::MulAdd(V::Set1(h[q]), V::Load(x - q), acc);
            }
            if (n0 + W <= outputs) {
                V::Store(out + n0, acc);
            } else {
                alignas(64) float last[W];
                V::Store(last, acc);
                for (std::size_t j = 0; n0 + j < outputs; ++j) out[n0 + j] = last[j];
            }
        }
        for (std::size_t i = 0; i < kept; ++i) {
            const std::size_t m = outputs * M + i;
            history[i] = m < kept ? history[m] : in[m - kept];
        }
    }
};

}  // namespace ora::numeric::simd
