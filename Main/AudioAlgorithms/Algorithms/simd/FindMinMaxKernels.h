// Inner loops of the FindMinMax family, one per form. Each merges the
// block's minimum and maximum per channel into mn[] and mx[] (`frames`
// frames, channels interleaved). NaN samples are skipped. The vector forms
// take one, two or four channels, `ref` any count.
#pragma once

#include <cstddef>

namespace ora::numeric::kernels {

using FindMinMaxKernel = void (*)(const float* x, std::size_t frames, int channels, float* mn, float* mx);

void FindMinMax_ref(const float* x, std::size_t frames, int channels, float* mn, float* mx);
void FindMinMax_m128(const float* x, std::size_t frames, int channels, float* mn, float* mx);
void FindMinMax_m256(const float* x, std::size_t frames, int channels, float* mn, float* mx);

}  // namespace ora::numeric::kernels
