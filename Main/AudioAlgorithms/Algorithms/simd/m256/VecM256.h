// 256-bit vector operations for the shared kernel bodies (simd/VectorBodies.h).
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
};

#ifdef __FMA__
struct VecM256Fma : VecM256 {
    static T MulAdd(T a, T b, T c) { return _mm256_fmadd_ps(a, b, c); }
};
#endif

}  // namespace
