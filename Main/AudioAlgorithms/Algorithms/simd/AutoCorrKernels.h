// Inner loops of AutoCorr, one per form. Free of intrinsics.
// r[k] = sum_{n < frames - k} x[n] x[n + k] for k < lags (0 where k >= frames),
// summed in n order from zero in every form.
#pragma once

#include <cstddef>

namespace ora::numeric::kernels {

using AutoCorrKernel = void (*)(const float* x, std::size_t frames, float* r, std::size_t lags);

void AutoCorr_ref(const float* x, std::size_t frames, float* r, std::size_t lags);
void AutoCorr_m128(const float* x, std::size_t frames, float* r, std::size_t lags);
void AutoCorr_m128_fma(const float* x, std::size_t frames, float* r, std::size_t lags);
void AutoCorr_m256(const float* x, std::size_t frames, float* r, std::size_t lags);
void AutoCorr_m256_fma(const float* x, std::size_t frames, float* r, std::size_t lags);

}  // namespace ora::numeric::kernels
