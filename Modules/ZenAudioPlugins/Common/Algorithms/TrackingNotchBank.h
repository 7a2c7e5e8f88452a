// Removes a hum and its harmonics: one narrow notch at each multiple of a
// fundamental that follows the hum's real frequency within kTrackingRange
// of the nominal one.
//
// Each notch is an adaptive canceller: a complex weight per channel and
// harmonic, fed with the output's error against a reference phasor at
// k x f0, so each null is exact at its harmonic and the notches do not
// disturb each other. Widths grow with the harmonic (constant Q): the
// fundamental's notch is "Width" wide at -3 dB, the k-th k times that, so a
// drift of the fundamental costs every harmonic the same depth.
//
// Tracking: a canceller's weight turns as fast as its harmonic runs away
// from the reference, and holds that harmonic alone (the others are gone
// from the error it learns from). The turns, weighted by the harmonics'
// strength, give the fundamental's frequency error, which a loop with a
// second integrator follows, so a slow drift is tracked without lag.
#pragma once

#include <array>
#include <complex>
#include <cstdint>
#include <vector>

#include "../ZenAudioAlgorithm.h"

class TrackingNotchBank : public ZenAudioAlgorithm {
    Q_OBJECT

public:
    enum Parameter : std::uint64_t { kFundamental, kHarmonics, kWidth, kTracking };

    static constexpr std::size_t kMaxHarmonics = 20;
    static constexpr double kTrackingRange = 1.0;     // Hz either side of the nominal fundamental
    static constexpr std::uint32_t kUpdateInterval = 32;  // samples between frequency updates
    // The loop's gains per update: the error's share, and its integral's.
    static constexpr double kLoopGain = 0.01;
    static constexpr double kLoopRateGain = kLoopGain * kLoopGain / 4.0;
    // Inputs beyond this magnitude are held at it while adapting.
    static constexpr double kInputLimit = 1000.0;

    TrackingNotchBank();

    static const zen::ParameterTableDefinition& Definitions();

    // Sizes scratch for the channel count and maxBlock, then the defaults.
    bool Prepare(float sampleRate, std::uint32_t maxBlock) override;
    void SetChannelCount(std::uint64_t channels) override;
    bool SetParameter(std::uint64_t index, float value) override;
    void Reset() override;
    // In place: the input less the hum.
    bool Process(float* const* channels, std::uint64_t count) override;

    // The hum in each channel's block, written to `hum` (same layout); the
    // input is left as it is. Adapts and tracks.
    void EstimateHum(const float* const* input, float* const* hum, std::uint64_t count) noexcept;

    // The fundamental the notches sit on now (Hz).
    double GetTrackedFrequency() const { return m_frequency; }

    // What the bank takes as hum at `frequency` with the notches held on
    // `fundamental`: the steady state of the cancellers, each an integrator
    // of its harmonic's error, G = sum a_k (2 cos w_k z^-1 - 2 z^-2) /
    // (1 - 2 cos w_k z^-1 + z^-2), so the hum is G / (1 + G) of the input.
    std::complex<double> HumTransfer(double frequency, double fundamental) const;

private:
    struct ChannelState {
        std::array<std::complex<double>, kMaxHarmonics> weight{};    // the cancellers
        std::array<std::complex<double>, kMaxHarmonics> previous{};  // the weights at the last update
    };

    void Redesign();
    void SetFrequency(double hertz);
    void UpdateFrequency() noexcept;

    std::vector<ChannelState> m_channels;
    std::vector<float> m_scratch;  // Process: the hum, channel-major, one block each
    std::vector<const float*> m_in;
    std::vector<float*> m_hum;
    std::array<double, kMaxHarmonics> m_step{};  // canceller step per harmonic

    double m_nominal = 50.0;
    std::size_t m_harmonics = 10;
    double m_width = 1.0;
    bool m_tracking = true;

    double m_frequency = 50.0;      // tracked
    double m_frequencyRate = 0.0;   // the loop's second integrator, Hz per update
    std::complex<double> m_phasor{1.0, 0.0};    // e^{j theta}
    std::complex<double> m_rotation{1.0, 0.0};  // e^{j 2 pi f / fs}
    std::uint32_t m_sinceUpdate = 0;
};
