// The suppression rule: the MMSE log-spectral-amplitude estimator of
// Ephraim and Malah with a decision-directed a-priori SNR, combined with a
// speech-presence probability as the optimally-modified LSA does: where
// speech is absent the gain rests at the floor, where it is present the LSA
// gain applies, geometrically in between.
//
// Presence is decided on the noise as estimated: per bin from the SNRs and
// the owner's prior, and per band from the a-priori SNR smoothed over time
// and about a kilohertz (a bin next to a voice's harmonics is taken as
// speech, so that the voice keeps its shape instead of being thinned to its
// strongest bins). The LSA gain itself sees the noise multiplied by the
// owner's factor (the sensitivity): below 1 it spares what the speech masks.
//
// Configure allocates; Compute and Reset are real-time safe.
#pragma once

#include <cstddef>

#include "System/AlignedBuffer.h"

namespace zen::noise_reduction {

class zn_lsa_gain {
public:
    static constexpr float kDecisionDirected = 0.9f;   // weight of the previous frame's clean estimate (frames a quarter apart)
    static constexpr float kMinPrioriSnr = 0.0031623f; // -25 dB: the a-priori SNR of a bin never falls below
    static constexpr float kMaxPosterioriSnr = 1e4f;   // 40 dB
    static constexpr float kMinNoise = 1e-30f;         // no noise yet: every bin is signal
    static constexpr float kAbsencePrior = 0.5f;       // prior probability that a bin holds no speech
    static constexpr float kMinAbsencePrior = 0.05f;
    static constexpr float kMaxAbsencePrior = 0.95f;
    // A band is speech where its smoothed a-priori SNR reaches kBandSpeechDb,
    // and not at all below kBandNoiseDb (log-linear in between).
    static constexpr double kBandHalfWidthHz = 500.0;
    static constexpr double kBandSmoothingSeconds = 0.028;
    static constexpr float kBandNoiseDb = -10.0f;
    static constexpr float kBandSpeechDb = -5.0f;

    bool Configure(std::size_t channels, std::size_t bins, double binHz, double hopSeconds);
    void Reset() noexcept;

    // Gains of one channel's frame from its periodogram and noise power.
    // `overSubtraction` multiplies the noise the LSA gain sees; `floor` is the
    // least gain (0 < floor <= 1); `presence`, when given, is a prior
    // speech presence per bin (0..1) in place of kAbsencePrior.
    void Compute(std::size_t channel, const float* power, const float* noise, float overSubtraction, float floor,
                 const float* presence, float* gain) noexcept;

    // The gain of the LSA estimator alone for an a-priori SNR `xi` and an
    // a-posteriori SNR `gamma` (exposed for tests).
    static float LsaGain(float xi, float gamma) noexcept;

private:
    std::size_t m_channels = 0;
    std::size_t m_bins = 0;
    std::size_t m_bandHalfWidth = 1;
    float m_bandSmoothing = 0.0f;
    ora::AlignedBuffer<float> m_previous;  // last frame's clean power over noise power
    ora::AlignedBuffer<float> m_smoothedSnr;  // a-priori SNR smoothed over time, channels x bins
    ora::AlignedBuffer<unsigned char> m_started;
    ora::AlignedBuffer<float> m_snr;       // this frame's a-priori SNR
    ora::AlignedBuffer<double> m_prefix;   // running sums of the smoothed SNR
};

}  // namespace zen::noise_reduction
