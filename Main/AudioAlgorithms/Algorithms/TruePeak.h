// True-peak measurement as ITU-R BS.1770-4 describes it: the signal is
// oversampled 4 times through a polyphase interpolator (UpsamplerTruePeak_x4,
// by default the 48-tap Standard filter) and the largest magnitude is taken,
// the input samples included. Each local maximum of the oversampled points
// is then raised to the vertex of the parabola through it and its two
// neighbours: plain 4x points can miss a sine's crest by up to 0.3 dB at
// 15 kHz (44.1 kHz); the refined reading stays within 0.02 dB up to there.
//
// A block's reading covers the waveform GetLatency() samples behind the
// block. Readings are linear, scaled by the configured factor.
#pragma once

#include <cstddef>
#include <memory>
#include <vector>

#include "Algorithms/UpsamplerTruePeak_x4.h"
#include "System/DispatchSettings.h"

namespace ora::numeric {

struct TruePeakConfig {
    int channels = 1;
    float factor = 1.0f;  // readings are multiplied by it
    TruePeakFilter filter = TruePeakFilter::Standard;

    bool operator==(const TruePeakConfig& other) const {
        return channels == other.channels && factor == other.factor && filter == other.filter;
    }
};

class TruePeakImpl;

class TruePeak {
public:
    explicit TruePeak(const TruePeakConfig& config = {});
    ~TruePeak();
    TruePeak(const TruePeak&) = delete;
    TruePeak& operator=(const TruePeak&) = delete;

    // Allocates; channels that stay keep their history.
    void Reconfigure(const TruePeakConfig& config);

    // The true peak of the block, the largest of its channels' (planar).
    float Process(const float* const* channels, std::size_t frames) noexcept;
    float Process(const float* samples, std::size_t frames) noexcept { return Process(&samples, frames); }
    // The last block's reading of one channel.
    float GetChannelPeak(int channel) const;
    void Reset() noexcept;

    // In samples.
    std::size_t GetLatency() const { return UpsamplerTruePeak_x4::Latency(m_config.filter); }

    int GetChannelCount() const { return m_config.channels; }
    system::KernelForm GetForm() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }
    bool operator==(const TruePeak& other) const { return m_config == other.m_config; }

private:
    TruePeakConfig m_config;
    system::KernelForm m_form;
    std::unique_ptr<TruePeakImpl> m_impl;
};

}  // namespace ora::numeric
