// The suppression rule: the MMSE log-spectral-amplitude estimator of
// Ephraim and Malah with a decision-directed a-priori SNR, combined with a
// speech-presence probability as the optimally-modified LSA does: where
// speech is unlikely the gain falls to the floor, where it is certain the
// LSA gain applies, geometrically in between. A bin therefore rests at the
// floor in noise instead of flickering around it.
//
// The noise power handed in is multiplied by the over-subtraction factor
// (the sensitivity) before the SNRs are formed.
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

    bool Configure(std::size_t channels, std::size_t bins);
    void Reset() noexcept;

    // Gains of one channel's frame from its periodogram and noise power.
    // `floor` is the least gain (0 < floor <= 1). `presence`, when given,
    // is a prior speech-presence per bin (0..1) in place of kAbsencePrior.
    void Compute(std::size_t channel, const float* power, const float* noise, float overSubtraction, float floor,
                 const float* presence, float* gain) noexcept;

    // The gain of the LSA estimator alone for an a-priori SNR `xi` and an
    // a-posteriori SNR `gamma` (exposed for tests).
    static float LsaGain(float xi, float gamma) noexcept;

private:
    std::size_t m_channels = 0;
    std::size_t m_bins = 0;
    ora::AlignedBuffer<float> m_previous;  // last frame's clean power over noise power
    ora::AlignedBuffer<unsigned char> m_started;
};

}  // namespace zen::noise_reduction
