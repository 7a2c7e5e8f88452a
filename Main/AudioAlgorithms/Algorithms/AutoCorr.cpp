#include "Algorithms/AutoCorr.h"

namespace ora::numeric {

namespace kernels {

void AutoCorr_ref(const float* x, std::size_t frames, float* r, std::size_t lags) {
    for (std::size_t k = 0; k < lags; ++k) {
        float sum = 0.0f;
        for (std::size_t n = 0; n + k < frames; ++n) sum += x[n] * x[n + k];
        r[k] = sum;
    }
}

}  // namespace kernels

namespace {

kernels::AutoCorrKernel FormKernel(system::KernelForm form) {
    switch (form) {
        case system::KernelForm::M256Fma: return kernels::AutoCorr_m256_fma;
        case system::KernelForm::M256: return kernels::AutoCorr_m256;
        case system::KernelForm::M128Fma: return kernels::AutoCorr_m128_fma;
        case system::KernelForm::M128: return kernels::AutoCorr_m128;
        default: return kernels::AutoCorr_ref;
    }
}

}  // namespace

AutoCorr::AutoCorr(const AutoCorrConfig& config)
    : m_config(config), m_form(system::ChooseKernelForm()), m_kernel(FormKernel(m_form)) {}

}  // namespace ora::numeric
