// CastFloatInt32, 128-bit form.
#include "Algorithms/simd/CastFloatInt32Kernels.h"
#include "Algorithms/simd/StreamBodies.h"
#include "Algorithms/simd/m128/VecM128.h"

namespace ora::numeric::kernels {

void FloatToInt32_m128(const float* in, std::int32_t* out, std::size_t n, float scale) {
    simd::FloatToInt32<VecM128>(in, out, n, scale);
}

void Int32ToFloat_m128(const std::int32_t* in, float* out, std::size_t n, float scale) {
    simd::Int32ToFloat<VecM128>(in, out, n, scale);
}

}  // namespace ora::numeric::kernels
