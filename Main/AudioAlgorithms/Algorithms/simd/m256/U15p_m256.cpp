// U15p in 256-bit vectors: eight rows at a time from a doubled copy of the
// frame, so that the cyclic column set becomes seven unaligned loads.
#include <immintrin.h>

#include "Algorithms/U15p.h"

namespace ora::numeric {

namespace {

class U15p_m256 final : public U15pImpl {
public:
    void Process(const float* d, const float* u, float* m, std::size_t frames) const noexcept override {
        const __m256 lastLaneOff = _mm256_castsi256_ps(_mm256_set_epi32(0, -1, -1, -1, -1, -1, -1, -1));
        const __m256 incidence = _mm256_set1_ps(U15p::kIncidenceWeight);
        const __m256 allOnes = _mm256_set1_ps(U15p::kAllOnesWeight);
        alignas(64) float doubled[32];
        for (std::size_t f = 0; f < frames; ++f, d += kLaneCount, u += kLaneCount, m += kLaneCount) {
            const __m256 x0 = _mm256_add_ps(_mm256_loadu_ps(d), _mm256_loadu_ps(u));
            const __m256 x1 = _mm256_and_ps(_mm256_add_ps(_mm256_loadu_ps(d + 8), _mm256_loadu_ps(u + 8)), lastLaneOff);
            const __m256 t8 = _mm256_add_ps(x0, x1);
            const __m128 t4 = _mm_add_ps(_mm256_castps256_ps128(t8), _mm256_extractf128_ps(t8, 1));
            const __m128 t2 = _mm_add_ps(t4, _mm_movehl_ps(t4, t4));
            const __m128 total = _mm_add_ps(_mm_shuffle_ps(t2, t2, _MM_SHUFFLE(0, 0, 0, 0)),
                                            _mm_shuffle_ps(t2, t2, _MM_SHUFFLE(1, 1, 1, 1)));
            const __m256 all = _mm256_mul_ps(allOnes, _mm256_set_m128(total, total));
            _mm256_store_ps(doubled, x0);
            _mm256_store_ps(doubled + 8, x1);
            _mm256_storeu_ps(doubled + 15, x0);
            _mm256_storeu_ps(doubled + 23, x1);
            const __m256 keep15 = _mm256_loadu_ps(m + 8);
            for (int r = 0; r < 16; r += 8) {
                __m256 s = _mm256_loadu_ps(doubled + U15p::kColumns[0] + r);
                for (std::size_t c = 1; c < U15p::kRowOnes; ++c)
                    s = _mm256_add_ps(s, _mm256_loadu_ps(doubled + U15p::kColumns[c] + r));
                __m256 row = _mm256_sub_ps(_mm256_mul_ps(incidence, s), all);
                if (r == 8) row = _mm256_blend_ps(row, keep15, 0x80);
                _mm256_storeu_ps(m + r, row);
            }
        }
        _mm256_zeroupper();
    }
};

}  // namespace

U15pImpl* MakeU15p_m256() { return new U15p_m256(); }

}  // namespace ora::numeric
