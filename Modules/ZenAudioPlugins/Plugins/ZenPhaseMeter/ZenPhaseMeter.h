// "Phase Meter": the stereo image of two channels. Correlation (-1..+1),
// balance and the mid and side levels averaged over "Time", the correlation
// of everything since the last reset, and goniometer points for the editor.
// The audio passes untouched, latency 0.
//
// Goniometer points are {x, y} = {(R - L), (L + R)} / sqrt(2): the image
// turned by 45 degrees, so mono stands upright and the left channel alone
// leans to the upper left. One point per sample up to 48 kHz, every second
// or fourth sample above.
#pragma once

#include "Common/Algorithms/CorrelationMeter.h"
#include "Common/ZenAudioPluginImpl.h"

class ZenPhaseMeter : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    enum Parameter : std::uint32_t { kTime };
    enum Meter : std::uint32_t { kCorrelation, kBalance, kMid, kSide, kOverallCorrelation, kGoniometer };

    static constexpr double kPointRate = 48000.0;
    // About 170 ms of points at 48 kHz, for an editor that reads 30 times a second.
    static constexpr std::uint32_t kGoniometerPoints = 8192;

    ZenPhaseMeter();

    static const zen::ParameterTableDefinition& Definitions();
    static const zen::MeterTableDefinition& Meters();

protected:
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    bool AcceptsChannelConfiguration(std::uint32_t inputs, std::uint32_t outputs) const override;
    void PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    CorrelationMeter m_correlation;
    std::uint32_t m_pointStep = 1;
    std::uint32_t m_untilPoint = 0;
};
