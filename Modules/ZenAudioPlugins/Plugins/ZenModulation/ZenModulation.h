// "Modulation": one LFO per channel driving one of four effects.
// - "Phaser": a chain of first-order allpass sections whose break frequency
//   swings around "Frequency" by up to two octaves either way, with feedback
//   from the chain's output to its input; mixed with the dry signal, their
//   phase differences make the moving notches.
// - "Tremolo": the level dips by up to "Depth" and back.
// - "Vibrato": the pitch wobbles: a delay swinging by up to +-2 ms.
// - "Auto-Pan": channel pairs (1-2, 3-4, ...) swing between left and right
//   (a balance law: the side moved toward stays whole); with an odd count
//   the last channel is left as it is.
// "Spread" spaces the channels' LFOs over up to a whole cycle (stereo: half
// a cycle). Rate free in Hz or synced to a note value of "Tempo". 1 to 8 channels.
#pragma once

#include <array>

#include "Common/Algorithms/Lfo.h"
#include "Common/Algorithms/LfoRate.h"
#include "Common/Algorithms/ModulatedDelayLine.h"
#include "Common/ZenAudioPluginImpl.h"

class ZenModulation : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    enum Parameter : std::uint32_t {
        kMode,
        kRate,
        kSync,
        kTempo,
        kDepth,
        kShape,
        kSpread,
        kFrequency,
        kStages,
        kFeedback,
        kMix,
    };
    enum Mode { kPhaser, kTremolo, kVibrato, kAutoPan };
    enum Meter : std::uint32_t { kOutputPeak };

    static constexpr std::uint32_t kMaxChannels = 8;
    static constexpr std::uint32_t kMaxStages = 12;
    static constexpr std::uint32_t kStageCounts[] = {2, 4, 6, 8, 12};
    static constexpr double kPhaserOctaves = 2.0;  // swing at full depth, either way
    static constexpr double kVibratoMs = 2.0;      // swing at full depth, either way
    static constexpr double kVibratoCentreMs = 3.0;
    static constexpr double kTailDb = 110.0;
    // The phaser's sections are retuned on this grid of samples (counted
    // from Prepare, so the host's block size does not matter).
    static constexpr std::uint32_t kRetuneStep = 16;

    ZenModulation();

    static const zen::ParameterTableDefinition& Definitions();
    static const zen::MeterTableDefinition& Meters();

    // The first-order allpass coefficient a of H = (a + z^-1) / (1 + a z^-1)
    // that turns the phase by 90 degrees at `frequency`.
    static double AllpassCoefficient(double frequency, double sampleRate);

    std::uint32_t GetTailLength() const override;
    bool ApplyNeutralSetting() override;

protected:
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    void PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    struct Phaser {
        std::array<double, kMaxStages> state{};
        double last = 0.0;  // the chain's previous output, fed back
        double a = 0.0;     // the sections' coefficient since the last grid point
    };

    void UpdateRate() noexcept;
    void UpdatePhases() noexcept;
    void RunPhaser(std::uint32_t c, float* samples, std::uint32_t frames) noexcept;
    void RunTremolo(std::uint32_t c, float* samples, std::uint32_t frames) noexcept;
    void RunVibrato(std::uint32_t c, float* samples, std::uint32_t frames) noexcept;
    void RunAutoPan(std::uint32_t c, float* left, float* right, std::uint32_t frames) noexcept;

    std::array<Lfo, kMaxChannels> m_lfos;
    std::array<Phaser, kMaxChannels> m_phasers;
    std::array<ModulatedDelayLine, kMaxChannels> m_lines;

    // Audio thread.
    bool m_fresh = true;  // no audio since the last reset
    Mode m_mode = kPhaser;
    std::uint32_t m_stages = 4;
    LfoRate m_rate;
    float m_spread = 0.0f;
    std::uint32_t m_channelCount = 2;
    std::uint64_t m_position = 0;  // samples since Prepare
};
