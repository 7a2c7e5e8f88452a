// One arrangement of the chorus's voices: for each channel, up to four LFOs
// spaced over a cycle (the right channel turned by the spread), each read at
// a control rate and drawn straight between its control points, and the
// voices' reads from that channel's delay line summed at 1 / voices.
// A switch of voice count, spread or shape builds a new set and cross-fades
// to it; the old set keeps sounding until the fade ends. Real-time safe.
#pragma once

#include <array>
#include <cstdint>

#include "Common/Algorithms/Lfo.h"
#include "Common/Algorithms/ModulatedDelayLine.h"

class ChorusVoiceSet {
public:
    static constexpr std::uint32_t kMaxVoices = 4;
    static constexpr std::uint32_t kMaxChannels = 2;
    // Samples between control points: a 5 Hz LFO drawn in straight lines at
    // 3 kHz strays from its curve by under 1e-4 of its depth.
    static constexpr std::uint32_t kControlStep = 16;

    // Where voice v of `voices` starts its LFO cycle on a channel.
    static double VoicePhase(std::uint32_t channel, std::uint32_t voice, std::uint32_t voices, float spread);

    void SetSampleRate(double sampleRate) noexcept;
    void SetRate(double hertz) noexcept;
    // Spaces the voices anew and restarts their cycles.
    void Configure(std::uint32_t voices, float spread, Lfo::Shape shape) noexcept;
    void Reset() noexcept;

    std::uint32_t Voices() const { return m_voices; }
    float Spread() const { return m_spread; }
    Lfo::Shape Shape() const { return m_shape; }

    // wet[i] = the voices of `channel` at delay centre[i] + swing[i] lfo, in
    // samples before frame i of a block of `frames` already pushed into `line`.
    void Render(const ModulatedDelayLine& line, std::uint32_t channel, const double* centre, const double* swing,
                float* wet, std::uint32_t frames) noexcept;

private:
    struct Voice {
        Lfo lfo;
        float from = 0.0f;  // the LFO at the last control point
        float to = 0.0f;    // and at the next
        std::uint32_t countdown = 0;
    };

    std::array<std::array<Voice, kMaxVoices>, kMaxChannels> m_voiceStates;
    std::uint32_t m_voices = 2;
    float m_spread = 0.0f;
    Lfo::Shape m_shape = Lfo::kSine;
};
