#include "Algorithms/Rotor16.h"

namespace ora::numeric {

namespace kernels {

void Rotor16_ref(Rotor16State& st, float* sines, std::size_t frames) {
    for (std::size_t f = 0; f < frames; ++f, sines += kLaneCount) {
        for (std::size_t k = 0; k < kLaneCount; ++k) {
            const float c = st.c[k] * st.rc[k] - st.s[k] * st.rs[k];
            st.s[k] = st.s[k] * st.rc[k] + st.c[k] * st.rs[k];
            st.c[k] = c;
            sines[k] = st.s[k];
        }
    }
}

}  // namespace kernels

namespace {

kernels::Rotor16Kernel FormKernel(system::KernelForm form) {
    switch (form) {
        case system::KernelForm::M256: return kernels::Rotor16_m256;
        case system::KernelForm::M128: return kernels::Rotor16_m128;
        default: return kernels::Rotor16_ref;
    }
}

}  // namespace

Rotor16::Rotor16() : m_form(system::ChooseKernelFormWithoutFma()), m_kernel(FormKernel(m_form)) {}

}  // namespace ora::numeric
