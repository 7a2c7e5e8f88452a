// Inner loops of random::LCG, one per form. Free of intrinsics.
// state = state * kLcgMultiplier + kLcgIncrement (mod 2^32), then the state
// read as a signed 32-bit integer times 2^-31: uniform in [-1, 1]. Returns
// the state after the last value.
#pragma once

#include <cstddef>
#include <cstdint>

namespace ora::numeric::kernels {

constexpr std::uint32_t kLcgMultiplier = 1664525u;
constexpr std::uint32_t kLcgIncrement = 1013904223u;
constexpr float kLcgScale = 1.0f / 2147483648.0f;

using LcgKernel = std::uint32_t (*)(std::uint32_t state, float* out, std::size_t n);

std::uint32_t LCG_ref(std::uint32_t state, float* out, std::size_t n);
std::uint32_t LCG_m128_sse41(std::uint32_t state, float* out, std::size_t n);
std::uint32_t LCG_m256_avx2(std::uint32_t state, float* out, std::size_t n);

}  // namespace ora::numeric::kernels
