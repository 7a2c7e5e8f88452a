#include "Algorithms/Blas2.h"

namespace ora::numeric {

namespace kernels {

void Gemv_ref(const float* a, std::size_t rows, std::size_t cols, std::size_t stride, const float* x, float* y) {
    for (std::size_t r = 0; r < rows; ++r) {
        float acc = 0.0f;
        for (std::size_t c = 0; c < cols; ++c) acc += a[c * stride + r] * x[c];
        y[r] = acc;
    }
}

}  // namespace kernels

namespace {

kernels::GemvKernel FormKernel(system::KernelForm form) {
    switch (form) {
        case system::KernelForm::M256: return kernels::Gemv_m256;
        case system::KernelForm::M128: return kernels::Gemv_m128;
        default: return kernels::Gemv_ref;
    }
}

}  // namespace

Blas2::Blas2() : m_form(system::ChooseKernelFormWithoutFma()), m_gemv(FormKernel(m_form)) {}

}  // namespace ora::numeric
