// "Meter": EBU R 128 loudness of up to 32 channels (momentary, short-term,
// integrated, loudness range and their maxima) with per-channel true peak,
// sample peak and RMS. The audio passes untouched, latency 0; readings do
// not depend on how the host splits the blocks.
//
// Loudness reads in LUFS (LU for the range), -120 for silence or, for the
// integrated loudness, while nothing lies above the -70 LUFS gate. A rise of
// "Reset" to On clears every reading on the audio thread. "Scale" only tells
// the editor which EBU scale to draw.
#pragma once

#include "Common/Algorithms/LoudnessMeter.h"
#include "Common/ZenAudioPluginImpl.h"

class ZenMeter : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    enum Parameter : std::uint32_t { kLfeChannel, kScale, kTruePeak, kReset };
    enum Scale { kEbu9, kEbu18 };
    enum Meter : std::uint32_t {
        kMomentary,
        kShortTerm,
        kIntegrated,
        kRange,
        kMaxMomentary,
        kMaxShortTerm,
        kMaxTruePeak,      // loudest channel
        kInvalidSamples,   // NaN and infinities since the reset, counted as silence
        kTruePeakMeter,    // per channel, since the reset
        kSamplePeak,       // per channel, since the reset
        kRms,              // per channel, 400 ms
        kAverageRms,       // per channel, since the reset
        kHistory,          // ring: {momentary, short-term, integrated} every 100 ms
    };

    // What loudness meters read for silence.
    static constexpr float kSilenceLufs = -120.0f;
    // Records of the loudness history: a minute at one per 100 ms.
    static constexpr std::uint32_t kHistoryRecords = 600;

    ZenMeter();

    static const zen::ParameterTableDefinition& Definitions();
    static const zen::MeterTableDefinition& Meters();

protected:
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    void PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    void Publish() noexcept;

    LoudnessMeter m_loudness;
    float m_lfeChoice = 0.0f;
    bool m_resetHeld = false;  // "Reset" is On: waits for Off before acting again
    std::uint64_t m_hopsPushed = 0;
    // The guard's count of NaN and infinities at the last reset.
    std::uint64_t m_nonFiniteAtReset = 0;
    float* m_chunk[kMaxChannels] = {};
};
