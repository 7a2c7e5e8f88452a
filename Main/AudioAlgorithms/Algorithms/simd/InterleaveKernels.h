// Inner loops of Interleave and Deinterleave, one per form. Free of
// intrinsics. The vector forms take two channels, `ref` any count.
#pragma once

#include <cstddef>

namespace ora::numeric::kernels {

void Interleave_ref(const float* const* planar, int channels, float* interleaved, std::size_t frames);
void Interleave_c2_m128(const float* a, const float* b, float* interleaved, std::size_t frames);
void Interleave_c2_m256(const float* a, const float* b, float* interleaved, std::size_t frames);
void Deinterleave_ref(const float* interleaved, int channels, float* const* planar, std::size_t frames);
void Deinterleave_c2_m128(const float* interleaved, float* a, float* b, std::size_t frames);
void Deinterleave_c2_m256(const float* interleaved, float* a, float* b, std::size_t frames);

}  // namespace ora::numeric::kernels
