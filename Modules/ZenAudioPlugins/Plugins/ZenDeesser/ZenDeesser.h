// "De-Esser": reduces sibilance in speech and vocals with a wide-band gain
// that falls while the chosen band dominates the signal. "Ess Only" lets the
// user hear the detected band. Mono or stereo (linked), no latency.
//
// Parameters reach the Deesser algorithm on the audio thread only
// (UpdateProcessingParameter), so its coefficients never race the processing.
#pragma once

#include "Common/Algorithms/Deesser.h"
#include "Common/ZenAudioPluginImpl.h"

class ZenDeesser : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    enum Parameter : std::uint32_t { kEssOnly, kFrequency, kMode, kAmount };
    // Rows of the meter table: the present gain reduction (dB, <= 0 while
    // reducing) and the output peak of the last block (loudest channel).
    enum Meter : std::uint32_t { kReductionMeter, kOutputMeter };

    ZenDeesser();

    static const zen::ParameterTableDefinition& Definitions();
    static const zen::MeterTableDefinition& Meters();

protected:
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    bool AcceptsChannelConfiguration(std::uint32_t inputs, std::uint32_t outputs) const override;
    void PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    Deesser m_deesser;
};
