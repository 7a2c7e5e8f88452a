// "Monitor": a signal source for checking a loudspeaker system, with no
// audio input and 1 to 32 outputs. "Signal" is pink noise band-limited to
// 500 Hz - 2 kHz (decorrelated per channel), a sine at "Frequency", or a
// polarity pulse (a short positive raised-cosine bump twice a second: a
// speaker wired in reverse moves inward first). "Level" is the RMS of noise
// and sine; its default, -20 dBFS, is the calibration level. "Output"
// walks the signal from channel to channel every "Walk Time" to identify
// them, sends it to all, or to one channel; switches are faded.
//
// What reaches the loudspeakers after this (the B-chain's gain, delay,
// polarity and EQ per channel) is the monitor path's, not this source's.
#pragma once

#include <array>
#include <vector>

#include "Common/Algorithms/PeriodicPinkNoise.h"
#include "Common/ZenAudioPluginImpl.h"

class ZenMonitor : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    enum Parameter : std::uint32_t { kSignal, kOutput, kWalkTime, kFrequency, kLevel };
    enum Signal { kPinkNoise, kSine, kPolarityPulse };
    // Values of "Output" before the channel numbers.
    enum Output { kWalk, kAll, kFirstNumbered };
    // Rows of the meter table: the channel sounding (1 up; 0 for all or
    // none) and the block's output peak.
    enum Meter : std::uint32_t { kChannel, kPeak };

    static constexpr double kPulseMs = 2.0;
    static constexpr double kPulsePeriodMs = 500.0;
    // The pulse's peak stands this far above "Level" (at most full scale).
    static constexpr double kPulseAboveLevelDb = 14.0;
    static constexpr double kGateFadeMs = 5.0;

    ZenMonitor();

    static const zen::ParameterTableDefinition& Definitions();
    static const zen::MeterTableDefinition& Meters();

    bool ApplyNeutralSetting() override;

protected:
    bool AcceptsChannelConfiguration(std::uint32_t inputs, std::uint32_t outputs) const override;
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    void PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    int Sounding(std::uint32_t channelCount) const noexcept;
    void Generate(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept;

    PeriodicPinkNoise m_noise;
    std::vector<float> m_source;  // sine or pulse at level, one block
    std::vector<float> m_pulse;   // one pulse, unit peak
    std::array<float, kMaxChannels> m_gates{};
    float m_gateStep = 1.0f;
    double m_rate = 48000.0;

    // Audio thread.
    Signal m_signal = kPinkNoise;
    int m_output = kWalk;
    std::uint64_t m_walkSamples = 1;
    std::uint64_t m_walkPosition = 0;  // samples since the walk began
    std::uint64_t m_pulsePosition = 0;
    std::uint64_t m_pulsePeriod = 1;
    double m_phase = 0.0;  // sine, in cycles
};
