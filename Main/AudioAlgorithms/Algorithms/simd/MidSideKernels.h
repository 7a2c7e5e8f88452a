// Inner loops of LR2MS and MS2LR, one per form. Free of intrinsics.
// LR2MS: m = (l + r) * 0.5, s = (l - r) * 0.5. MS2LR: l = m + s, r = m - s.
// Outputs may be the inputs.
#pragma once

#include <cstddef>

namespace ora::numeric::kernels {

using MidSideKernel = void (*)(const float* a, const float* b, float* outA, float* outB, std::size_t frames);

void LR2MS_ref(const float* l, const float* r, float* m, float* s, std::size_t frames);
void LR2MS_m128(const float* l, const float* r, float* m, float* s, std::size_t frames);
void LR2MS_m256(const float* l, const float* r, float* m, float* s, std::size_t frames);
void MS2LR_ref(const float* m, const float* s, float* l, float* r, std::size_t frames);
void MS2LR_m128(const float* m, const float* s, float* l, float* r, std::size_t frames);
void MS2LR_m256(const float* m, const float* s, float* l, float* r, std::size_t frames);

}  // namespace ora::numeric::kernels
