// "Chorus": up to four voices per channel, each a copy of the input read
// from a delay line whose time swings around "Delay" by "Depth", driven by
// its own LFO. The voices' LFOs are spaced evenly over a cycle, and "Spread"
// turns the right channel's up to half a cycle against the left, so the two
// sides move apart. Rate free in Hz or synced to a note value of "Tempo".
// A change of voices, spread or shape cross-fades to the new arrangement.
#pragma once

#include <array>
#include <vector>

#include "ChorusVoiceSet.h"
#include "Common/Algorithms/LfoRate.h"
#include "Common/Algorithms/ModulatedDelayLine.h"
#include "Common/Algorithms/SwitchFade.h"
#include "Common/ZenAudioPluginImpl.h"

class ZenChorus : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    enum Parameter : std::uint32_t { kVoices, kRate, kSync, kTempo, kDelay, kDepth, kShape, kSpread, kMix };
    enum Meter : std::uint32_t { kOutputPeak };

    static constexpr std::uint32_t kMaxVoices = ChorusVoiceSet::kMaxVoices;
    static constexpr std::uint32_t kMaxChannels = ChorusVoiceSet::kMaxChannels;
    static constexpr double kMaxDelayMs = 30.0;
    static constexpr double kMaxDepthMs = 5.0;

    ZenChorus();

    static const zen::ParameterTableDefinition& Definitions();
    static const zen::MeterTableDefinition& Meters();

    std::uint32_t GetTailLength() const override;
    bool ApplyNeutralSetting() override;

protected:
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    void PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    void UpdateRate() noexcept;
    // Moves to the wanted arrangement: at once before any audio, else by a
    // cross-fade (a change during a fade waits for its end).
    void Rearrange() noexcept;

    std::array<ModulatedDelayLine, kMaxChannels> m_lines;
    // The sounding set, and the one faded from.
    std::array<ChorusVoiceSet, 2> m_sets;
    std::uint32_t m_current = 0;
    SwitchFade m_fade;
    // Per-frame scratch of one block (the prepared size): the voices are
    // read one at a time over the whole block, once the block is in the line.
    std::vector<double> m_centre;
    std::vector<double> m_swing;
    std::vector<float> m_mix;
    std::vector<float> m_wet;
    std::vector<float> m_fadingWet;

    // Audio thread: the wanted arrangement.
    std::uint32_t m_voices = 2;
    float m_spread = 0.0f;
    Lfo::Shape m_shape = Lfo::kSine;
    LfoRate m_rate;
    bool m_fresh = true;  // no audio since the last reset
};
