#include "Algorithms/CSquareMagnitude.h"

namespace ora::numeric {

namespace kernels {

void CSquareMagnitude_ref(const float* bins, float* out, std::size_t n) {
    for (std::size_t i = 0; i < n; ++i) {
        const float re = bins[2 * i], im = bins[2 * i + 1];
        out[i] = re * re + im * im;
    }
}

}  // namespace kernels

namespace {

kernels::CSquareMagnitudeKernel FormKernel(system::KernelForm form) {
    switch (form) {
        case system::KernelForm::M256: return kernels::CSquareMagnitude_m256;
        case system::KernelForm::M128: return kernels::CSquareMagnitude_m128;
        default: return kernels::CSquareMagnitude_ref;
    }
}

}  // namespace

CSquareMagnitude::CSquareMagnitude() : m_form(system::ChooseKernelFormWithoutFma()), m_kernel(FormKernel(m_form)) {}

}  // namespace ora::numeric
