#include "Algorithms/Interleave.h"

#include "Algorithms/simd/InterleaveKernels.h"

namespace ora::numeric {

namespace kernels {

void Interleave_ref(const float* const* planar, int channels, float* interleaved, std::size_t frames) {
    const auto stride = static_cast<std::size_t>(channels);
    for (std::size_t c = 0; c < stride; ++c)
        for (std::size_t n = 0; n < frames; ++n) interleaved[n * stride + c] = planar[c][n];
}

}  // namespace kernels

Interleave::Interleave(const InterleaveConfig& config) { Reconfigure(config); }

void Interleave::Reconfigure(const InterleaveConfig& config) {
    m_config = config;
    m_form = config.channels == 2 ? system::ChooseKernelFormWithoutFma() : system::KernelForm::Ref;
    m_two = m_form == system::KernelForm::M256   ? kernels::Interleave_c2_m256
            : m_form == system::KernelForm::M128 ? kernels::Interleave_c2_m128
                                                 : nullptr;
}

void Interleave::Process(const float* const* planar, float* interleaved, std::size_t frames) const noexcept {
    if (m_two != nullptr)
        m_two(planar[0], planar[1], interleaved, frames);
    else
        kernels::Interleave_ref(planar, m_config.channels, interleaved, frames);
}

}  // namespace ora::numeric
