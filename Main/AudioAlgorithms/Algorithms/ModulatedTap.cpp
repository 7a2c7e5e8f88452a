#include "Algorithms/ModulatedTap.h"

namespace ora::numeric {

namespace kernels {

void ModulatedTap_ref(const float* x, const float* s, float delay, float depth, float weight, float* out,
                      std::size_t count, bool accumulate) {
    for (std::size_t f = 0; f < count; ++f) {
        const float swing = depth * s[f];
        const float p = delay + swing > 1.0f ? delay + swing : 1.0f;
        const auto whole = static_cast<std::ptrdiff_t>(p);
        const float fraction = p - static_cast<float>(whole);
        const float a = x[static_cast<std::ptrdiff_t>(f) - whole];
        const float b = x[static_cast<std::ptrdiff_t>(f) - whole - 1];
        const float v = weight * (a + fraction * (b - a));
        out[f] = accumulate ? out[f] + v : v;
    }
}

}  // namespace kernels

namespace {

kernels::ModulatedTapKernel FormKernel(system::KernelForm form) {
    switch (form) {
        case system::KernelForm::M256: return kernels::ModulatedTap_m256;
        case system::KernelForm::M128: return kernels::ModulatedTap_m128;
        default: return kernels::ModulatedTap_ref;
    }
}

}  // namespace

ModulatedTap::ModulatedTap() : m_form(system::ChooseKernelFormWithoutFma()), m_kernel(FormKernel(m_form)) {}

}  // namespace ora::numeric
