// CastFloatInt32, 256-bit form.
#include "Algorithms/simd/CastFloatInt32Kernels.h"
#include "Algorithms/simd/StreamBodies.h"
#include "Algorithms/simd/m256/VecM256.h"

namespace ora::numeric::kernels {

void FloatToInt32_m256(const float* in, std::int32_t* out, std::size_t n, float scale) {
    simd::FloatToInt32<VecM256>(in, out, n, scale);
}

void Int32ToFloat_m256(const std::int32_t* in, float* out, std::size_t n, float scale) {
    simd::Int32ToFloat<VecM256>(in, out, n, scale);
}

}  // namespace ora::numeric::kernels
