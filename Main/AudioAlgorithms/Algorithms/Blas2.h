// Matrix-vector product y = A x over a column-major matrix (rows x cols,
// column c at a + c * stride), laid out so that the vector forms run across
// rows. Each row sums over the columns in order, in every form.
#pragma once

#include <cstddef>

#include "Algorithms/simd/BlasKernels.h"
#include "System/DispatchSettings.h"

namespace ora::numeric {

class Blas2 {
public:
    Blas2();

    // y must not overlap a or x.
    void Gemv(const float* a, std::size_t rows, std::size_t cols, std::size_t stride, const float* x,
              float* y) const noexcept {
        m_gemv(a, rows, cols, stride, x, y);
    }

    system::KernelForm GetForm() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }

private:
    system::KernelForm m_form;
    kernels::GemvKernel m_gemv;
};

}  // namespace ora::numeric
