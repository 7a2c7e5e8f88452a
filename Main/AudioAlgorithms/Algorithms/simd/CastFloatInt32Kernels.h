// Inner loops of CastFloatInt32, one per form. Free of intrinsics.
// To integers: x * scale rounded to nearest (ties to even), saturated to the
// int32 range, NaN to 0. To floats: i * scale.
#pragma once

#include <cstddef>
#include <cstdint>

namespace ora::numeric::kernels {

// The largest float below 2^31 and -2^31: the saturation bounds.
constexpr float kInt32High = 2147483520.0f;
constexpr float kInt32Low = -2147483648.0f;

using ToInt32Kernel = void (*)(const float* in, std::int32_t* out, std::size_t n, float scale);
using ToFloatKernel = void (*)(const std::int32_t* in, float* out, std::size_t n, float scale);

void FloatToInt32_ref(const float* in, std::int32_t* out, std::size_t n, float scale);
void FloatToInt32_m128(const float* in, std::int32_t* out, std::size_t n, float scale);
void FloatToInt32_m256(const float* in, std::int32_t* out, std::size_t n, float scale);
void Int32ToFloat_ref(const std::int32_t* in, float* out, std::size_t n, float scale);
void Int32ToFloat_m128(const std::int32_t* in, float* out, std::size_t n, float scale);
void Int32ToFloat_m256(const std::int32_t* in, float* out, std::size_t n, float scale);

}  // namespace ora::numeric::kernels
