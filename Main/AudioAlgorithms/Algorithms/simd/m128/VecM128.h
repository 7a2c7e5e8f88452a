// 128-bit vector operations for the shared kernel bodies (simd/VectorBodies.h,
// simd/FilterBodies.h).
// Included only by sources compiled for SSE; the fused type only where FMA is
// enabled. Types are local to each source, so bodies never mix forms.
#pragma once

#include <immintrin.h>

namespace {

struct VecM128 {
    using T = __m128;
    static constexpr int kWidth = 4;
    static T Zero() { return _mm_setzero_ps(); }
    static T Set1(float v) { return _mm_set1_ps(v); }
    static T Load(const float* p) { return _mm_loadu_ps(p); }
    static void Store(float* p, T v) { _mm_storeu_ps(p, v); }
    static T Add(T a, T b) { return _mm_add_ps(a, b); }
    static T Sub(T a, T b) { return _mm_sub_ps(a, b); }
    static T Mul(T a, T b) { return _mm_mul_ps(a, b); }
    // a * b + c, rounded twice.
    static T MulAdd(T a, T b, T c) { return _mm_add_ps(_mm_mul_ps(a, b), c); }
    static float MulAddScalar(float a, float b, float c) { return a * b + c; }
    // The points of kWidth inputs, one vector per phase, stored in time
    // order: (p0 p1 p2 p3) of each input, in input order.
    static void StoreTimeOrdered(T p0, T p1, T p2, T p3, float* out) {
        _MM_TRANSPOSE4_PS(p0, p1, p2, p3);
        _mm_storeu_ps(out, p0);
        _mm_storeu_ps(out + 4, p1);
        _mm_storeu_ps(out + 8, p2);
        _mm_storeu_ps(out + 12, p3);
    }
};

#ifdef __FMA__
struct VecM128Fma : VecM128 {
    // a * b + c, rounded once.
    static T MulAdd(T a, T b, T c) { return _mm_fmadd_ps(a, b, c); }
    static float MulAddScalar(float a, float b, float c) { return __builtin_fmaf(a, b, c); }
};
#endif

}  // namespace
