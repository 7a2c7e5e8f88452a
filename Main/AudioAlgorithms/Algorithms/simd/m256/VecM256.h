// 256-bit vector operations for the shared kernel bodies (simd/VectorBodies.h,
// simd/FilterBodies.h).
// Included only by sources compiled for AVX; the fused type only where FMA is
// enabled. Types are local to each source, so bodies never mix forms.
#pragma once

#include <immintrin.h>

namespace {

struct VecM256 {
    using T = __m256;
    static constexpr int kWidth = 8;
    static T Zero() { return _mm256_setzero_ps(); }
    static T Set1(float v) { return _mm256_set1_ps(v); }
    static T Load(const float* p) { return _mm256_loadu_ps(p); }
    static void Store(float* p, T v) { _mm256_storeu_ps(p, v); }
    static T Add(T a, T b) { return _mm256_add_ps(a, b); }
    static T Sub(T a, T b) { return _mm256_sub_ps(a, b); }
    static T Mul(T a, T b) { return _mm256_mul_ps(a, b); }
    static T MulAdd(T a, T b, T c) { return _mm256_add_ps(_mm256_mul_ps(a, b), c); }
    static float MulAddScalar(float a, float b, float c) { return a * b + c; }
    // The points of kWidth inputs, one vector per phase, stored in time
    // order: (p0 p1 p2 p3) of each input, in input order.
    static void StoreTimeOrdered(T p0, T p1, T p2, T p3, float* out) {
        const T t0 = _mm256_unpacklo_ps(p0, p1);
        const T t1 = _mm256_unpackhi_ps(p0, p1);
        const T t2 = _mm256_unpacklo_ps(p2, p3);
        const T t3 = _mm256_unpackhi_ps(p2, p3);
        const T u0 = _mm256_shuffle_ps(t0, t2, _MM_SHUFFLE(1, 0, 1, 0));
        const T u1 = _mm256_shuffle_ps(t0, t2, _MM_SHUFFLE(3, 2, 3, 2));
        const T u2 = _mm256_shuffle_ps(t1, t3, _MM_SHUFFLE(1, 0, 1, 0));
        const T u3 = _mm256_shuffle_ps(t1, t3, _MM_SHUFFLE(3, 2, 3, 2));
        _mm256_storeu_ps(out, _mm256_permute2f128_ps(u0, u1, 0x20));
        _mm256_storeu_ps(out + 8, _mm256_permute2f128_ps(u2, u3, 0x20));
        _mm256_storeu_ps(out + 16, _mm256_permute2f128_ps(u0, u1, 0x31));
        _mm256_storeu_ps(out + 24, _mm256_permute2f128_ps(u2, u3, 0x31));
    }
};

#ifdef __FMA__
struct VecM256Fma : VecM256 {
    static T MulAdd(T a, T b, T c) { return _mm256_fmadd_ps(a, b, c); }
    static float MulAddScalar(float a, float b, float c) { return __builtin_fmaf(a, b, c); }
};
#endif

}  // namespace
