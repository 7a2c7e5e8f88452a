#include "Algorithms/random/LCG.h"

namespace ora::numeric {

namespace kernels {

std::uint32_t LCG_ref(std::uint32_t state, float* out, std::size_t n) {
    for (std::size_t i = 0; i < n; ++i) {
        state = state * kLcgMultiplier + kLcgIncrement;
        out[i] = static_cast<float>(static_cast<std::int32_t>(state)) * kLcgScale;
    }
    return state;
}

}  // namespace kernels

namespace random {

namespace {

kernels::LcgKernel FormKernel(system::IntegerKernelForm form) {
    switch (form) {
        case system::IntegerKernelForm::M256Avx2: return kernels::LCG_m256_avx2;
        case system::IntegerKernelForm::M128Sse41: return kernels::LCG_m128_sse41;
        case system::IntegerKernelForm::Ref: break;
    }
    return kernels::LCG_ref;
}

}  // namespace

LCG::LCG(const LCGConfig& config)
    : m_config(config), m_form(system::ChooseIntegerKernelForm()), m_kernel(FormKernel(m_form)), m_state(config.seed) {}

void LCG::Reconfigure(const LCGConfig& config) {
    m_config = config;
    m_state = config.seed;
}

float LCG::Next() noexcept {
    float value;
    m_state = kernels::LCG_ref(m_state, &value, 1);
    return value;
}

}  // namespace random

}  // namespace ora::numeric
