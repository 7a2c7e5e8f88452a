// Rotor16, 256-bit form: two vectors of eight lanes.
#include <immintrin.h>

#include "Algorithms/simd/Rotor16Kernels.h"

namespace ora::numeric::kernels {

void Rotor16_m256(Rotor16State& st, float* sines, std::size_t frames) {
    __m256 c[2], s[2], rc[2], rs[2];
    for (int v = 0; v < 2; ++v) {
        c[v] = _mm256_load_ps(st.c + 8 * v);
        s[v] = _mm256_load_ps(st.s + 8 * v);
        rc[v] = _mm256_load_ps(st.rc + 8 * v);
        rs[v] = _mm256_load_ps(st.rs + 8 * v);
    }
    for (std::size_t f = 0; f < frames; ++f, sines += 16) {
        for (int v = 0; v < 2; ++v) {
            const __m256 next = _mm256_sub_ps(_mm256_mul_ps(c[v], rc[v]), _mm256_mul_ps(s[v], rs[v]));
            s[v] = _mm256_add_ps(_mm256_mul_ps(s[v], rc[v]), _mm256_mul_ps(c[v], rs[v]));
            c[v] = next;
            _mm256_storeu_ps(sines + 8 * v, s[v]);
        }
    }
    for (int v = 0; v < 2; ++v) {
        _mm256_store_ps(st.c + 8 * v, c[v]);
        _mm256_store_ps(st.s + 8 * v, s[v]);
    }
}

}  // namespace ora::numeric::kernels
