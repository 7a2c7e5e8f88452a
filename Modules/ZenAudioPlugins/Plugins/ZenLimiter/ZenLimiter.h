// "Limiter": a true-peak brick-wall limiter. Input gain, an optional tanh
// soft stage, and one gain for all channels that drops to the value bringing
// a block's true peak to the ceiling before the block arrives, holds, and
// recovers with a one-pole release; it is applied to a delayed copy of the
// signal.
//
// The gain is decided on a fixed grid of internal blocks (GetBlockLength()
// samples, whatever the host's block size), so the sound does not depend on
// how the host splits the stream. A sample waits in an internal block buffer
// until the true peak of its whole block is known (block length + true-peak
// latency), then passes the look-ahead delay, over which the gain ramps down
// so that it has dropped when the block's first sample arrives. The latency
// reported to the host is the sum of the three.
//
// The true peak is read with the wideband 4x interpolator: the standard
// 48-tap one misses much of what content near Nyquist (noise, squares,
// clipped material) adds between samples. With "Soft" on, a block over the
// ceiling is softened, and held by the larger of its largest softened sample
// and the true peak of the softened signal (the curve adds harmonics whose
// peaks fall between samples), so the ceiling holds with Soft on too.
#pragma once

#include <array>
#include <cstdint>
#include <memory>
#include <vector>

#include "Algorithms/FIRS.h"
#include "Algorithms/FindMinMax.h"
#include "Algorithms/TruePeak.h"
#include "Algorithms/Vec.h"
#include "Common/Algorithms/Delay.h"
#include "Common/ZenAudioPluginImpl.h"

class ZenLimiter : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    enum Parameter : std::uint32_t { kInputGain, kCeiling, kRelease, kSoft };
    // Rows of the meter table: the gain applied (read in dB), then each
    // channel's input true peak and output peak.
    enum Meter : std::uint32_t { kGainMeter, kInputTruePeakMeter, kOutputPeakMeter };

    // The ceiling is held this far below its setting, a margin for the
    // true-peak estimate.
    static constexpr double kCeilingMarginDb = 0.2;
    // The soft stage's knee never leaves this range (linear).
    static constexpr float kSoftKneeMin = 0.25f;
    static constexpr float kSoftKneeMax = 1.0f;
    // Meter readings for no gain and for silence.
    static constexpr float kGainMeterFloorDb = -24.0f;
    static constexpr float kLevelMeterFloorDb = -30.0f;
    // The look-ahead in samples at 48 kHz, scaled with the rate; the gain
    // ramps down over it. The internal block lasts this many holds (4 x
    // (true-peak latency + look-ahead)), so that the gain releases for half
    // of every block.
    static constexpr double kLookAheadAt48k = 8.0;
    static constexpr std::uint32_t kHoldsPerBlock = 2;

    ZenLimiter();
    ~ZenLimiter() override;

    static const zen::ParameterTableDefinition& Definitions();
    static const zen::MeterTableDefinition& Meters();

    // The working value of the ceiling: the linear gain of the setting less
    // the margin.
    static float CeilingGain(float ceilingDb);
    // The soft stage's curve for a sample with knee k.
    static float Soften(float x, float knee) noexcept;
    // Internal block and look-ahead lengths at the prepared rate.
    std::uint32_t GetBlockLength() const { return m_blockLength; }
    std::uint32_t GetLookAheadLength() const { return m_lookAheadLength; }

protected:
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    void PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    void Clear() noexcept;
    // The block whose true peak is now complete: its soft stage and target gain.
    void FinishBlock(std::uint32_t channelCount, float ceiling) noexcept;
    void ApplyGain(float* const* channels, std::uint32_t channelCount, std::size_t offset, std::size_t frames) noexcept;

    // Audio thread.
    bool m_soft = false;          // "Soft"
    float m_releaseGain = 1.0f;   // 1 - c
    float m_releaseCoeff = 0.0f;  // c
    float m_gain = 1.0f;          // g
    float m_appliedGain = 1.0f;   // g after the ramp
    float m_target = 1.0f;        // T of the current block
    std::uint64_t m_hold = 0;
    std::uint32_t m_position = 0;  // samples into the current internal block
    std::uint32_t m_lastChannelCount = 0;

    std::uint32_t m_blockLength = 1;
    std::uint32_t m_lookAheadLength = 0;
    std::uint32_t m_truePeakLatency = 0;
    zen::Delay m_blockBuffer;  // block length + true-peak latency
    zen::Delay m_lookAhead;
    std::vector<std::unique_ptr<ora::numeric::TruePeak>> m_truePeaks;  // one per channel
    std::vector<std::unique_ptr<ora::numeric::TruePeak>> m_softTruePeaks;  // of the softened input
    std::vector<float> m_softened;  // a segment softened, for its true peak
    bool m_softMeasuring = false;
    std::vector<std::unique_ptr<ora::numeric::FindMinMax>> m_samplePeaks;
    ora::numeric::Vec m_vec;
    ora::numeric::FIRS m_gainRamp;  // spreads each drop over the look-ahead
    std::vector<float> m_gains;     // per sample of a segment

    struct ChannelBlock {
        float truePeak = 0.0f;    // running, of the block being measured
        float softTruePeak = 0.0f;  // running, of the same block softened (Soft on)
        float samplePeak = 0.0f;  // of the block being measured, once complete
        bool soft = false;        // the block leaving the buffer takes the soft stage
    };
    std::array<ChannelBlock, kMaxChannels> m_blocks{};
    float m_knee = kSoftKneeMax;  // of the block leaving the buffer
    float m_callInputPeak[kMaxChannels] = {};
    bool m_callFinishedBlock = false;
};
