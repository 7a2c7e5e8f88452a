// Rotor16, 128-bit form: four vectors of four lanes.
#include <xmmintrin.h>

#include "Algorithms/simd/Rotor16Kernels.h"

namespace ora::numeric::kernels {

namespace {

// One vector of four lanes, one frame.
inline __m128 Step(__m128& c, __m128& s, __m128 rc, __m128 rs) {
    const __m128 next = _mm_sub_ps(_mm_mul_ps(c, rc), _mm_mul_ps(s, rs));
    s = _mm_add_ps(_mm_mul_ps(s, rc), _mm_mul_ps(c, rs));
    c = next;
    return s;
}

}  // namespace

void Rotor16_m128(Rotor16State& st, float* sines, std::size_t frames) {
    __m128 c0 = _mm_load_ps(st.c), c1 = _mm_load_ps(st.c + 4), c2 = _mm_load_ps(st.c + 8), c3 = _mm_load_ps(st.c + 12);
    __m128 s0 = _mm_load_ps(st.s), s1 = _mm_load_ps(st.s + 4), s2 = _mm_load_ps(st.s + 8), s3 = _mm_load_ps(st.s + 12);
    const __m128 rc0 = _mm_load_ps(st.rc), rc1 = _mm_load_ps(st.rc + 4);
    const __m128 rc2 = _mm_load_ps(st.rc + 8), rc3 = _mm_load_ps(st.rc + 12);
    const __m128 rs0 = _mm_load_ps(st.rs), rs1 = _mm_load_ps(st.rs + 4);
    const __m128 rs2 = _mm_load_ps(st.rs + 8), rs3 = _mm_load_ps(st.rs + 12);
    for (std::size_t f = 0; f < frames; ++f, sines += 16) {
        _mm_storeu_ps(sines, Step(c0, s0, rc0, rs0));
        _mm_storeu_ps(sines + 4, Step(c1, s1, rc1, rs1));
        _mm_storeu_ps(sines + 8, Step(c2, s2, rc2, rs2));
        _mm_storeu_ps(sines + 12, Step(c3, s3, rc3, rs3));
    }
    _mm_store_ps(st.c, c0);
    _mm_store_ps(st.c + 4, c1);
    _mm_store_ps(st.c + 8, c2);
    _mm_store_ps(st.c + 12, c3);
    _mm_store_ps(st.s, s0);
    _mm_store_ps(st.s + 4, s1);
    _mm_store_ps(st.s + 8, s2);
    _mm_store_ps(st.s + 12, s3);
}

}  // namespace ora::numeric::kernels
