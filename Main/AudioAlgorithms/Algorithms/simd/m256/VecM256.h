// 256-bit vector operations for the shared kernel bodies (simd/*Bodies.h).
// Included only by sources compiled for AVX; the fused type only where FMA is
// enabled, the integer type only where AVX2 is. Types are local to each
// source, so bodies never mix forms.
#pragma once

#include <immintrin.h>

#include <cstdint>

namespace {

struct VecM256 {
    using T = __m256;
    using I = __m256i;
    static constexpr int kWidth = 8;
    static T Zero() { return _mm256_setzero_ps(); }
    static T Set1(float v) { return _mm256_set1_ps(v); }
    static T Bits(std::uint32_t bits) { return _mm256_castsi256_ps(_mm256_set1_epi32(static_cast<int>(bits))); }
    static T Load(const float* p) { return _mm256_loadu_ps(p); }
    static void Store(float* p, T v) { _mm256_storeu_ps(p, v); }
    static float First(T v) { return _mm256_cvtss_f32(v); }
    static T LoadRepeated(const float* p, int count) {
        if (count == 1) return _mm256_set1_ps(p[0]);
        // One 64-bit load: lanes built from scalars would be stored and read back.
        if (count == 2) return _mm256_castpd_ps(_mm256_broadcast_sd(reinterpret_cast<const double*>(p)));
        return _mm256_broadcast_ps(reinterpret_cast<const __m128*>(p));
    }
    static void StoreFirst(float* p, T v, int count) {
        const __m128 low = _mm256_castps256_ps128(v);
        if (count == 1) return _mm_store_ss(p, low);
        if (count == 2) return _mm_storel_pi(reinterpret_cast<__m64*>(p), low);
        _mm_storeu_ps(p, low);
    }

    static T Add(T a, T b) { return _mm256_add_ps(a, b); }
    static T Sub(T a, T b) { return _mm256_sub_ps(a, b); }
    static T Mul(T a, T b) { return _mm256_mul_ps(a, b); }
    static T Div(T a, T b) { return _mm256_div_ps(a, b); }
    static T Sqrt(T a) { return _mm256_sqrt_ps(a); }
    static T MulAdd(T a, T b, T c) { return _mm256_add_ps(_mm256_mul_ps(a, b), c); }
    static float MulAddScalar(float a, float b, float c) { return a * b + c; }
    static T Min(T a, T b) { return _mm256_min_ps(a, b); }
    static T Max(T a, T b) { return _mm256_max_ps(a, b); }

    static T And(T a, T b) { return _mm256_and_ps(a, b); }
    static T Or(T a, T b) { return _mm256_or_ps(a, b); }
    static T Xor(T a, T b) { return _mm256_xor_ps(a, b); }
    static T Abs(T a) { return _mm256_andnot_ps(_mm256_set1_ps(-0.0f), a); }
    static T Lt(T a, T b) { return _mm256_cmp_ps(a, b, _CMP_LT_OQ); }
    static T Gt(T a, T b) { return _mm256_cmp_ps(a, b, _CMP_GT_OQ); }
    static T Ge(T a, T b) { return _mm256_cmp_ps(a, b, _CMP_GE_OQ); }
    static T Eq(T a, T b) { return _mm256_cmp_ps(a, b, _CMP_EQ_OQ); }
    static T Ordered(T a, T b) { return _mm256_cmp_ps(a, b, _CMP_ORD_Q); }
    // Bitwise: GCC turns a blendv of a comparison into a 256-bit integer
    // sign test, which AVX without AVX2 does lane by lane.
    static T Select(T mask, T a, T b) { return _mm256_or_ps(_mm256_and_ps(mask, a), _mm256_andnot_ps(mask, b)); }

    // Loads, stores and conversions only: integer arithmetic needs AVX2.
    static I Set1Int(std::uint32_t v) { return _mm256_set1_epi32(static_cast<int>(v)); }
    static I LoadInt(const std::int32_t* p) { return _mm256_loadu_si256(reinterpret_cast<const __m256i*>(p)); }
    static void StoreInt(std::int32_t* p, I v) { _mm256_storeu_si256(reinterpret_cast<__m256i*>(p), v); }
    static I RoundToInt(T a) { return _mm256_cvtps_epi32(a); }
    static T ToFloat(I a) { return _mm256_cvtepi32_ps(a); }
    // Toward zero, as a float (within the int32 range).
    static T Truncate(T a) { return _mm256_cvtepi32_ps(_mm256_cvttps_epi32(a)); }
    // Every lane of a comparison is true.
    static bool All(T mask) { return _mm256_movemask_ps(mask) == 0xFF; }
    static I AsInt(T a) { return _mm256_castps_si256(a); }
    static T AsFloat(I a) { return _mm256_castsi256_ps(a); }

    static T Upper(T v, int width) {
        if (width == 8) return _mm256_permute2f128_ps(v, v, 0x01);
        return width == 4 ? _mm256_permute_ps(v, _MM_SHUFFLE(3, 2, 3, 2)) : _mm256_permute_ps(v, 1);
    }
    static T FoldAdd(T v, int width) { return _mm256_add_ps(v, Upper(v, width)); }
    static T FoldMin(T v, int width) { return _mm256_min_ps(v, Upper(v, width)); }
    static T FoldMax(T v, int width) { return _mm256_max_ps(v, Upper(v, width)); }

    static void Interleave(T a, T b, T& low, T& high) {
        const T l = _mm256_unpacklo_ps(a, b);  // a0 b0 a1 b1 | a4 b4 a5 b5
        const T h = _mm256_unpackhi_ps(a, b);  // a2 b2 a3 b3 | a6 b6 a7 b7
        low = _mm256_permute2f128_ps(l, h, 0x20);
        high = _mm256_permute2f128_ps(l, h, 0x31);
    }
    static void Deinterleave(T low, T high, T& a, T& b) {
        const T t0 = _mm256_permute2f128_ps(low, high, 0x20);  // a0 b0 a1 b1 | a4 b4 a5 b5
        const T t1 = _mm256_permute2f128_ps(low, high, 0x31);  // a2 b2 a3 b3 | a6 b6 a7 b7
        a = _mm256_shuffle_ps(t0, t1, _MM_SHUFFLE(2, 0, 2, 0));
        b = _mm256_shuffle_ps(t0, t1, _MM_SHUFFLE(3, 1, 3, 1));
    }
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

#ifdef __AVX2__
struct VecM256Avx2 : VecM256 {
    static I AddInt(I a, I b) { return _mm256_add_epi32(a, b); }
    static I MulInt(I a, I b) { return _mm256_mullo_epi32(a, b); }
    static std::uint32_t LastInt(I v) { return static_cast<std::uint32_t>(_mm256_extract_epi32(v, 7)); }
};
#endif

}  // namespace
