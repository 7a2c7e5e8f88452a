// Inner loops of the Mix family, one per form. Free of intrinsics.
// out[n] = weights[0] * sources[0][n] + weights[1] * sources[1][n] + ...,
// summed in source order; zero without sources. `out` may be a source.
#pragma once

#include <cstddef>

namespace ora::numeric::kernels {

using MixKernel = void (*)(const float* const* sources, const float* weights, std::size_t count, float* out,
                           std::size_t frames);

void Mix_ref(const float* const* sources, const float* weights, std::size_t count, float* out, std::size_t frames);
void Mix_m128(const float* const* sources, const float* weights, std::size_t count, float* out, std::size_t frames);
void Mix_m256(const float* const* sources, const float* weights, std::size_t count, float* out, std::size_t frames);

}  // namespace ora::numeric::kernels
