// "Limiter": an input gain, then the true-peak brick-wall limiter of
// Common/Algorithms/Limiter, its ceiling smoothed here and handed over per
// sample. The algorithm decides the gain on a fixed internal block grid, so
// the sound does not depend on how the host splits the stream; the latency
// is its block, true-peak latency and look-ahead.
#pragma once

#include <cstdint>
#include <vector>

#include "Algorithms/Vec.h"
#include "Common/Algorithms/Limiter.h"
#include "Common/ZenAudioPluginImpl.h"

class ZenLimiter : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    enum Parameter : std::uint32_t { kInputGain, kCeiling, kRelease, kSoft };
    // Rows of the meter table: the gain applied (read in dB), then each
    // channel's input true peak and output peak.
    enum Meter : std::uint32_t { kGainMeter, kInputTruePeakMeter, kOutputPeakMeter };

    // Meter readings for no gain and for silence.
    static constexpr float kGainMeterFloorDb = -24.0f;
    static constexpr float kLevelMeterFloorDb = -30.0f;

    ZenLimiter();
    ~ZenLimiter() override;

    static const zen::ParameterTableDefinition& Definitions();
    static const zen::MeterTableDefinition& Meters();

protected:
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    void PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    void ApplyInputGain(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept;
    // The limiter with the smoothed ceiling, per sample while it moves.
    void Limit(float* const* channels, std::uint32_t frames) noexcept;

    Limiter m_limiter;
    ora::numeric::Vec m_vec;
    std::vector<float> m_ceilings;  // C per sample of a block
};
