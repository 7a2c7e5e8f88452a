// Rotor16, 256-bit form: two vectors of eight lanes.
#include <immintrin.h>

#include "Algorithms/simd/Rotor16Kernels.h"

namespace ora::numeric::kernels {

void Rotor16_m256(Rotor16State& st, float* sines, std::size_t frames) {
    __m256 c0 = _mm256_load_ps(st.c), c1 = _mm256_load_ps(st.c + 8);
    __m256 s0 = _mm256_load_ps(st.s), s1 = _mm256_load_ps(st.s + 8);
    const __m256 rc0 = _mm256_load_ps(st.rc), rc1 = _mm256_load_ps(st.rc + 8);
    const __m256 rs0 = _mm256_load_ps(st.rs), rs1 = _mm256_load_ps(st.rs + 8);
    for (std::size_t f = 0; f < frames; ++f, sines += 16) {
        const __m256 n0 = _mm256_sub_ps(_mm256_mul_ps(c0, rc0), _mm256_mul_ps(s0, rs0));
        const __m256 n1 = _mm256_sub_ps(_mm256_mul_ps(c1, rc1), _mm256_mul_ps(s1, rs1));
        s0 = _mm256_add_ps(_mm256_mul_ps(s0, rc0), _mm256_mul_ps(c0, rs0));
        s1 = _mm256_add_ps(_mm256_mul_ps(s1, rc1), _mm256_mul_ps(c1, rs1));
        c0 = n0;
        c1 = n1;
        _mm256_storeu_ps(sines, s0);
        _mm256_storeu_ps(sines + 8, s1);
    }
    _mm256_store_ps(st.c, c0);
    _mm256_store_ps(st.c + 8, c1);
    _mm256_store_ps(st.s, s0);
    _mm256_store_ps(st.s + 8, s1);
}

}  // namespace ora::numeric::kernels
