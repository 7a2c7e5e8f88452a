// Vector-vector arithmetic. Dot sums in one fixed order (see BlasKernels.h)
// that every form keeps, so that all forms agree bit for bit.
#pragma once

#include <cstddef>

#include "Algorithms/simd/BlasKernels.h"
#include "System/DispatchSettings.h"

namespace ora::numeric {

class Blas1 {
public:
    Blas1();

    // sum_i x[i] * y[i]
    float Dot(const float* x, const float* y, std::size_t n) const noexcept { return m_dot(x, y, n); }
    // y[i] += a * x[i]
    void Axpy(float a, const float* x, float* y, std::size_t n) const noexcept { m_axpy(a, x, y, n); }
    // sqrt(Dot(x, x))
    float Norm2(const float* x, std::size_t n) const noexcept;

    system::KernelForm GetForm() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }

private:
    system::KernelForm m_form;
    kernels::DotKernel m_dot;
    kernels::AxpyKernel m_axpy;
};

}  // namespace ora::numeric
