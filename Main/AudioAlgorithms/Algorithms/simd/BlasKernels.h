// Inner loops of Blas1 (vector-vector) and Blas2 (matrix-vector), one per
// form. Free of intrinsics.
//
// Dot sums in one fixed order that every form keeps: eight partial sums
// s[i % 8] over the first n - n % 8 elements, combined as
// ((s0 + s4) + (s2 + s6)) + ((s1 + s5) + (s3 + s7)), then the remaining
// elements one by one. Gemv takes a column-major matrix (column c starts at
// a + c * stride) and sums each row over the columns in order.
#pragma once

#include <cstddef>

namespace ora::numeric::kernels {

using DotKernel = float (*)(const float* x, const float* y, std::size_t n);
using AxpyKernel = void (*)(float a, const float* x, float* y, std::size_t n);
using GemvKernel = void (*)(const float* a, std::size_t rows, std::size_t cols, std::size_t stride, const float* x,
                            float* y);

float Dot_ref(const float* x, const float* y, std::size_t n);
float Dot_m128(const float* x, const float* y, std::size_t n);
float Dot_m256(const float* x, const float* y, std::size_t n);
void Axpy_ref(float a, const float* x, float* y, std::size_t n);
void Axpy_m128(float a, const float* x, float* y, std::size_t n);
void Axpy_m256(float a, const float* x, float* y, std::size_t n);
void Gemv_ref(const float* a, std::size_t rows, std::size_t cols, std::size_t stride, const float* x, float* y);
void Gemv_m128(const float* a, std::size_t rows, std::size_t cols, std::size_t stride, const float* x, float* y);
void Gemv_m256(const float* a, std::size_t rows, std::size_t cols, std::size_t stride, const float* x, float* y);

}  // namespace ora::numeric::kernels
