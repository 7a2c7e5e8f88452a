// 128-bit vector operations for the shared kernel bodies (simd/*Bodies.h).
// Included only by sources compiled for SSE; the fused type only where FMA is
// enabled, the integer type only where SSE4.1 is. Types are local to each
// source, so bodies never mix forms.
#pragma once

#include <immintrin.h>

#include <cstdint>

namespace {

struct VecM128 {
    using T = __m128;
    using I = __m128i;
    static constexpr int kWidth = 4;
    static T Zero() { return _mm_setzero_ps(); }
    static T Set1(float v) { return _mm_set1_ps(v); }
    static T Bits(std::uint32_t bits) { return _mm_castsi128_ps(_mm_set1_epi32(static_cast<int>(bits))); }
    static T Load(const float* p) { return _mm_loadu_ps(p); }
    static void Store(float* p, T v) { _mm_storeu_ps(p, v); }
    static float First(T v) { return _mm_cvtss_f32(v); }
    // p[0 .. count) repeated across the lanes, and stored back from the
    // first lanes; count 1, 2 or 4.
    static T LoadRepeated(const float* p, int count) {
        if (count == 1) return _mm_set1_ps(p[0]);
        if (count == 4) return _mm_loadu_ps(p);
        const __m128 pair = _mm_castsi128_ps(_mm_loadl_epi64(reinterpret_cast<const __m128i*>(p)));
        return _mm_movelh_ps(pair, pair);
    }
    static void StoreFirst(float* p, T v, int count) {
        if (count == 1) return _mm_store_ss(p, v);
        if (count == 2) return _mm_storel_pi(reinterpret_cast<__m64*>(p), v);
        _mm_storeu_ps(p, v);
    }

    static T Add(T a, T b) { return _mm_add_ps(a, b); }
    static T Sub(T a, T b) { return _mm_sub_ps(a, b); }
    static T Mul(T a, T b) { return _mm_mul_ps(a, b); }
    static T Div(T a, T b) { return _mm_div_ps(a, b); }
    static T Sqrt(T a) { return _mm_sqrt_ps(a); }
    // a * b + c, rounded twice.
    static T MulAdd(T a, T b, T c) { return _mm_add_ps(_mm_mul_ps(a, b), c); }
    static float MulAddScalar(float a, float b, float c) { return a * b + c; }
    // a < b ? a : b and a > b ? a : b: a NaN in either gives b.
    static T Min(T a, T b) { return _mm_min_ps(a, b); }
    static T Max(T a, T b) { return _mm_max_ps(a, b); }

    static T And(T a, T b) { return _mm_and_ps(a, b); }
    static T Or(T a, T b) { return _mm_or_ps(a, b); }
    static T Xor(T a, T b) { return _mm_xor_ps(a, b); }
    static T Abs(T a) { return _mm_andnot_ps(_mm_set1_ps(-0.0f), a); }
    // All-ones lanes where true; false where a NaN takes part (Ordered: true
    // where neither is NaN).
    static T Lt(T a, T b) { return _mm_cmplt_ps(a, b); }
    static T Gt(T a, T b) { return _mm_cmpgt_ps(a, b); }
    static T Ge(T a, T b) { return _mm_cmpge_ps(a, b); }
    static T Eq(T a, T b) { return _mm_cmpeq_ps(a, b); }
    static T Ordered(T a, T b) { return _mm_cmpord_ps(a, b); }
    // mask ? a : b
    static T Select(T mask, T a, T b) { return _mm_or_ps(_mm_and_ps(mask, a), _mm_andnot_ps(mask, b)); }

    // 32-bit integer lanes.
    static I Set1Int(std::uint32_t v) { return _mm_set1_epi32(static_cast<int>(v)); }
    static I LoadInt(const std::int32_t* p) { return _mm_loadu_si128(reinterpret_cast<const __m128i*>(p)); }
    static void StoreInt(std::int32_t* p, I v) { _mm_storeu_si128(reinterpret_cast<__m128i*>(p), v); }
    // Rounded to nearest, ties to even.
    static I RoundToInt(T a) { return _mm_cvtps_epi32(a); }
    static T ToFloat(I a) { return _mm_cvtepi32_ps(a); }
    // Toward zero, as a float (within the int32 range).
    static T Truncate(T a) { return _mm_cvtepi32_ps(_mm_cvttps_epi32(a)); }
    // Every lane of a comparison is true.
    static bool All(T mask) { return _mm_movemask_ps(mask) == 0xF; }
    static I AsInt(T a) { return _mm_castps_si128(a); }
    static T AsFloat(I a) { return _mm_castsi128_ps(a); }

    // The upper half of the first `width` lanes folded onto the lower half.
    static T Upper(T v, int width) { return width == 4 ? _mm_movehl_ps(v, v) : _mm_shuffle_ps(v, v, 1); }
    static T FoldAdd(T v, int width) { return _mm_add_ps(v, Upper(v, width)); }
    static T FoldMin(T v, int width) { return _mm_min_ps(v, Upper(v, width)); }
    static T FoldMax(T v, int width) { return _mm_max_ps(v, Upper(v, width)); }

    // (a0 b0 a1 b1) (a2 b2 a3 b3) and back.
    static void Interleave(T a, T b, T& low, T& high) {
        low = _mm_unpacklo_ps(a, b);
        high = _mm_unpackhi_ps(a, b);
    }
    static void Deinterleave(T low, T high, T& a, T& b) {
        a = _mm_shuffle_ps(low, high, _MM_SHUFFLE(2, 0, 2, 0));
        b = _mm_shuffle_ps(low, high, _MM_SHUFFLE(3, 1, 3, 1));
    }
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

#ifdef __SSE4_1__
// 32-bit integer arithmetic, modulo 2^32.
struct VecM128Sse41 : VecM128 {
    static I AddInt(I a, I b) { return _mm_add_epi32(a, b); }
    static I MulInt(I a, I b) { return _mm_mullo_epi32(a, b); }
    static std::uint32_t LastInt(I v) { return static_cast<std::uint32_t>(_mm_extract_epi32(v, 3)); }
};
#endif

}  // namespace
