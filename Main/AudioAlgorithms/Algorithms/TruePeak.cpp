#include "Algorithms/TruePeak.h"

#include <algorithm>
#include <cmath>

#include "Algorithms/FilterHistory.h"
#include "Algorithms/UpsamplerTruePeak_x4.h"
#include "Algorithms/simd/TruePeakKernels.h"
#include "System/AlignedBuffer.h"

namespace ora::numeric {

namespace kernels {

float TruePeakScan_ref(const float* points, std::size_t middles, float peak) {
    for (std::size_t i = 1; i <= middles; ++i) {
        const float a = std::fabs(points[i - 1]);
        const float b = std::fabs(points[i]);
        const float c = std::fabs(points[i + 1]);
        const float d = (b - a) + (b - c);
        float v = b;
        if (b >= a && b >= c && d > 0.0f) v = b + (c - a) * (c - a) / (8.0f * d);
        if (v > peak) peak = v;
    }
    return peak;
}

}  // namespace kernels

namespace {

using system::KernelForm;

struct TruePeakForm {
    kernels::UpsampleTruePeakKernel upsample;
    kernels::ScanTruePeakKernel scan;
};

TruePeakForm FormKernels(KernelForm form) {
    switch (form) {
        case KernelForm::M256Fma: return {kernels::UpsamplerTruePeak_x4_m256_fma, kernels::TruePeakScan_m256};
        case KernelForm::M256: return {kernels::UpsamplerTruePeak_x4_m256, kernels::TruePeakScan_m256};
        case KernelForm::M128Fma: return {kernels::UpsamplerTruePeak_x4_m128_fma, kernels::TruePeakScan_m128};
        case KernelForm::M128: return {kernels::UpsamplerTruePeak_x4_m128, kernels::TruePeakScan_m128};
        default: return {kernels::UpsamplerTruePeak_x4_ref, kernels::TruePeakScan_ref};
    }
}

KernelForm ChooseForm(int channels) { return channels <= 2 ? system::ChooseKernelForm() : KernelForm::Ref; }

// The two newest points of each channel wait for their right-hand neighbour.
constexpr std::size_t kCarried = 2;

}  // namespace

class TruePeakImpl {
public:
    // The state handed to a rebuilt implementation.
    struct State {
        FilterHistory history;
        std::vector<float> carried;  // kCarried per channel
    };

    TruePeakImpl(KernelForm form, int channels, TruePeakFilter filter, State state)
        : m_kernels(FormKernels(form)),
          m_taps(UpsamplerTruePeak_x4::TapsPerPhase(filter)),
          m_phases(UpsamplerTruePeak_x4::PhaseTaps(filter)),
          m_state(std::move(state)),
          m_points(kernels::kTruePeakFactor * FilterHistory::kChunk + kCarried),
          m_peaks(static_cast<std::size_t>(channels), 0.0f) {
        m_state.history.Dimension(channels, m_taps - 1);
        m_state.carried.resize(kCarried * static_cast<std::size_t>(channels), 0.0f);
    }

    float Process(const float* const* in, std::size_t frames) noexcept {
        float* points = m_points.data();
        float largest = 0.0f;
        for (int c = 0; c < m_state.history.Channels(); ++c) {
            float* carried = m_state.carried.data() + kCarried * static_cast<std::size_t>(c);
            float peak = 0.0f;
            for (std::size_t done = 0; done < frames;) {
                const std::size_t n = std::min(frames - done, FilterHistory::kChunk);
                const std::size_t count = kernels::kTruePeakFactor * n;
                points[0] = carried[0];
                points[1] = carried[1];
                m_kernels.upsample(m_state.history.Load(c, in[c] + done, n), m_phases, m_taps, points + kCarried, n);
                m_state.history.Advance(c, n);
                peak = m_kernels.scan(points, count, peak);
                carried[0] = points[count];
                carried[1] = points[count + 1];
                done += n;
            }
            m_peaks[static_cast<std::size_t>(c)] = peak;
            largest = std::max(largest, peak);
        }
        return largest;
    }

    float GetChannelPeak(int channel) const { return m_peaks[static_cast<std::size_t>(channel)]; }

    void Reset() noexcept {
        m_state.history.Clear();
        std::fill(m_state.carried.begin(), m_state.carried.end(), 0.0f);
        std::fill(m_peaks.begin(), m_peaks.end(), 0.0f);
    }

    State TakeState() { return std::move(m_state); }

private:
    TruePeakForm m_kernels;
    std::size_t m_taps;
    const float* m_phases;
    State m_state;
    AlignedBuffer<float> m_points;
    std::vector<float> m_peaks;
};

TruePeak::TruePeak(const TruePeakConfig& config)
    : m_config(config),
      m_form(ChooseForm(config.channels)),
      m_impl(std::make_unique<TruePeakImpl>(m_form, config.channels, config.filter, TruePeakImpl::State())) {}

TruePeak::~TruePeak() = default;

void TruePeak::Reconfigure(const TruePeakConfig& config) {
    if (config.channels != m_config.channels || config.filter != m_config.filter) {
        m_form = ChooseForm(config.channels);
        m_impl = std::make_unique<TruePeakImpl>(m_form, config.channels, config.filter, m_impl->TakeState());
    }
    m_config = config;
}

float TruePeak::Process(const float* const* channels, std::size_t frames) noexcept {
    return m_impl->Process(channels, frames) * m_config.factor;
}

float TruePeak::GetChannelPeak(int channel) const {
    if (channel < 0 || channel >= m_config.channels) return 0.0f;
    return m_impl->GetChannelPeak(channel) * m_config.factor;
}

void TruePeak::Reset() noexcept { m_impl->Reset(); }

}  // namespace ora::numeric
