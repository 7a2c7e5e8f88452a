#include "Algorithms/MS2LR.h"

namespace ora::numeric {

namespace kernels {

void MS2LR_ref(const float* m, const float* s, float* l, float* r, std::size_t frames) {
    for (std::size_t n = 0; n < frames; ++n) {
        const float a = m[n];
        const float b = s[n];
        l[n] = a + b;
        r[n] = a - b;
    }
}

}  // namespace kernels

namespace {

kernels::MidSideKernel FormKernel(system::KernelForm form) {
    switch (form) {
        case system::KernelForm::M256: return kernels::MS2LR_m256;
        case system::KernelForm::M128: return kernels::MS2LR_m128;
        default: return kernels::MS2LR_ref;
    }
}

}  // namespace

MS2LR::MS2LR() : m_form(system::ChooseKernelFormWithoutFma()), m_kernel(FormKernel(m_form)) {}

}  // namespace ora::numeric
