#include "Algorithms/FindMinMax.h"

#include <algorithm>
#include <cmath>
#include <limits>

#include "Algorithms/simd/FindMinMaxKernels.h"

namespace ora::numeric {

namespace kernels {

void FindMinMax_ref(const float* x, std::size_t frames, int channels, float* mn, float* mx) {
    for (std::size_t n = 0; n < frames; ++n)
        for (int c = 0; c < channels; ++c) {
            const float v = x[n * static_cast<std::size_t>(channels) + static_cast<std::size_t>(c)];
            if (v < mn[c]) mn[c] = v;
            if (v > mx[c]) mx[c] = v;
        }
}

}  // namespace kernels

namespace {

using system::KernelForm;

constexpr float kNone = std::numeric_limits<float>::infinity();

kernels::FindMinMaxKernel FormKernel(KernelForm form) {
    switch (form) {
        case KernelForm::M256: return kernels::FindMinMax_m256;
        case KernelForm::M128: return kernels::FindMinMax_m128;
        default: return kernels::FindMinMax_ref;
    }
}

KernelForm ChooseForm(int channels) {
    return channels == 1 || channels == 2 || channels == 4 ? system::ChooseKernelFormWithoutFma() : KernelForm::Ref;
}

}  // namespace

class FindMinMaxImpl {
public:
    // The held values are the state handed to a rebuilt implementation.
    struct State {
        std::vector<float> mn, mx;
    };

    FindMinMaxImpl(KernelForm form, int channels, State state)
        : m_kernel(FormKernel(form)), m_channels(channels), m_state(std::move(state)) {
        m_state.mn.resize(static_cast<std::size_t>(channels), kNone);
        m_state.mx.resize(static_cast<std::size_t>(channels), -kNone);
    }

    void Process(const float* x, std::size_t frames) noexcept {
        m_kernel(x, frames, m_channels, m_state.mn.data(), m_state.mx.data());
    }

    void Reset() noexcept {
        std::fill(m_state.mn.begin(), m_state.mn.end(), kNone);
        std::fill(m_state.mx.begin(), m_state.mx.end(), -kNone);
    }

    float Min(int c) const { return m_state.mn[static_cast<std::size_t>(c)]; }
    float Max(int c) const { return m_state.mx[static_cast<std::size_t>(c)]; }
    State TakeState() { return std::move(m_state); }

private:
    kernels::FindMinMaxKernel m_kernel;
    int m_channels;
    State m_state;
};

FindMinMax::FindMinMax(const FindMinMaxConfig& config)
    : m_config(config),
      m_form(ChooseForm(config.channels)),
      m_impl(std::make_unique<FindMinMaxImpl>(m_form, std::max(config.channels, 0), FindMinMaxImpl::State())) {}

FindMinMax::~FindMinMax() = default;

void FindMinMax::Reconfigure(const FindMinMaxConfig& config) {
    if (config == m_config) return;
    m_form = ChooseForm(config.channels);
    m_impl = std::make_unique<FindMinMaxImpl>(m_form, std::max(config.channels, 0), m_impl->TakeState());
    m_config = config;
}

void FindMinMax::Process(const float* interleaved, std::size_t frames) noexcept {
    m_impl->Process(interleaved, frames);
}

void FindMinMax::Reset() noexcept { m_impl->Reset(); }

float FindMinMax::GetMin(int channel) const {
    return channel >= 0 && channel < m_config.channels ? m_impl->Min(channel) : kNone;
}

float FindMinMax::GetMax(int channel) const {
    return channel >= 0 && channel < m_config.channels ? m_impl->Max(channel) : -kNone;
}

float FindMinMax::GetPeak(int channel) const { return std::max({0.0f, -GetMin(channel), GetMax(channel)}); }

}  // namespace ora::numeric
