// "Frequency Analyzer": the spectrum of up to 8 channels, each or summed,
// with peak hold and third-octave bands. The audio passes untouched,
// latency 0.
//
// Every analysed frame goes to the editor as a record of the "Spectrum"
// ring: the bin count n, then n average levels and n peak-hold levels in
// dBFS (bin k at k * rate / (2 (n - 1)) Hz, a full-scale sine on a bin reads
// 0), the rest of the record at the floor. "Summed" publishes on channel 1.
#pragma once

#include <vector>

#include "Common/Algorithms/SpectrumAnalyzer.h"
#include "Common/ZenAudioPluginImpl.h"

class ZenFrequency : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    enum Parameter : std::uint32_t { kSize, kWindow, kAverage, kDecay, kMode };
    enum Meter : std::uint32_t { kBands, kSpectrum };

    static constexpr std::uint32_t kMaxBins = SpectrumAnalyzer::kLargestSize / 2 + 1;
    static constexpr std::uint32_t kRecordWidth = 1 + 2 * kMaxBins;
    static constexpr std::uint32_t kSpectrumRecords = 4;
    // Level of an empty bin or band.
    static constexpr float kFloorDb = -120.0f;

    ZenFrequency();

    static const zen::ParameterTableDefinition& Definitions();
    static const zen::MeterTableDefinition& Meters();

protected:
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    void PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    void PublishFrame() noexcept;

    SpectrumAnalyzer m_analyzer;
    std::vector<float> m_record;
    float m_bands[zen::OctaveBands::kBands] = {};
    float* m_chunk[kMaxChannels] = {};
};
