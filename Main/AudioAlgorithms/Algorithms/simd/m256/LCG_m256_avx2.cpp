// random::LCG, 256-bit form: eight consecutive states per register, all
// stepped eight places at once.
#include <immintrin.h>

#include "Algorithms/simd/LCGKernels.h"

namespace ora::numeric::kernels {

std::uint32_t LCG_m256_avx2(std::uint32_t state, float* out, std::size_t n) {
    constexpr std::size_t kLanes = 8;
    if (n < kLanes) return LCG_ref(state, out, n);
    // lane i holds the state i + 1 steps on; a jump of kLanes steps is
    // state * multiplier^8 + increment * (multiplier^7 + ... + 1).
    alignas(32) std::uint32_t start[kLanes];
    std::uint32_t multiplier = 1;
    std::uint32_t increment = 0;
    for (std::size_t i = 0; i < kLanes; ++i) {
        multiplier *= kLcgMultiplier;
        increment = increment * kLcgMultiplier + kLcgIncrement;
        start[i] = state * multiplier + increment;
    }
    const __m256i jumpMultiplier = _mm256_set1_epi32(static_cast<int>(multiplier));
    const __m256i jumpIncrement = _mm256_set1_epi32(static_cast<int>(increment));
    const __m256 scale = _mm256_set1_ps(kLcgScale);
    __m256i lanes = _mm256_load_si256(reinterpret_cast<const __m256i*>(start));
    std::size_t i = 0;
    for (; i + kLanes <= n; i += kLanes) {
        _mm256_storeu_ps(out + i, _mm256_mul_ps(_mm256_cvtepi32_ps(lanes), scale));
        state = static_cast<std::uint32_t>(_mm256_extract_epi32(lanes, 7));
        lanes = _mm256_add_epi32(_mm256_mullo_epi32(lanes, jumpMultiplier), jumpIncrement);
    }
    return LCG_ref(state, out + i, n - i);
}

}  // namespace ora::numeric::kernels
