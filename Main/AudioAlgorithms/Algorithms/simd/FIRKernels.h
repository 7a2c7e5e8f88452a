// Inner loops of the FIR and FIRS families, one per form. Free of
// intrinsics: the fronts include it, the vector sources define it.
//
// `run` holds the channel's last length - 1 inputs followed by `frames` new
// ones. FIR: out[n] = sum_j reversed[j] * run[n + j], coefficients last-first.
// FIRS (symmetric coefficients, first half given):
// out[n] = sum_j half[j] * (run[n + j] + run[n + length - 1 - j]), the middle
// tap of an odd length last. Every form sums in that order.
#pragma once

#include <cstddef>

namespace ora::numeric::kernels {

using FirOneKernel = void (*)(const float* run, const float* reversed, std::size_t taps, float* out,
                              std::size_t frames);
using FirTwoKernel = void (*)(const float* run0, const float* run1, const float* reversed, std::size_t taps,
                              float* out0, float* out1, std::size_t frames);

void FIR_ref(const float* run, const float* reversed, std::size_t taps, float* out, std::size_t frames);
void FIR_c1_m128(const float* run, const float* reversed, std::size_t taps, float* out, std::size_t frames);
void FIR_c1_m128_fma(const float* run, const float* reversed, std::size_t taps, float* out, std::size_t frames);
void FIR_c1_m256(const float* run, const float* reversed, std::size_t taps, float* out, std::size_t frames);
void FIR_c1_m256_fma(const float* run, const float* reversed, std::size_t taps, float* out, std::size_t frames);
void FIR_c2_m128(const float* run0, const float* run1, const float* reversed, std::size_t taps, float* out0,
                 float* out1, std::size_t frames);
void FIR_c2_m128_fma(const float* run0, const float* run1, const float* reversed, std::size_t taps, float* out0,
                     float* out1, std::size_t frames);
void FIR_c2_m256(const float* run0, const float* run1, const float* reversed, std::size_t taps, float* out0,
                 float* out1, std::size_t frames);
void FIR_c2_m256_fma(const float* run0, const float* run1, const float* reversed, std::size_t taps, float* out0,
                     float* out1, std::size_t frames);

void FIRS_ref(const float* run, const float* half, std::size_t length, float* out, std::size_t frames);
void FIRS_c1_m128(const float* run, const float* half, std::size_t length, float* out, std::size_t frames);
void FIRS_c1_m128_fma(const float* run, const float* half, std::size_t length, float* out, std::size_t frames);
void FIRS_c1_m256(const float* run, const float* half, std::size_t length, float* out, std::size_t frames);
void FIRS_c1_m256_fma(const float* run, const float* half, std::size_t length, float* out, std::size_t frames);
void FIRS_c2_m128(const float* run0, const float* run1, const float* half, std::size_t length, float* out0, float* out1,
                  std::size_t frames);
void FIRS_c2_m128_fma(const float* run0, const float* run1, const float* half, std::size_t length, float* out0,
                      float* out1, std::size_t frames);
void FIRS_c2_m256(const float* run0, const float* run1, const float* half, std::size_t length, float* out0, float* out1,
                  std::size_t frames);
void FIRS_c2_m256_fma(const float* run0, const float* run1, const float* half, std::size_t length, float* out0,
                      float* out1, std::size_t frames);

}  // namespace ora::numeric::kernels
