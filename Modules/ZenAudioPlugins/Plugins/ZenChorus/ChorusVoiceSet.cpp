#include "ChorusVoiceSet.h"

double ChorusVoiceSet::VoicePhase(std::uint32_t channel, std::uint32_t voice, std::uint32_t voices, float spread) {
    return static_cast<double>(voice) / voices + 0.5 * channel * spread / 100.0;
}

void ChorusVoiceSet::SetSampleRate(double sampleRate) noexcept {
    for (auto& voices : m_voiceStates)
        for (Voice& v : voices) v.lfo.SetSampleRate(sampleRate / kControlStep);
}

void ChorusVoiceSet::SetRate(double hertz) noexcept {
    for (auto& voices : m_voiceStates)
        for (Voice& v : voices) v.lfo.SetRate(hertz);
}

void ChorusVoiceSet::Configure(std::uint32_t voices, float spread, Lfo::Shape shape) noexcept {
    m_voices = voices;
    m_spread = spread;
    m_shape = shape;
    Reset();
}

void ChorusVoiceSet::Reset() noexcept {
    for (std::uint32_t c = 0; c < kMaxChannels; ++c)
        for (std::uint32_t i = 0; i < kMaxVoices; ++i) {
            Voice& v = m_voiceStates[c][i];
            v.lfo.SetShape(m_shape);
            v.lfo.SetPhase(VoicePhase(c, i, m_voices, m_spread));
            v.lfo.Reset();
            v.to = v.lfo.Next();
            v.countdown = 0;
        }
}

void ChorusVoiceSet::Render(const ModulatedDelayLine& line, std::uint32_t channel, const double* centre,
                            const double* swing, float* wet, std::uint32_t frames) noexcept {
    constexpr float kStepFraction = 1.0f / kControlStep;
    const float gain = 1.0f / static_cast<float>(m_voices);
    for (std::uint32_t i = 0; i < frames; ++i) wet[i] = 0.0f;
    for (std::uint32_t n = 0; n < m_voices; ++n) {
        Voice& v = m_voiceStates[channel][n];
        std::uint32_t i = 0;
        while (i < frames) {
            if (v.countdown == 0) {
                v.from = v.to;
                v.to = v.lfo.Next();
                v.countdown = kControlStep;
            }
            const std::uint32_t run = frames - i < v.countdown ? frames - i : v.countdown;
            const float slope = (v.to - v.from) * kStepFraction;
            // The position in the segment, not a running sum: the same value
            // at the same sample in any block split.
            auto k = static_cast<float>(kControlStep - v.countdown);
            for (const std::uint32_t end = i + run; i < end; ++i, k += 1.0f) {
                const double lfo = v.from + slope * k;
                wet[i] += line.Read(centre[i] + swing[i] * lfo + static_cast<double>(frames - i));
            }
            v.countdown -= run;
        }
    }
    for (std::uint32_t i = 0; i < frames; ++i) wet[i] *= gain;
}
