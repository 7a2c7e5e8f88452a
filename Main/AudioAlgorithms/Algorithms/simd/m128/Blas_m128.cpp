// Blas1 and Blas2, 128-bit form.
#include "Algorithms/simd/BlasKernels.h"
#include "Algorithms/simd/ReductionBodies.h"
#include "Algorithms/simd/StreamBodies.h"
#include "Algorithms/simd/m128/VecM128.h"

namespace ora::numeric::kernels {

float Dot_m128(const float* x, const float* y, std::size_t n) { return simd::Dot<VecM128>(x, y, n); }

void Axpy_m128(float a, const float* x, float* y, std::size_t n) { simd::Axpy<VecM128>(a, x, y, n); }

void Gemv_m128(const float* a, std::size_t rows, std::size_t cols, std::size_t stride, const float* x, float* y) {
    simd::Gemv<VecM128>(a, rows, cols, stride, x, y);
}

}  // namespace ora::numeric::kernels
