// Adaptive noise estimate by minima-controlled recursive averaging (MCRA):
// each bin's power is smoothed over time and frequency, its minimum over a
// sliding window tracked (kept as the minima of kSubWindows parts, so that
// the window slides by a part rather than jumping by a whole window), and
// where the smoothed power stands well above that minimum speech is taken
// to be present. The noise estimate averages the periodogram recursively,
// more slowly the likelier speech is, so it follows a changing noise floor
// in speech pauses and holds during speech.
//
// A bin whose periodogram stands far above the estimate (kSpeechGate) is
// left out of the average at once: the smoothed presence alone reacts too
// late to keep the first frames of a word out, and what leaks in is speech
// suppressed later. The window's minimum bounds the estimate from below, so
// a noise floor that rises past the gate is followed within a window.
// Where the smoothed power falls below the estimate, the estimate follows it
// down at once. The first kWarmUpSeconds simply average the periodogram.
//
// An owner with a voice-activity decision scales the presence by it: a
// frame outside speech (voice 0) updates every bin as noise.
//
// Configure allocates; Update and Reset are real-time safe.
#pragma once

#include <cstddef>
#include <cstdint>

#include "System/AlignedBuffer.h"

namespace zen::noise_reduction {

class zn_noise_tracker {
public:
    static constexpr double kPowerSmoothingSeconds = 0.072;     // the smoothed power that meets the minimum
    static constexpr double kNoiseSmoothingSeconds = 0.31;      // noise averaging in speech pauses
    static constexpr double kPresenceSmoothingSeconds = 0.01;   // of the presence indicator
    static constexpr double kMinimumWindowSeconds = 1.0;        // a rising floor is followed within a window
    static constexpr std::uint32_t kSubWindows = 4;
    static constexpr float kPresenceRatio = 5.0f;               // smoothed power over minimum: speech (7 dB)
    static constexpr float kPowerFloor = 1e-20f;                // keeps ratios finite on digital silence
    // The noise never stands above the smoothed power by more than this: a
    // floor that fell (or a loud passage learnt as noise) is followed at once.
    static constexpr float kFollowDown = 2.0f;
    // A periodogram this far above the estimate is taken for speech: noise
    // alone exceeds 4.6 times its mean in 1 % of the bins.
    static constexpr float kSpeechGate = 4.6f;
    // The estimate never falls below this share of the window's minimum (the
    // minimum of noise alone runs about 2 dB below its mean).
    static constexpr float kMinimumShare = 0.5f;
    static constexpr double kWarmUpSeconds = 0.25;

    bool Configure(std::size_t channels, std::size_t bins, double hopSeconds);
    void Reset() noexcept;

    // One frame's periodogram of a channel. `voice` in 0..1 scales the
    // speech presence (1: the tracker decides alone).
    void Update(std::size_t channel, const float* power, float voice = 1.0f) noexcept;

    const float* Noise(std::size_t channel) const { return m_noise.data() + channel * m_bins; }
    // Smoothed speech-presence probability per bin, 0..1.
    const float* Presence(std::size_t channel) const { return m_presence.data() + channel * m_bins; }
    std::size_t Bins() const { return m_bins; }

private:
    std::size_t m_channels = 0;
    std::size_t m_bins = 0;
    float m_alphaS = 0.0f;
    float m_alphaD = 0.0f;
    float m_alphaP = 0.0f;
    std::uint32_t m_subWindow = 1;            // frames per part of the minimum window
    std::uint32_t m_warmUp = 1;               // frames averaged plainly after Reset
    ora::AlignedBuffer<float> m_smoothed;     // S
    ora::AlignedBuffer<float> m_minimum;      // Smin
    ora::AlignedBuffer<float> m_running;      // the minimum of the part under way
    ora::AlignedBuffer<float> m_parts;        // the last kSubWindows parts' minima, channels x parts x bins
    ora::AlignedBuffer<std::uint32_t> m_part; // per channel, the part written next
    ora::AlignedBuffer<float> m_noise;        // lambda
    ora::AlignedBuffer<float> m_presence;     // p
    ora::AlignedBuffer<float> m_frequencySmoothed;
    ora::AlignedBuffer<std::uint32_t> m_frames;  // per channel, within the part under way
    ora::AlignedBuffer<std::uint32_t> m_age;     // per channel, frames since Reset (up to the warm-up)
};

}  // namespace zen::noise_reduction
