// random::LCG, 128-bit form: four consecutive states per register, all
// stepped four places at once.
#include <immintrin.h>

#include "Algorithms/simd/LCGKernels.h"

namespace ora::numeric::kernels {

std::uint32_t LCG_m128_sse41(std::uint32_t state, float* out, std::size_t n) {
    constexpr std::size_t kLanes = 4;
    if (n < kLanes) return LCG_ref(state, out, n);
    // lane i holds the state i + 1 steps on; a jump of kLanes steps is
    // state * multiplier^4 + increment * (multiplier^3 + ... + 1).
    alignas(16) std::uint32_t start[kLanes];
    std::uint32_t multiplier = 1;
    std::uint32_t increment = 0;
    for (std::size_t i = 0; i < kLanes; ++i) {
        multiplier *= kLcgMultiplier;
        increment = increment * kLcgMultiplier + kLcgIncrement;
        start[i] = state * multiplier + increment;
    }
    const __m128i jumpMultiplier = _mm_set1_epi32(static_cast<int>(multiplier));
    const __m128i jumpIncrement = _mm_set1_epi32(static_cast<int>(increment));
    const __m128 scale = _mm_set1_ps(kLcgScale);
    __m128i lanes = _mm_load_si128(reinterpret_cast<const __m128i*>(start));
    std::size_t i = 0;
    for (; i + kLanes <= n; i += kLanes) {
        _mm_storeu_ps(out + i, _mm_mul_ps(_mm_cvtepi32_ps(lanes), scale));
        state = static_cast<std::uint32_t>(_mm_extract_epi32(lanes, 3));
        lanes = _mm_add_epi32(_mm_mullo_epi32(lanes, jumpMultiplier), jumpIncrement);
    }
    return LCG_ref(state, out + i, n - i);
}

}  // namespace ora::numeric::kernels
