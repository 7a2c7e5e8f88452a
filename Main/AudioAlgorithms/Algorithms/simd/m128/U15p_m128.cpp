// U15p in 128-bit vectors: four rows at a time from a doubled copy of the
// frame, so that the cyclic column set becomes seven unaligned loads.
#include <emmintrin.h>

#include "Algorithms/U15p.h"

namespace ora::numeric {

namespace {

class U15p_m128 final : public U15pImpl {
public:
    void Process(const float* d, const float* u, float* m, std::size_t frames) const noexcept override {
        const __m128 lastLaneOff = _mm_castsi128_ps(_mm_set_epi32(0, -1, -1, -1));
        const __m128 incidence = _mm_set1_ps(U15p::kIncidenceWeight);
        const __m128 allOnes = _mm_set1_ps(U15p::kAllOnesWeight);
        alignas(64) float doubled[32];
        for (std::size_t f = 0; f < frames; ++f, d += kLaneCount, u += kLaneCount, m += kLaneCount) {
            const __m128 x0 = _mm_add_ps(_mm_loadu_ps(d), _mm_loadu_ps(u));
            const __m128 x1 = _mm_add_ps(_mm_loadu_ps(d + 4), _mm_loadu_ps(u + 4));
            const __m128 x2 = _mm_add_ps(_mm_loadu_ps(d + 8), _mm_loadu_ps(u + 8));
            const __m128 x3 = _mm_and_ps(_mm_add_ps(_mm_loadu_ps(d + 12), _mm_loadu_ps(u + 12)), lastLaneOff);
            const __m128 t4 = _mm_add_ps(_mm_add_ps(x0, x2), _mm_add_ps(x1, x3));
            const __m128 t2 = _mm_add_ps(t4, _mm_movehl_ps(t4, t4));
            const __m128 total = _mm_add_ps(_mm_shuffle_ps(t2, t2, _MM_SHUFFLE(0, 0, 0, 0)),
                                            _mm_shuffle_ps(t2, t2, _MM_SHUFFLE(1, 1, 1, 1)));
            const __m128 all = _mm_mul_ps(allOnes, total);
            _mm_store_ps(doubled, x0);
            _mm_store_ps(doubled + 4, x1);
            _mm_store_ps(doubled + 8, x2);
            _mm_store_ps(doubled + 12, x3);
            _mm_storeu_ps(doubled + 15, x0);
            _mm_storeu_ps(doubled + 19, x1);
            _mm_storeu_ps(doubled + 23, x2);
            _mm_storeu_ps(doubled + 27, x3);
            const __m128 keep15 = _mm_loadu_ps(m + 12);
            for (int r = 0; r < 16; r += 4) {
                __m128 s = _mm_loadu_ps(doubled + U15p::kColumns[0] + r);
                for (std::size_t c = 1; c < U15p::kRowOnes; ++c)
                    s = _mm_add_ps(s, _mm_loadu_ps(doubled + U15p::kColumns[c] + r));
                __m128 row = _mm_sub_ps(_mm_mul_ps(incidence, s), all);
                if (r == 12) row = _mm_or_ps(_mm_and_ps(row, lastLaneOff), _mm_andnot_ps(lastLaneOff, keep15));
                _mm_storeu_ps(m + r, row);
            }
        }
    }
};

}  // namespace

U15pImpl* MakeU15p_m128() { return new U15p_m128(); }

}  // namespace ora::numeric
