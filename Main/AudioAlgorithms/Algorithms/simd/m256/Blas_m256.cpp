// Blas1 and Blas2, 256-bit form (rows left over by 8 go 4 at a time).
#include "Algorithms/simd/BlasKernels.h"
#include "Algorithms/simd/ReductionBodies.h"
#include "Algorithms/simd/StreamBodies.h"
#include "Algorithms/simd/m128/VecM128.h"
#include "Algorithms/simd/m256/VecM256.h"

namespace ora::numeric::kernels {

float Dot_m256(const float* x, const float* y, std::size_t n) { return simd::Dot<VecM256>(x, y, n); }

void Axpy_m256(float a, const float* x, float* y, std::size_t n) { simd::Axpy<VecM256>(a, x, y, n); }

void Gemv_m256(const float* a, std::size_t rows, std::size_t cols, std::size_t stride, const float* x, float* y) {
    simd::Gemv<VecM256, VecM128>(a, rows, cols, stride, x, y);
}

}  // namespace ora::numeric::kernels
