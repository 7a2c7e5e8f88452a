// LaneTranspose, 256-bit form: blocks of 8 lanes x 8 frames.
#include <immintrin.h>

#include "Algorithms/simd/LaneTransposeKernels.h"

namespace ora::numeric::kernels {

namespace {

constexpr std::size_t kLanes = 16;

// Rows in, columns out: afterwards rN lane i is what ri lane N was. Written
// out in full so that the eight vectors stay in registers.
inline void Transpose8(__m256& r0, __m256& r1, __m256& r2, __m256& r3, __m256& r4, __m256& r5, __m256& r6,
                       __m256& r7) {
    const __m256 t0 = _mm256_unpacklo_ps(r0, r1), t1 = _mm256_unpackhi_ps(r0, r1);
    const __m256 t2 = _mm256_unpacklo_ps(r2, r3), t3 = _mm256_unpackhi_ps(r2, r3);
    const __m256 t4 = _mm256_unpacklo_ps(r4, r5), t5 = _mm256_unpackhi_ps(r4, r5);
    const __m256 t6 = _mm256_unpacklo_ps(r6, r7), t7 = _mm256_unpackhi_ps(r6, r7);
    const __m256 u0 = _mm256_shuffle_ps(t0, t2, 0x44), u1 = _mm256_shuffle_ps(t0, t2, 0xEE);
    const __m256 u2 = _mm256_shuffle_ps(t1, t3, 0x44), u3 = _mm256_shuffle_ps(t1, t3, 0xEE);
    const __m256 u4 = _mm256_shuffle_ps(t4, t6, 0x44), u5 = _mm256_shuffle_ps(t4, t6, 0xEE);
    const __m256 u6 = _mm256_shuffle_ps(t5, t7, 0x44), u7 = _mm256_shuffle_ps(t5, t7, 0xEE);
    r0 = _mm256_permute2f128_ps(u0, u4, 0x20);
    r1 = _mm256_permute2f128_ps(u1, u5, 0x20);
    r2 = _mm256_permute2f128_ps(u2, u6, 0x20);
    r3 = _mm256_permute2f128_ps(u3, u7, 0x20);
    r4 = _mm256_permute2f128_ps(u0, u4, 0x31);
    r5 = _mm256_permute2f128_ps(u1, u5, 0x31);
    r6 = _mm256_permute2f128_ps(u2, u6, 0x31);
    r7 = _mm256_permute2f128_ps(u3, u7, 0x31);
}

void ToFrames(const float* const* rows, float* frames, std::size_t count) {
    std::size_t f = 0;
    for (; f + 8 <= count; f += 8) {
        for (std::size_t k = 0; k < kLanes; k += 8) {
            __m256 r0 = _mm256_loadu_ps(rows[k] + f), r1 = _mm256_loadu_ps(rows[k + 1] + f);
            __m256 r2 = _mm256_loadu_ps(rows[k + 2] + f), r3 = _mm256_loadu_ps(rows[k + 3] + f);
            __m256 r4 = _mm256_loadu_ps(rows[k + 4] + f), r5 = _mm256_loadu_ps(rows[k + 5] + f);
            __m256 r6 = _mm256_loadu_ps(rows[k + 6] + f), r7 = _mm256_loadu_ps(rows[k + 7] + f);
            Transpose8(r0, r1, r2, r3, r4, r5, r6, r7);
            float* out = frames + f * kLanes + k;
            _mm256_storeu_ps(out, r0);
            _mm256_storeu_ps(out + kLanes, r1);
            _mm256_storeu_ps(out + 2 * kLanes, r2);
            _mm256_storeu_ps(out + 3 * kLanes, r3);
            _mm256_storeu_ps(out + 4 * kLanes, r4);
            _mm256_storeu_ps(out + 5 * kLanes, r5);
            _mm256_storeu_ps(out + 6 * kLanes, r6);
            _mm256_storeu_ps(out + 7 * kLanes, r7);
        }
    }
    for (; f < count; ++f)
        for (std::size_t k = 0; k < kLanes; ++k) frames[f * kLanes + k] = rows[k][f];
}

void FromFrames(const float* frames, float* const* rows, std::size_t count) {
    std::size_t f = 0;
    for (; f + 8 <= count; f += 8) {
        for (std::size_t k = 0; k < kLanes; k += 8) {
            const float* in = frames + f * kLanes + k;
            __m256 r0 = _mm256_loadu_ps(in), r1 = _mm256_loadu_ps(in + kLanes);
            __m256 r2 = _mm256_loadu_ps(in + 2 * kLanes), r3 = _mm256_loadu_ps(in + 3 * kLanes);
            __m256 r4 = _mm256_loadu_ps(in + 4 * kLanes), r5 = _mm256_loadu_ps(in + 5 * kLanes);
            __m256 r6 = _mm256_loadu_ps(in + 6 * kLanes), r7 = _mm256_loadu_ps(in + 7 * kLanes);
            Transpose8(r0, r1, r2, r3, r4, r5, r6, r7);
            _mm256_storeu_ps(rows[k] + f, r0);
            _mm256_storeu_ps(rows[k + 1] + f, r1);
            _mm256_storeu_ps(rows[k + 2] + f, r2);
            _mm256_storeu_ps(rows[k + 3] + f, r3);
            _mm256_storeu_ps(rows[k + 4] + f, r4);
            _mm256_storeu_ps(rows[k + 5] + f, r5);
            _mm256_storeu_ps(rows[k + 6] + f, r6);
            _mm256_storeu_ps(rows[k + 7] + f, r7);
        }
    }
    for (; f < count; ++f)
        for (std::size_t k = 0; k < kLanes; ++k) rows[k][f] = frames[f * kLanes + k];
}

}  // namespace

const LaneTransposeKernels kLaneTranspose_m256 = {ToFrames, FromFrames};

}  // namespace ora::numeric::kernels
