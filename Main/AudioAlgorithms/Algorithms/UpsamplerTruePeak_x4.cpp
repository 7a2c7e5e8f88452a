#include "Algorithms/UpsamplerTruePeak_x4.h"

#include <algorithm>
#include <cmath>
#include <vector>

#include "Algorithms/FilterHistory.h"
#include "Algorithms/simd/TruePeakKernels.h"

namespace ora::numeric {

namespace kernels {

void UpsamplerTruePeak_x4_ref(const float* run, const float* phases, std::size_t taps, float* out, std::size_t frames) {
    const std::size_t identity = taps / 2 - 1;
    for (std::size_t n = 0; n < frames; ++n) {
        out[4 * n] = run[n + identity];
        for (std::size_t p = 0; p < 3; ++p) {
            float acc = 0.0f;
            for (std::size_t j = 0; j < taps; ++j) acc += phases[p * taps + j] * run[n + j];
            out[4 * n + 1 + p] = acc;
        }
    }
}

}  // namespace kernels

namespace {

using system::KernelForm;

constexpr std::size_t kStandardTaps = 12;
constexpr double kStandardBeta = 6.0;
constexpr std::size_t kWidebandTaps = 48;
constexpr double kWidebandBeta = 5.0;

// Phases 1..3 of a Kaiser-windowed sinc over `taps` inputs, centred on
// phase 0's tap taps / 2 (so that phase 0 is the identity), each phase
// normalised and stored last-first.
std::vector<float> DesignPhases(std::size_t taps, double beta) {
    constexpr double kPi = 3.14159265358979323846;
    const std::size_t factor = kernels::kTruePeakFactor;
    const double centre = static_cast<double>(factor * (taps / 2));
    std::vector<double> prototype(factor * taps);
    for (std::size_t j = 0; j < prototype.size(); ++j) {
        const double offset = static_cast<double>(j) - centre;  // in oversampled steps
        const double t = offset / static_cast<double>(factor);
        const double sinc = t == 0.0 ? 1.0 : std::sin(kPi * t) / (kPi * t);
        const double edge = std::max(0.0, 1.0 - (offset / centre) * (offset / centre));
        prototype[j] = sinc * std::cyl_bessel_i(0.0, beta * std::sqrt(edge)) / std::cyl_bessel_i(0.0, beta);
    }
    std::vector<float> phases(3 * taps);
    for (std::size_t p = 1; p < factor; ++p) {
        double dc = 0.0;
        for (std::size_t k = 0; k < taps; ++k) dc += prototype[factor * k + p];
        for (std::size_t k = 0; k < taps; ++k)
            phases[(p - 1) * taps + (taps - 1 - k)] = static_cast<float>(prototype[factor * k + p] / dc);
    }
    return phases;
}

kernels::UpsampleTruePeakKernel FormKernel(KernelForm form) {
    switch (form) {
        case KernelForm::M256Fma: return kernels::UpsamplerTruePeak_x4_m256_fma;
        case KernelForm::M256: return kernels::UpsamplerTruePeak_x4_m256;
        case KernelForm::M128Fma: return kernels::UpsamplerTruePeak_x4_m128_fma;
        case KernelForm::M128: return kernels::UpsamplerTruePeak_x4_m128;
        default: return kernels::UpsamplerTruePeak_x4_ref;
    }
}

KernelForm ChooseForm(int channels) { return channels <= 2 ? system::ChooseKernelForm() : KernelForm::Ref; }

}  // namespace

class UpsamplerTruePeakImpl {
public:
    UpsamplerTruePeakImpl(KernelForm form, const UpsamplerTruePeakConfig& config, FilterHistory history)
        : m_kernel(FormKernel(form)),
          m_taps(UpsamplerTruePeak_x4::TapsPerPhase(config.filter)),
          m_phases(UpsamplerTruePeak_x4::PhaseTaps(config.filter)),
          m_history(std::move(history)) {
        m_history.Dimension(config.channels, m_taps - 1);
    }

    void Process(const float* const* in, float* const* out, std::size_t frames) noexcept {
        for (int c = 0; c < m_history.Channels(); ++c) {
            for (std::size_t done = 0; done < frames;) {
                const std::size_t n = std::min(frames - done, FilterHistory::kChunk);
                m_kernel(m_history.Load(c, in[c] + done, n), m_phases, m_taps, out[c] + kernels::kTruePeakFactor * done,
                         n);
                m_history.Advance(c, n);
                done += n;
            }
        }
    }

    void Reset() noexcept { m_history.Clear(); }
    FilterHistory TakeHistory() { return std::move(m_history); }

private:
    kernels::UpsampleTruePeakKernel m_kernel;
    std::size_t m_taps;
    const float* m_phases;
    FilterHistory m_history;
};

UpsamplerTruePeak_x4::UpsamplerTruePeak_x4(const UpsamplerTruePeakConfig& config)
    : m_config(config),
      m_form(ChooseForm(config.channels)),
      m_impl(std::make_unique<UpsamplerTruePeakImpl>(m_form, config, FilterHistory())) {}

UpsamplerTruePeak_x4::~UpsamplerTruePeak_x4() = default;

void UpsamplerTruePeak_x4::Reconfigure(const UpsamplerTruePeakConfig& config) {
    if (config == m_config) return;
    m_form = ChooseForm(config.channels);
    m_impl = std::make_unique<UpsamplerTruePeakImpl>(m_form, config, m_impl->TakeHistory());
    m_config = config;
}

void UpsamplerTruePeak_x4::Process(const float* const* in, float* const* out, std::size_t frames) noexcept {
    m_impl->Process(in, out, frames);
}

void UpsamplerTruePeak_x4::Reset() noexcept { m_impl->Reset(); }

std::size_t UpsamplerTruePeak_x4::TapsPerPhase(TruePeakFilter filter) {
    return filter == TruePeakFilter::Wideband ? kWidebandTaps : kStandardTaps;
}

const float* UpsamplerTruePeak_x4::PhaseTaps(TruePeakFilter filter) {
    static const std::vector<float> standard = DesignPhases(kStandardTaps, kStandardBeta);
    static const std::vector<float> wideband = DesignPhases(kWidebandTaps, kWidebandBeta);
    return filter == TruePeakFilter::Wideband ? wideband.data() : standard.data();
}

}  // namespace ora::numeric
