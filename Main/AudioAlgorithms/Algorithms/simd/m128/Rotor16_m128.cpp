// Rotor16, 128-bit form: four vectors of four lanes.
#include <xmmintrin.h>

#include "Algorithms/simd/Rotor16Kernels.h"

namespace ora::numeric::kernels {

void Rotor16_m128(Rotor16State& st, float* sines, std::size_t frames) {
    __m128 c[4], s[4], rc[4], rs[4];
    for (int v = 0; v < 4; ++v) {
        c[v] = _mm_load_ps(st.c + 4 * v);
        s[v] = _mm_load_ps(st.s + 4 * v);
        rc[v] = _mm_load_ps(st.rc + 4 * v);
        rs[v] = _mm_load_ps(st.rs + 4 * v);
    }
    for (std::size_t f = 0; f < frames; ++f, sines += 16) {
        for (int v = 0; v < 4; ++v) {
            const __m128 next = _mm_sub_ps(_mm_mul_ps(c[v], rc[v]), _mm_mul_ps(s[v], rs[v]));
            s[v] = _mm_add_ps(_mm_mul_ps(s[v], rc[v]), _mm_mul_ps(c[v], rs[v]));
            c[v] = next;
            _mm_storeu_ps(sines + 4 * v, s[v]);
        }
    }
    for (int v = 0; v < 4; ++v) {
        _mm_store_ps(st.c + 4 * v, c[v]);
        _mm_store_ps(st.s + 4 * v, s[v]);
    }
}

}  // namespace ora::numeric::kernels
