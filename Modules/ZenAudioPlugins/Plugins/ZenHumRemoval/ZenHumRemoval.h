// "De-Hummer": removes 50 or 60 Hz mains hum and its harmonics with a bank
// of narrow notches that follow the hum's real fundamental within 1 Hz.
// "Amount" sets how much of the hum is taken out; "listen to removed hum"
// plays what is taken out instead. No latency; up to 8 channels, each with
// its own cancellers and one shared fundamental.
#pragma once

#include <vector>

#include "Common/Algorithms/TrackingNotchBank.h"
#include "Common/ZenAudioPluginImpl.h"

class ZenHumRemoval : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    enum Parameter : std::uint32_t { kFrequency, kHarmonics, kWidth, kTracking, kAmount, kListen };
    enum Mains { k50Hz, k60Hz };
    // Rows of the meter table: the fundamental the notches sit on, the peak
    // of the hum found (all channels) and each channel's output peak.
    enum Meter : std::uint32_t { kHumFrequency, kHumLevel, kOutputPeak };

    // After the input stops, the cancellers' memory has fallen by 100 dB.
    static constexpr double kTailNepers = 11.5;

    ZenHumRemoval();

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
    TrackingNotchBank m_notches;
    std::vector<float> m_humBuffer;  // channel-major, one block each
    std::vector<float*> m_hum;
};
