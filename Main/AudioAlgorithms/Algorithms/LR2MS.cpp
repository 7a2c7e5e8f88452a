#include "Algorithms/LR2MS.h"

namespace ora::numeric {

namespace kernels {

void LR2MS_ref(const float* l, const float* r, float* m, float* s, std::size_t frames) {
    for (std::size_t n = 0; n < frames; ++n) {
        const float a = l[n];
        const float b = r[n];
        m[n] = (a + b) * 0.5f;
        s[n] = (a - b) * 0.5f;
    }
}

}  // namespace kernels

namespace {

kernels::MidSideKernel FormKernel(system::KernelForm form) {
    switch (form) {
        case system::KernelForm::M256: return kernels::LR2MS_m256;
        case system::KernelForm::M128: return kernels::LR2MS_m128;
        default: return kernels::LR2MS_ref;
    }
}

}  // namespace

LR2MS::LR2MS() : m_form(system::ChooseKernelFormWithoutFma()), m_kernel(FormKernel(m_form)) {}

}  // namespace ora::numeric
