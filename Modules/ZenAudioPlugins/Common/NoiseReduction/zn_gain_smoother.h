// Musical-noise control: the gains of a frame are averaged over a band that
// widens with frequency (a fixed share of an octave, where isolated bins
// are heard as chirps while speech harmonics stay resolved below), then
// over time by a one-pole smoother. An isolated bin that the suppression
// rule let through for one frame is spread thin in both directions; speech,
// which persists over frames and neighbouring bins, keeps its gain.
//
// Amount 0 leaves the gains as they are; 1 smooths over kMaxOctaves and
// kMaxTimeSeconds. Configure allocates; Process and Reset are real-time safe.
#pragma once

#include <cstddef>

#include "System/AlignedBuffer.h"

namespace zen::noise_reduction {

class zn_gain_smoother {
public:
    static constexpr double kMaxOctaves = 1.0 / 6.0;     // band width at amount 1 (wider thins the voice)
    static constexpr double kMaxTimeSeconds = 0.005;     // time constant at amount 1 (longer blurs onsets)
    static constexpr double kLowestSmoothedHz = 300.0;   // below, bins stay apart (harmonics of voices)

    bool Configure(std::size_t channels, std::size_t bins, double sampleRate, double hopSeconds);
    void Reset() noexcept;
    void SetAmount(float amount) noexcept;
    float Amount() const { return m_amount; }

    // Smooths one channel's gains in place; none falls below `floor`.
    void Process(std::size_t channel, float* gain, float floor) noexcept;

private:
    std::size_t m_channels = 0;
    std::size_t m_bins = 0;
    double m_binHz = 1.0;
    double m_hopSeconds = 0.01;
    float m_amount = 0.0f;
    float m_timeCoefficient = 0.0f;
    ora::AlignedBuffer<std::size_t> m_halfWidth;  // per bin, at the current amount
    ora::AlignedBuffer<double> m_prefix;
    ora::AlignedBuffer<float> m_smoothed;  // channels x bins
    ora::AlignedBuffer<unsigned char> m_started;
};

}  // namespace zen::noise_reduction
