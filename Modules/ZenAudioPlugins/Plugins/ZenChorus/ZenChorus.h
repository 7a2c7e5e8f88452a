// "Chorus": up to four voices per channel, each a copy of the input read
// from a delay line whose time swings around "Delay" by "Depth", driven by
// its own LFO. The voices' LFOs are spaced evenly over a cycle, and "Spread"
// turns the right channel's up to half a cycle against the left, so the two
// sides move apart. Rate free in Hz or synced to a note value of "Tempo".
#pragma once

#include <array>
#include <vector>

#include "Common/Algorithms/Lfo.h"
#include "Common/Algorithms/LfoRate.h"
#include "Common/Algorithms/ModulatedDelayLine.h"
#include "Common/ZenAudioPluginImpl.h"

class ZenChorus : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    enum Parameter : std::uint32_t { kVoices, kRate, kSync, kTempo, kDelay, kDepth, kShape, kSpread, kMix };
    enum Meter : std::uint32_t { kOutputPeak };

    static constexpr std::uint32_t kMaxVoices = 4;
    static constexpr std::uint32_t kMaxChannels = 2;
    static constexpr double kMaxDelayMs = 30.0;
    static constexpr double kMaxDepthMs = 5.0;

    ZenChorus();

    static const zen::ParameterTableDefinition& Definitions();
    static const zen::MeterTableDefinition& Meters();

    // Where voice v of `voices` starts its LFO cycle on a channel.
    static double VoicePhase(std::uint32_t channel, std::uint32_t voice, std::uint32_t voices, float spread);

    std::uint32_t GetTailLength() const override;
    bool ApplyNeutralSetting() override;

protected:
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    void PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    void UpdateRate() noexcept;
    void UpdatePhases() noexcept;

    std::array<ModulatedDelayLine, kMaxChannels> m_lines;
    std::array<std::array<Lfo, kMaxVoices>, kMaxChannels> m_lfos;
    // Per-frame scratch of one block (the prepared size): the voices are
    // read one at a time over the whole block, once the block is in the line.
    std::vector<double> m_centre;
    std::vector<double> m_swing;
    std::vector<float> m_mix;
    std::vector<float> m_wet;

    // Audio thread.
    std::uint32_t m_voices = 2;
    LfoRate m_rate;
    float m_spread = 0.0f;
};
