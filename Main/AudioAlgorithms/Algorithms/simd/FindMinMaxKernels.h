// Inner loops of the FindMinMax family, one per form and channel layout.
// Each merges the block's minimum and maximum per channel into mn[] and mx[]
// (`frames` frames, channels interleaved). NaN samples are skipped.
#pragma once

#include <cstddef>

namespace ora::numeric::kernels {

using FindMinMaxKernel = void (*)(const float* x, std::size_t frames, float* mn, float* mx);

void FindMinMax_ref(const float* x, std::size_t frames, int channels, float* mn, float* mx);
void FindMinMax_c1_m128(const float* x, std::size_t frames, float* mn, float* mx);
void FindMinMax_c2_m128(const float* x, std::size_t frames, float* mn, float* mx);
void FindMinMax_c4_m128(const float* x, std::size_t frames, float* mn, float* mx);
void FindMinMax_c1_m256(const float* x, std::size_t frames, float* mn, float* mx);
void FindMinMax_c2_m256(const float* x, std::size_t frames, float* mn, float* mx);
void FindMinMax_c4_m256(const float* x, std::size_t frames, float* mn, float* mx);

}  // namespace ora::numeric::kernels
