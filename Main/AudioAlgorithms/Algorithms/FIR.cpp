#include "Algorithms/FIR.h"

#include <algorithm>

#include "Algorithms/FilterHistory.h"
#include "Algorithms/simd/FIRKernels.h"

namespace ora::numeric {

namespace kernels {

void FIR_ref(const float* run, const float* reversed, std::size_t taps, float* out, std::size_t frames) {
    for (std::size_t n = 0; n < frames; ++n) {
        float acc = 0.0f;
        for (std::size_t j = 0; j < taps; ++j) acc += reversed[j] * run[n + j];
        out[n] = acc;
    }
}

}  // namespace kernels

namespace {

using system::KernelForm;

struct FIRForm {
    kernels::FirOneKernel one;
    kernels::FirTwoKernel two;  // null: channel by channel
};

FIRForm FormKernels(KernelForm form) {
    switch (form) {
        case KernelForm::M256Fma: return {kernels::FIR_c1_m256_fma, kernels::FIR_c2_m256_fma};
        case KernelForm::M256: return {kernels::FIR_c1_m256, kernels::FIR_c2_m256};
        case KernelForm::M128Fma: return {kernels::FIR_c1_m128_fma, kernels::FIR_c2_m128_fma};
        case KernelForm::M128: return {kernels::FIR_c1_m128, kernels::FIR_c2_m128};
        default: return {kernels::FIR_ref, nullptr};
    }
}

// Vector forms exist for one and two channels.
KernelForm ChooseForm(int channels) { return channels <= 2 ? system::ChooseKernelForm() : KernelForm::Ref; }

}  // namespace

class FIRImpl {
public:
    FIRImpl(KernelForm form, const FIRConfig& config, FilterHistory history)
        : m_kernels(FormKernels(form)), m_history(std::move(history)) {
        SetCoefficients(config);
    }

    // Allocates.
    void SetCoefficients(const FIRConfig& config) {
        m_reversed.assign(config.coefficients.rbegin(), config.coefficients.rend());
        if (m_reversed.empty()) m_reversed.push_back(0.0f);
        m_history.Dimension(config.channels, m_reversed.size() - 1);
    }

    void Process(const float* const* in, float* const* out, std::size_t frames) noexcept {
        const int channels = m_history.Channels();
        const std::size_t taps = m_reversed.size();
        for (std::size_t done = 0; done < frames;) {
            const std::size_t n = std::min(frames - done, FilterHistory::kChunk);
            if (channels == 2 && m_kernels.two != nullptr) {
                const float* run0 = m_history.Load(0, in[0] + done, n);
                const float* run1 = m_history.Load(1, in[1] + done, n);
                m_kernels.two(run0, run1, m_reversed.data(), taps, out[0] + done, out[1] + done, n);
                m_history.Advance(0, n);
                m_history.Advance(1, n);
            } else {
                for (int c = 0; c < channels; ++c) {
                    const float* run = m_history.Load(c, in[c] + done, n);
                    m_kernels.one(run, m_reversed.data(), taps, out[c] + done, n);
                    m_history.Advance(c, n);
                }
            }
            done += n;
        }
    }

    void Reset() noexcept { m_history.Clear(); }
    FilterHistory TakeHistory() { return std::move(m_history); }

private:
    FIRForm m_kernels;
    std::vector<float> m_reversed;
    FilterHistory m_history;
};

FIR::FIR(const FIRConfig& config)
    : m_config(config),
      m_form(ChooseForm(config.channels)),
      m_impl(std::make_unique<FIRImpl>(m_form, config, FilterHistory())) {}

FIR::~FIR() = default;

void FIR::Reconfigure(const FIRConfig& config) {
    if (config.channels == m_config.channels) {
        m_impl->SetCoefficients(config);
    } else {
        m_form = ChooseForm(config.channels);
        m_impl = std::make_unique<FIRImpl>(m_form, config, m_impl->TakeHistory());
    }
    m_config = config;
}

void FIR::Process(const float* const* in, float* const* out, std::size_t frames) noexcept {
    m_impl->Process(in, out, frames);
}

void FIR::Reset() noexcept { m_impl->Reset(); }

}  // namespace ora::numeric
