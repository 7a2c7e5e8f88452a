// "De-Esser": reduces sibilance in speech and vocals with a wide-band gain
// that falls while the chosen band dominates the signal. "Ess Only" lets the
// user hear the detected band. Mono or stereo (linked), no latency.
//
// Parameters reach the Deesser algorithm on the audio thread only
// (UpdateProcessingParameter), so its coefficients never race the processing.
#pragma once

#include <atomic>

#include "Common/Algorithms/Deesser.h"
#include "Common/ZenAudioPluginImpl.h"

class ZenDeesser : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    enum Parameter : std::uint32_t { kEssOnly, kFrequency, kMode, kAmount };
    // Meters: the present gain reduction (dB, <= 0 while reducing) and the
    // output peak of the last block (dBFS, loudest channel).
    enum Meter : std::uint32_t { kReductionMeter, kOutputMeter, kMeterCount };

    ZenDeesser();

    static const zen::ParameterTableDefinition& Definitions();

    std::uint32_t GetMeterCount() const override { return kMeterCount; }
    bool GetMeterInfo(std::uint32_t index, zen::MeterInfo& info) const override;
    float GetMeter(std::uint32_t index) const override;

protected:
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    bool AcceptsChannelConfiguration(std::uint32_t inputs, std::uint32_t outputs) const override;
    void PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    Deesser m_deesser;
    std::atomic<float> m_outputPeak{0.0f};  // linear
};
