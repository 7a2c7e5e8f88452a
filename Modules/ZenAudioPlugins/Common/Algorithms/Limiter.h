// True-peak brick-wall limiter: an optional tanh soft stage, then one gain
// for all channels that drops at once to the value bringing a block's true
// peak to the ceiling, holds, and recovers with a one-pole release; it is
// applied to a delayed copy of the signal (look-ahead).
//
// The gain is decided on a fixed grid of internal blocks of
// GetBlockLength() samples, whatever the caller's block size, so the output
// does not depend on how the stream is split. A sample waits in a block
// buffer until the true peak of its whole block is known (block length +
// true-peak latency), takes the block's soft stage, then passes the
// look-ahead delay; the gain law runs over the block as it leaves the buffer,
// so a drop reaches the look-ahead's length ahead of the block that caused
// it. GetLatency() is the sum of the three.
//
// The true peak is read with the wideband 4x interpolator: the standard
// 48-tap one misses much of what content near Nyquist (noise, squares,
// clipped material) adds between samples.
//
// The law bounds sample peaks by the ceiling, and true peaks as far as the
// 4x reading sees them. Between samples the output can pass it where the
// gain steps down and, with "Soft" on, by several dB on dense material: a
// softened block is held by its largest softened sample, not by the peaks
// that the curve's harmonics put between samples.
#pragma once

#include <array>
#include <atomic>
#include <cstdint>
#include <memory>
#include <vector>

#include "../ZenAudioAlgorithm.h"
#include "Algorithms/FindMinMax.h"
#include "Algorithms/TruePeak.h"
#include "Algorithms/Vec.h"
#include "Delay.h"

class Limiter : public ZenAudioAlgorithm {
    Q_OBJECT

public:
    enum Parameter : std::uint64_t { kCeiling, kRelease, kSoft };
    // Meter 0: the gain in dB (negative while limiting); then per channel c,
    // InputTruePeakMeter(c): the true peak in dBTP of the input blocks
    // completed by the last call, and OutputPeakMeter(c): the largest
    // output sample of the last call in dBFS.
    static constexpr std::uint64_t kGainMeter = 0;
    static constexpr std::uint64_t InputTruePeakMeter(std::uint64_t channel) { return 1 + 2 * channel; }
    static constexpr std::uint64_t OutputPeakMeter(std::uint64_t channel) { return 2 + 2 * channel; }
    static constexpr std::uint64_t kMaxChannels = 32;

    // The ceiling is held this far below its setting, a margin for the
    // true-peak estimate.
    static constexpr double kCeilingMarginDb = 0.2;
    // The soft stage's knee never leaves this range (linear).
    static constexpr float kSoftKneeMin = 0.25f;
    static constexpr float kSoftKneeMax = 1.0f;

    Limiter();
    ~Limiter() override;

    static const zen::ParameterTableDefinition& Definitions();

    // The ceiling C, linear, of a setting in dBTP.
    static float CeilingGain(float db);
    // The soft stage's curve for a sample with knee k.
    static float Soften(float x, float knee) noexcept;

    // Defaults at the new rate (look-ahead and latency follow it), then Reset.
    bool Prepare(float sampleRate, std::uint32_t maxBlock) override;
    // Allocates the per-channel true-peak readers and delay lines; clears.
    void SetChannelCount(std::uint64_t channels) override;
    bool SetParameter(std::uint64_t index, float value) override;
    void Reset() override;
    // False, buffers untouched, for more than kMaxChannels channels.
    bool Process(float* const* channels, std::uint64_t count) override;
    // As Process, with the ceiling C (linear) given per sample by an owner
    // that smooths it, or one for the whole call once it has settled; the
    // "Ceiling" parameter is then not used.
    bool Process(float* const* channels, std::uint64_t count, const float* ceiling) noexcept;
    bool Process(float* const* channels, std::uint64_t count, float ceiling) noexcept;
    float GetMeter(std::uint64_t index) const override;

    // Samples, at the prepared rate.
    std::uint32_t GetLatency() const { return m_blockLength + m_truePeakLatency + m_lookAheadLength; }
    std::uint32_t GetBlockLength() const { return m_blockLength; }
    std::uint32_t GetLookAheadLength() const { return m_lookAheadLength; }
    std::uint32_t GetTruePeakLatency() const { return m_truePeakLatency; }

    // Linear read-outs for owners: the present gain g, a channel's input true
    // peak over the blocks completed by the last call (kept when none was),
    // and its output peak over the last call.
    float GetGain() const { return m_gainMeter.load(std::memory_order_relaxed); }
    float GetInputTruePeak(std::uint64_t channel) const;
    float GetOutputPeak(std::uint64_t channel) const;

private:
    void Dimension();
    // C of sample i is ceiling[i * stride].
    bool Run(float* const* channels, std::uint64_t count, const float* ceiling, std::uint64_t stride) noexcept;
    void SetRelease(float milliseconds);
    // The block whose true peak is now complete: its soft stage and target gain.
    void FinishBlock(std::uint64_t channelCount, float ceiling) noexcept;
    void ApplyGain(float* const* channels, std::uint64_t channelCount, std::uint64_t offset,
                   std::uint64_t frames) noexcept;

    // Settings.
    float m_ceiling = 1.0f;       // C, linear
    float m_releaseGain = 1.0f;   // 1 - c
    float m_releaseCoeff = 0.0f;  // c
    bool m_soft = false;

    // Grid, in samples.
    std::uint32_t m_truePeakLatency = 0;
    std::uint32_t m_lookAheadLength = 0;
    std::uint32_t m_blockLength = 1;
    std::uint64_t m_holdLength = 0;

    // Signal state.
    float m_gain = 1.0f;    // g
    float m_target = 1.0f;  // T of the block leaving the buffer
    std::uint64_t m_hold = 0;
    std::uint32_t m_position = 0;  // samples into the current internal block
    float m_knee = kSoftKneeMax;   // of the block leaving the buffer

    zen::Delay m_blockBuffer;  // block length + true-peak latency
    zen::Delay m_lookAhead;
    std::vector<std::unique_ptr<ora::numeric::TruePeak>> m_truePeaks;  // one per channel
    std::vector<std::unique_ptr<ora::numeric::FindMinMax>> m_samplePeaks;
    std::vector<std::unique_ptr<ora::numeric::FindMinMax>> m_outputPeaks;
    ora::numeric::Vec m_vec;
    std::vector<float> m_gains;  // per sample of a segment

    struct ChannelBlock {
        float truePeak = 0.0f;    // running, of the block being measured
        float samplePeak = 0.0f;  // of the block being measured, once its samples are in
        bool soft = false;        // the block leaving the buffer takes the soft stage
    };
    std::vector<ChannelBlock> m_blocks;
    std::vector<float> m_callInputPeak;
    bool m_callFinishedBlock = false;

    std::array<std::atomic<float>, kMaxChannels> m_inputTruePeak{};
    std::array<std::atomic<float>, kMaxChannels> m_outputPeak{};
    std::atomic<float> m_gainMeter{1.0f};
};
