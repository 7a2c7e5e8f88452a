// The filter loops of the 256-bit forms, written once for the plain and the
// fused multiply-add forms; each form's source instantiates them with its
// multiply-add. Included only by sources of this folder. Everything here has
// internal linkage, so that no inline code compiled for AVX can stand in for
// another form's code at link time.
//
// Every loop sums in the order of the reference loop (tap by tap, starting
// from zero), so that the plain form gives the reference result bit for bit.
#pragma once

#include <immintrin.h>

#include <cstddef>

namespace {

struct SeparateMulAdd {
    static __m256 Vector(__m256 a, __m256 b, __m256 acc) { return _mm256_add_ps(acc, _mm256_mul_ps(a, b)); }
    static float Scalar(float a, float b, float acc) { return acc + a * b; }
};

#ifdef __FMA__
struct FusedMulAdd {
    static __m256 Vector(__m256 a, __m256 b, __m256 acc) { return _mm256_fmadd_ps(a, b, acc); }
    static float Scalar(float a, float b, float acc) { return __builtin_fmaf(a, b, acc); }
};
#endif

// out[n] = sum_j reversed[j] * run[n + j]
template <class MulAdd>
void FirOne(const float* run, const float* reversed, std::size_t taps, float* out, std::size_t frames) {
    std::size_t n = 0;
    // Four independent sums hide the latency of the multiply-add.
    for (; n + 32 <= frames; n += 32) {
        __m256 a0 = _mm256_setzero_ps();
        __m256 a1 = _mm256_setzero_ps();
        __m256 a2 = _mm256_setzero_ps();
        __m256 a3 = _mm256_setzero_ps();
        for (std::size_t j = 0; j < taps; ++j) {
            const __m256 h = _mm256_broadcast_ss(reversed + j);
            const float* x = run + n + j;
            a0 = MulAdd::Vector(h, _mm256_loadu_ps(x), a0);
            a1 = MulAdd::Vector(h, _mm256_loadu_ps(x + 8), a1);
            a2 = MulAdd::Vector(h, _mm256_loadu_ps(x + 16), a2);
            a3 = MulAdd::Vector(h, _mm256_loadu_ps(x + 24), a3);
        }
        _mm256_storeu_ps(out + n, a0);
        _mm256_storeu_ps(out + n + 8, a1);
        _mm256_storeu_ps(out + n + 16, a2);
        _mm256_storeu_ps(out + n + 24, a3);
    }
    for (; n + 8 <= frames; n += 8) {
        __m256 a0 = _mm256_setzero_ps();
        for (std::size_t j = 0; j < taps; ++j)
            a0 = MulAdd::Vector(_mm256_broadcast_ss(reversed + j), _mm256_loadu_ps(run + n + j), a0);
        _mm256_storeu_ps(out + n, a0);
    }
    for (; n < frames; ++n) {
        float acc = 0.0f;
        for (std::size_t j = 0; j < taps; ++j) acc = MulAdd::Scalar(reversed[j], run[n + j], acc);
        out[n] = acc;
    }
}

// Two channels through the same taps: one broadcast feeds both.
template <class MulAdd>
void FirTwo(const float* run0, const float* run1, const float* reversed, std::size_t taps, float* out0, float* out1,
            std::size_t frames) {
    std::size_t n = 0;
    for (; n + 8 <= frames; n += 8) {
        __m256 a0 = _mm256_setzero_ps();
        __m256 a1 = _mm256_setzero_ps();
        for (std::size_t j = 0; j < taps; ++j) {
            const __m256 h = _mm256_broadcast_ss(reversed + j);
            a0 = MulAdd::Vector(h, _mm256_loadu_ps(run0 + n + j), a0);
            a1 = MulAdd::Vector(h, _mm256_loadu_ps(run1 + n + j), a1);
        }
        _mm256_storeu_ps(out0 + n, a0);
        _mm256_storeu_ps(out1 + n, a1);
    }
    for (; n < frames; ++n) {
        float acc0 = 0.0f;
        float acc1 = 0.0f;
        for (std::size_t j = 0; j < taps; ++j) {
            acc0 = MulAdd::Scalar(reversed[j], run0[n + j], acc0);
            acc1 = MulAdd::Scalar(reversed[j], run1[n + j], acc1);
        }
        out0[n] = acc0;
        out1[n] = acc1;
    }
}

// Symmetric taps: out[n] = sum_j half[j] * (run[n + j] + run[n + length - 1 - j]),
// plus the middle tap last when the length is odd.
template <class MulAdd>
void FirSymmetricOne(const float* run, const float* half, std::size_t length, float* out, std::size_t frames) {
    const std::size_t pairs = length / 2;
    const bool middle = (length % 2) != 0;
    std::size_t n = 0;
    for (; n + 8 <= frames; n += 8) {
        __m256 acc = _mm256_setzero_ps();
        for (std::size_t j = 0; j < pairs; ++j) {
            const __m256 sum = _mm256_add_ps(_mm256_loadu_ps(run + n + j), _mm256_loadu_ps(run + n + length - 1 - j));
            acc = MulAdd::Vector(_mm256_broadcast_ss(half + j), sum, acc);
        }
        if (middle) acc = MulAdd::Vector(_mm256_broadcast_ss(half + pairs), _mm256_loadu_ps(run + n + pairs), acc);
        _mm256_storeu_ps(out + n, acc);
    }
    for (; n < frames; ++n) {
        float acc = 0.0f;
        for (std::size_t j = 0; j < pairs; ++j)
            acc = MulAdd::Scalar(half[j], run[n + j] + run[n + length - 1 - j], acc);
        if (middle) acc = MulAdd::Scalar(half[pairs], run[n + pairs], acc);
        out[n] = acc;
    }
}

template <class MulAdd>
void FirSymmetricTwo(const float* run0, const float* run1, const float* half, std::size_t length, float* out0,
                     float* out1, std::size_t frames) {
    const std::size_t pairs = length / 2;
    const bool middle = (length % 2) != 0;
    std::size_t n = 0;
    for (; n + 8 <= frames; n += 8) {
        __m256 a0 = _mm256_setzero_ps();
        __m256 a1 = _mm256_setzero_ps();
        for (std::size_t j = 0; j < pairs; ++j) {
            const __m256 h = _mm256_broadcast_ss(half + j);
            a0 = MulAdd::Vector(
                h, _mm256_add_ps(_mm256_loadu_ps(run0 + n + j), _mm256_loadu_ps(run0 + n + length - 1 - j)), a0);
            a1 = MulAdd::Vector(
                h, _mm256_add_ps(_mm256_loadu_ps(run1 + n + j), _mm256_loadu_ps(run1 + n + length - 1 - j)), a1);
        }
        if (middle) {
            const __m256 h = _mm256_broadcast_ss(half + pairs);
            a0 = MulAdd::Vector(h, _mm256_loadu_ps(run0 + n + pairs), a0);
            a1 = MulAdd::Vector(h, _mm256_loadu_ps(run1 + n + pairs), a1);
        }
        _mm256_storeu_ps(out0 + n, a0);
        _mm256_storeu_ps(out1 + n, a1);
    }
    if (n < frames) {
        FirSymmetricOne<MulAdd>(run0 + n, half, length, out0 + n, frames - n);
        FirSymmetricOne<MulAdd>(run1 + n, half, length, out1 + n, frames - n);
    }
}

// The four points of eight inputs, phase by phase, stored in time order:
// (p0 p1 p2 p3) of each input, in input order.
inline void StoreTimeOrdered(__m256 p0, __m256 p1, __m256 p2, __m256 p3, float* out) {
    const __m256 t0 = _mm256_unpacklo_ps(p0, p1);
    const __m256 t1 = _mm256_unpackhi_ps(p0, p1);
    const __m256 t2 = _mm256_unpacklo_ps(p2, p3);
    const __m256 t3 = _mm256_unpackhi_ps(p2, p3);
    const __m256 u0 = _mm256_shuffle_ps(t0, t2, _MM_SHUFFLE(1, 0, 1, 0));
    const __m256 u1 = _mm256_shuffle_ps(t0, t2, _MM_SHUFFLE(3, 2, 3, 2));
    const __m256 u2 = _mm256_shuffle_ps(t1, t3, _MM_SHUFFLE(1, 0, 1, 0));
    const __m256 u3 = _mm256_shuffle_ps(t1, t3, _MM_SHUFFLE(3, 2, 3, 2));
    _mm256_storeu_ps(out, _mm256_permute2f128_ps(u0, u1, 0x20));
    _mm256_storeu_ps(out + 8, _mm256_permute2f128_ps(u2, u3, 0x20));
    _mm256_storeu_ps(out + 16, _mm256_permute2f128_ps(u0, u1, 0x31));
    _mm256_storeu_ps(out + 24, _mm256_permute2f128_ps(u2, u3, 0x31));
}

// Four points per input in time order: the input itself, delayed, then the
// three interpolating phases.
template <class MulAdd>
void UpsampleTruePeak(const float* run, const float* phases, std::size_t taps, float* out, std::size_t frames) {
    const std::size_t identity = taps / 2 - 1;
    std::size_t n = 0;
    // Two groups of inputs at once: six independent sums hide the latency of
    // the multiply-add.
    for (; n + 16 <= frames; n += 16) {
        __m256 a1 = _mm256_setzero_ps(), a2 = _mm256_setzero_ps(), a3 = _mm256_setzero_ps();
        __m256 b1 = _mm256_setzero_ps(), b2 = _mm256_setzero_ps(), b3 = _mm256_setzero_ps();
        for (std::size_t j = 0; j < taps; ++j) {
            const __m256 x = _mm256_loadu_ps(run + n + j);
            const __m256 y = _mm256_loadu_ps(run + n + 8 + j);
            const __m256 h1 = _mm256_broadcast_ss(phases + j);
            const __m256 h2 = _mm256_broadcast_ss(phases + taps + j);
            const __m256 h3 = _mm256_broadcast_ss(phases + 2 * taps + j);
            a1 = MulAdd::Vector(h1, x, a1);
            b1 = MulAdd::Vector(h1, y, b1);
            a2 = MulAdd::Vector(h2, x, a2);
            b2 = MulAdd::Vector(h2, y, b2);
            a3 = MulAdd::Vector(h3, x, a3);
            b3 = MulAdd::Vector(h3, y, b3);
        }
        StoreTimeOrdered(_mm256_loadu_ps(run + n + identity), a1, a2, a3, out + 4 * n);
        StoreTimeOrdered(_mm256_loadu_ps(run + n + 8 + identity), b1, b2, b3, out + 4 * (n + 8));
    }
    for (; n + 8 <= frames; n += 8) {
        __m256 p1 = _mm256_setzero_ps();
        __m256 p2 = _mm256_setzero_ps();
        __m256 p3 = _mm256_setzero_ps();
        for (std::size_t j = 0; j < taps; ++j) {
            const __m256 x = _mm256_loadu_ps(run + n + j);
            p1 = MulAdd::Vector(_mm256_broadcast_ss(phases + j), x, p1);
            p2 = MulAdd::Vector(_mm256_broadcast_ss(phases + taps + j), x, p2);
            p3 = MulAdd::Vector(_mm256_broadcast_ss(phases + 2 * taps + j), x, p3);
        }
        StoreTimeOrdered(_mm256_loadu_ps(run + n + identity), p1, p2, p3, out + 4 * n);
    }
    for (; n < frames; ++n) {
        out[4 * n] = run[n + identity];
        for (std::size_t p = 0; p < 3; ++p) {
            float acc = 0.0f;
            for (std::size_t j = 0; j < taps; ++j) acc = MulAdd::Scalar(phases[p * taps + j], run[n + j], acc);
            out[4 * n + 1 + p] = acc;
        }
    }
}

// Largest magnitude of points[1..middles], each local maximum refined by the
// vertex of the parabola through it and its neighbours; `peak` is merged.
inline float ScanTruePeak(const float* points, std::size_t middles, float peak) {
    const __m256 sign = _mm256_set1_ps(-0.0f);
    const __m256 zero = _mm256_setzero_ps();
    const __m256 eight = _mm256_set1_ps(8.0f);
    __m256 best = _mm256_set1_ps(peak);
    std::size_t i = 1;
    for (; i + 8 <= middles + 1; i += 8) {
        const __m256 a = _mm256_andnot_ps(sign, _mm256_loadu_ps(points + i - 1));
        const __m256 b = _mm256_andnot_ps(sign, _mm256_loadu_ps(points + i));
        const __m256 c = _mm256_andnot_ps(sign, _mm256_loadu_ps(points + i + 1));
        const __m256 d = _mm256_add_ps(_mm256_sub_ps(b, a), _mm256_sub_ps(b, c));
        const __m256 t = _mm256_sub_ps(c, a);
        const __m256 vertex = _mm256_add_ps(b, _mm256_div_ps(_mm256_mul_ps(t, t), _mm256_mul_ps(eight, d)));
        const __m256 isPeak =
            _mm256_and_ps(_mm256_and_ps(_mm256_cmp_ps(b, a, _CMP_GE_OQ), _mm256_cmp_ps(b, c, _CMP_GE_OQ)),
                          _mm256_cmp_ps(d, zero, _CMP_GT_OQ));
        best = _mm256_max_ps(_mm256_blendv_ps(b, vertex, isPeak), best);
    }
    __m128 half = _mm_max_ps(_mm256_castps256_ps128(best), _mm256_extractf128_ps(best, 1));
    half = _mm_max_ps(half, _mm_movehl_ps(half, half));
    half = _mm_max_ss(half, _mm_shuffle_ps(half, half, 1));
    peak = _mm_cvtss_f32(half);
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

}  // namespace
