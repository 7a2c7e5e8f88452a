#include "Algorithms/Mix.h"

namespace ora::numeric {

namespace kernels {

void Mix_ref(const float* const* sources, const float* weights, std::size_t count, float* out, std::size_t frames) {
    for (std::size_t n = 0; n < frames; ++n) {
        float acc = count > 0 ? weights[0] * sources[0][n] : 0.0f;
        for (std::size_t i = 1; i < count; ++i) acc += weights[i] * sources[i][n];
        out[n] = acc;
    }
}

}  // namespace kernels

namespace {

kernels::MixKernel FormKernel(system::KernelForm form) {
    switch (form) {
        case system::KernelForm::M256: return kernels::Mix_m256;
        case system::KernelForm::M128: return kernels::Mix_m128;
        default: return kernels::Mix_ref;
    }
}

}  // namespace

Mix::Mix(const MixConfig& config)
    : m_config(config), m_form(system::ChooseKernelFormWithoutFma()), m_kernel(FormKernel(m_form)) {}

}  // namespace ora::numeric
