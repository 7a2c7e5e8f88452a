// Inner loops of the ModulatedTap family, one per form. Free of intrinsics.
#pragma once

#include <cstddef>

namespace ora::numeric::kernels {

using ModulatedTapKernel = void (*)(const float* x, const float* s, float delay, float depth, float weight,
                                    float* out, std::size_t count, bool accumulate);

void ModulatedTap_ref(const float* x, const float* s, float delay, float depth, float weight, float* out,
                      std::size_t count, bool accumulate);
void ModulatedTap_m128(const float* x, const float* s, float delay, float depth, float weight, float* out,
                       std::size_t count, bool accumulate);
void ModulatedTap_m256(const float* x, const float* s, float delay, float depth, float weight, float* out,
                       std::size_t count, bool accumulate);

}  // namespace ora::numeric::kernels
