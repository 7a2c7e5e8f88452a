// LaneTranspose, 256-bit form: blocks of 8 lanes x 8 frames.
#include <immintrin.h>

#include "Algorithms/simd/LaneTransposeKernels.h"

namespace ora::numeric::kernels {

namespace {

constexpr std::size_t kLanes = 16;

// Rows in, columns out: afterwards r[j] lane i is what r[i] lane j was.
inline void Transpose8(__m256* r) {
    const __m256 t0 = _mm256_unpacklo_ps(r[0], r[1]), t1 = _mm256_unpackhi_ps(r[0], r[1]);
    const __m256 t2 = _mm256_unpacklo_ps(r[2], r[3]), t3 = _mm256_unpackhi_ps(r[2], r[3]);
    const __m256 t4 = _mm256_unpacklo_ps(r[4], r[5]), t5 = _mm256_unpackhi_ps(r[4], r[5]);
    const __m256 t6 = _mm256_unpacklo_ps(r[6], r[7]), t7 = _mm256_unpackhi_ps(r[6], r[7]);
    const __m256 u0 = _mm256_shuffle_ps(t0, t2, 0x44), u1 = _mm256_shuffle_ps(t0, t2, 0xEE);
    const __m256 u2 = _mm256_shuffle_ps(t1, t3, 0x44), u3 = _mm256_shuffle_ps(t1, t3, 0xEE);
    const __m256 u4 = _mm256_shuffle_ps(t4, t6, 0x44), u5 = _mm256_shuffle_ps(t4, t6, 0xEE);
    const __m256 u6 = _mm256_shuffle_ps(t5, t7, 0x44), u7 = _mm256_shuffle_ps(t5, t7, 0xEE);
    r[0] = _mm256_permute2f128_ps(u0, u4, 0x20);
    r[1] = _mm256_permute2f128_ps(u1, u5, 0x20);
    r[2] = _mm256_permute2f128_ps(u2, u6, 0x20);
    r[3] = _mm256_permute2f128_ps(u3, u7, 0x20);
    r[4] = _mm256_permute2f128_ps(u0, u4, 0x31);
    r[5] = _mm256_permute2f128_ps(u1, u5, 0x31);
    r[6] = _mm256_permute2f128_ps(u2, u6, 0x31);
    r[7] = _mm256_permute2f128_ps(u3, u7, 0x31);
}

void ToFrames(const float* const* rows, float* frames, std::size_t count) {
    std::size_t f = 0;
    for (; f + 8 <= count; f += 8) {
        for (std::size_t k = 0; k < kLanes; k += 8) {
            __m256 r[8];
            for (std::size_t i = 0; i < 8; ++i) r[i] = _mm256_loadu_ps(rows[k + i] + f);
            Transpose8(r);
            for (std::size_t j = 0; j < 8; ++j) _mm256_storeu_ps(frames + (f + j) * kLanes + k, r[j]);
        }
    }
    for (; f < count; ++f)
        for (std::size_t k = 0; k < kLanes; ++k) frames[f * kLanes + k] = rows[k][f];
}

void FromFrames(const float* frames, float* const* rows, std::size_t count) {
    std::size_t f = 0;
    for (; f + 8 <= count; f += 8) {
        for (std::size_t k = 0; k < kLanes; k += 8) {
            __m256 r[8];
            for (std::size_t j = 0; j < 8; ++j) r[j] = _mm256_loadu_ps(frames + (f + j) * kLanes + k);
            Transpose8(r);
            for (std::size_t i = 0; i < 8; ++i) _mm256_storeu_ps(rows[k + i] + f, r[i]);
        }
    }
    for (; f < count; ++f)
        for (std::size_t k = 0; k < kLanes; ++k) rows[k][f] = frames[f * kLanes + k];
}

}  // namespace

const LaneTransposeKernels kLaneTranspose_m256 = {ToFrames, FromFrames};

}  // namespace ora::numeric::kernels
