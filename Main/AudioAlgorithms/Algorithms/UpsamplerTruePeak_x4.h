// 4x oversampling for true-peak measurement through a polyphase filter of 4
// phases. Each input yields four points in time order: the input itself
// (phase 0, delayed by GetLatency() inputs) and the waveform a quarter, a
// half and three quarters of a sample later.
//
// Two designs, both Kaiser-windowed sincs cut off at half the input rate,
// each phase normalised to unit gain at DC:
// - Standard: 48 taps (12 per phase, beta 6), the interpolator ITU-R
//   BS.1770-4 describes; every phase stays within 0.0015 of the ideal
//   fractional delay up to 0.34 of the rate (15 kHz at 44.1 kHz).
// - Wideband: 192 taps (48 per phase, beta 5), within 0.005 up to 0.46 of
//   the rate: what a brick-wall limiter needs to see the peaks that content
//   near Nyquist (noise, squares, clipped material) adds between samples.
#pragma once

#include <cstddef>
#include <memory>

#include "System/DispatchSettings.h"

namespace ora::numeric {

enum class TruePeakFilter { Standard, Wideband };

struct UpsamplerTruePeakConfig {
    int channels = 1;
    TruePeakFilter filter = TruePeakFilter::Standard;

    bool operator==(const UpsamplerTruePeakConfig& other) const {
        return channels == other.channels && filter == other.filter;
    }
};

class UpsamplerTruePeakImpl;

class UpsamplerTruePeak_x4 {
public:
    static constexpr std::size_t kFactor = 4;

    explicit UpsamplerTruePeak_x4(const UpsamplerTruePeakConfig& config = {});
    ~UpsamplerTruePeak_x4();
    UpsamplerTruePeak_x4(const UpsamplerTruePeak_x4&) = delete;
    UpsamplerTruePeak_x4& operator=(const UpsamplerTruePeak_x4&) = delete;

    // Allocates; channels that stay keep their history.
    void Reconfigure(const UpsamplerTruePeakConfig& config);

    // `in`: planar channels of `frames` inputs; `out`: planar channels of
    // kFactor * frames points.
    void Process(const float* const* in, float* const* out, std::size_t frames) noexcept;
    void Process(const float* in, float* out, std::size_t frames) noexcept { Process(&in, &out, frames); }
    void Reset() noexcept;

    // In input samples.
    std::size_t GetLatency() const { return Latency(m_config.filter); }
    static std::size_t Latency(TruePeakFilter filter) { return TapsPerPhase(filter) / 2; }
    static std::size_t TapsPerPhase(TruePeakFilter filter);
    // Taps of phases 1, 2 and 3 (phase 0 is the identity), each last-first.
    static const float* PhaseTaps(TruePeakFilter filter);

    int GetChannelCount() const { return m_config.channels; }
    system::KernelForm GetForm() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }
    bool operator==(const UpsamplerTruePeak_x4& other) const { return m_config == other.m_config; }

private:
    UpsamplerTruePeakConfig m_config;
    system::KernelForm m_form;
    std::unique_ptr<UpsamplerTruePeakImpl> m_impl;
};

}  // namespace ora::numeric
