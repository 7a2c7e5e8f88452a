#include "Algorithms/Deinterleave.h"

#include "Algorithms/simd/InterleaveKernels.h"

namespace ora::numeric {

namespace kernels {

void Deinterleave_ref(const float* interleaved, int channels, float* const* planar, std::size_t frames) {
    const auto stride = static_cast<std::size_t>(channels);
    for (std::size_t c = 0; c < stride; ++c)
        for (std::size_t n = 0; n < frames; ++n) planar[c][n] = interleaved[n * stride + c];
}

}  // namespace kernels

Deinterleave::Deinterleave(const DeinterleaveConfig& config) { Reconfigure(config); }

void Deinterleave::Reconfigure(const DeinterleaveConfig& config) {
    m_config = config;
    m_form = config.channels == 2 ? system::ChooseKernelFormWithoutFma() : system::KernelForm::Ref;
    m_two = m_form == system::KernelForm::M256   ? kernels::Deinterleave_c2_m256
            : m_form == system::KernelForm::M128 ? kernels::Deinterleave_c2_m128
                                                 : nullptr;
}

void Deinterleave::Process(const float* interleaved, float* const* planar, std::size_t frames) const noexcept {
    if (m_two != nullptr)
        m_two(interleaved, planar[0], planar[1], frames);
    else
        kernels::Deinterleave_ref(interleaved, m_config.channels, planar, frames);
}

}  // namespace ora::numeric
