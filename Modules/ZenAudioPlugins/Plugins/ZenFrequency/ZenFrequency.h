// "Frequency Analyzer": the spectrum of up to 8 channels, each or summed,
// with peak hold and third-octave bands. The audio passes untouched,
// latency 0.
//
// Every analysed frame goes to the editor as a record of the "Spectrum"
// ring: the bin count n, then n average powers and n peak-hold powers (bin k
// at k * rate / (2 (n - 1)) Hz; a full-scale sine on a bin reads 1, so
// 10 log10 gives dBFS), the rest of the record 0. Powers rather than levels
// because an editor takes the logarithm of only the bins it draws. The
// bands read in dBFS. "Summed" publishes on channel 1.
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
    // More than a display draws: small frames at high rates skip records
    // (the bands still follow every frame).
    static constexpr double kMaxRecordsPerSecond = 64.0;
    // Level of an empty band.
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
    void ChooseRecordStep() noexcept;
    void PublishFrame() noexcept;

    SpectrumAnalyzer m_analyzer;
    std::vector<float> m_record;
    std::uint64_t m_recordStep = 1;  // frames per record
    float m_bands[zen::OctaveBands::kBands] = {};
    float* m_chunk[kMaxChannels] = {};
};
