#include "Algorithms/FIRS.h"

#include <algorithm>

#include "Algorithms/FilterHistory.h"
#include "Algorithms/simd/FIRKernels.h"

namespace ora::numeric {

namespace kernels {

void FIRS_ref(const float* run, const float* half, std::size_t length, float* out, std::size_t frames) {
    const std::size_t pairs = length / 2;
    for (std::size_t n = 0; n < frames; ++n) {
        float acc = 0.0f;
        for (std::size_t j = 0; j < pairs; ++j) acc += half[j] * (run[n + j] + run[n + length - 1 - j]);
        if (length % 2 != 0) acc += half[pairs] * run[n + pairs];
        out[n] = acc;
    }
}

}  // namespace kernels

namespace {

using system::KernelForm;

struct FIRSForm {
    kernels::FirOneKernel one;
    kernels::FirTwoKernel two;  // null: channel by channel
};

FIRSForm FormKernels(KernelForm form) {
    switch (form) {
        case KernelForm::M256Fma: return {kernels::FIRS_c1_m256_fma, kernels::FIRS_c2_m256_fma};
        case KernelForm::M256: return {kernels::FIRS_c1_m256, kernels::FIRS_c2_m256};
        case KernelForm::M128Fma: return {kernels::FIRS_c1_m128_fma, kernels::FIRS_c2_m128_fma};
        case KernelForm::M128: return {kernels::FIRS_c1_m128, kernels::FIRS_c2_m128};
        default: return {kernels::FIRS_ref, nullptr};
    }
}

KernelForm ChooseForm(int channels) { return channels <= 2 ? system::ChooseKernelForm() : KernelForm::Ref; }

FIRSConfig Normalised(FIRSConfig config) {
    config.length = std::max<std::size_t>(config.length, 1);
    config.half.resize((config.length + 1) / 2, 0.0f);
    return config;
}

}  // namespace

class FIRSImpl {
public:
    FIRSImpl(KernelForm form, const FIRSConfig& config, FilterHistory history)
        : m_kernels(FormKernels(form)), m_history(std::move(history)) {
        SetCoefficients(config);
    }

    // Allocates.
    void SetCoefficients(const FIRSConfig& config) {
        m_half = config.half;
        m_length = config.length;
        m_history.Dimension(config.channels, m_length - 1);
    }

    void Process(const float* const* in, float* const* out, std::size_t frames) noexcept {
        const int channels = m_history.Channels();
        for (std::size_t done = 0; done < frames;) {
            const std::size_t n = std::min(frames - done, FilterHistory::kChunk);
            if (channels == 2 && m_kernels.two != nullptr) {
                const float* run0 = m_history.Load(0, in[0] + done, n);
                const float* run1 = m_history.Load(1, in[1] + done, n);
                m_kernels.two(run0, run1, m_half.data(), m_length, out[0] + done, out[1] + done, n);
                m_history.Advance(0, n);
                m_history.Advance(1, n);
            } else {
                for (int c = 0; c < channels; ++c) {
                    const float* run = m_history.Load(c, in[c] + done, n);
                    m_kernels.one(run, m_half.data(), m_length, out[c] + done, n);
                    m_history.Advance(c, n);
                }
            }
            done += n;
        }
    }

    void Reset() noexcept { m_history.Clear(); }
    FilterHistory TakeHistory() { return std::move(m_history); }

private:
    FIRSForm m_kernels;
    std::vector<float> m_half;
    std::size_t m_length = 1;
    FilterHistory m_history;
};

FIRS::FIRS(const FIRSConfig& config)
    : m_config(Normalised(config)),
      m_form(ChooseForm(m_config.channels)),
      m_impl(std::make_unique<FIRSImpl>(m_form, m_config, FilterHistory())) {}

FIRS::~FIRS() = default;

void FIRS::Reconfigure(const FIRSConfig& config) {
    const FIRSConfig normalised = Normalised(config);
    if (normalised.channels == m_config.channels) {
        m_impl->SetCoefficients(normalised);
    } else {
        m_form = ChooseForm(normalised.channels);
        m_impl = std::make_unique<FIRSImpl>(m_form, normalised, m_impl->TakeHistory());
    }
    m_config = normalised;
}

void FIRS::Process(const float* const* in, float* const* out, std::size_t frames) noexcept {
    m_impl->Process(in, out, frames);
}

void FIRS::Reset() noexcept { m_impl->Reset(); }

}  // namespace ora::numeric
