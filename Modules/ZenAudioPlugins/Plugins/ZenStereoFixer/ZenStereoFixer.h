// "Stereo Fixer": repairs the faults a stereo pair arrives with. In order:
// channel swap, per-channel polarity, automatic alignment of a time offset
// between the channels (up to +-10 ms, measured by cross-correlation),
// left/right balance, and fold-down to mono when a channel is dead or
// inverted (or always).
//
// Alignment delays the leading channel, the other one by less: the latency
// is always the largest correction, so a host's compensation holds while
// the correction changes. A change is cross-faded between the old and the
// new delay. Decisions fall on the offset estimator's frame boundaries, so
// any block split gives the same output. Swap and polarity switches
// cross-fade from the old channel mapping to the new one.
#pragma once

#include <array>
#include <vector>

#include "Common/Algorithms/CorrelationMeter.h"
#include "Common/Algorithms/InterChannelOffset.h"
#include "Common/Algorithms/SwitchFade.h"
#include "Common/ZenAudioPluginImpl.h"

class ZenStereoFixer : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    enum Parameter : std::uint32_t { kSwap, kLeftPolarity, kRightPolarity, kBalance, kAutoAlign, kFoldDown };
    enum Polarity { kNormal, kInverted };
    enum FoldDown { kFoldOff, kFoldAuto, kFoldOn };
    // What the mono fold-down is made of.
    enum FoldSource { kSum, kLeftOnly, kRightOnly, kDifference };
    // Rows of the meter table.
    enum Meter : std::uint32_t { kOffset, kCorrelation, kBalanceReading, kFolded };

    static constexpr double kMaxOffsetMs = 10.0;
    // Below this |correlation| the estimate does not move the alignment.
    static constexpr double kConfidentCorrelation = 0.3;
    // Below this correlation a channel counts as inverted.
    static constexpr double kInvertedCorrelation = -0.5;
    // A channel this far below the other (60 dB) counts as dead.
    static constexpr double kDeadPowerRatio = 1e-6;
    static constexpr double kAlignFadeMs = 10.0;
    static constexpr double kFoldFadeMs = 20.0;

    ZenStereoFixer();

    static const zen::ParameterTableDefinition& Definitions();
    static const zen::MeterTableDefinition& Meters();

    bool ApplyNeutralSetting() override;

protected:
    bool AcceptsChannelConfiguration(std::uint32_t inputs, std::uint32_t outputs) const override;
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    void PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    // Left and right out of swap and polarity: {ll, lr, rl, rr}.
    using Mapping = std::array<float, 4>;
    Mapping TargetMapping() const noexcept;
    // The mapping being applied now (part way through a fade).
    Mapping PresentMapping() const noexcept;
    void Remap() noexcept;
    void MapInput(float* left, float* right, std::uint32_t frames) noexcept;
    void Decide() noexcept;
    void Repair(float* left, float* right, std::uint32_t frames) noexcept;
    std::uint32_t DelayOf(int channel, int lag) const noexcept;

    InterChannelOffset m_offset;
    CorrelationMeter m_output;
    std::vector<float> m_lines;  // two rings of m_mask + 1 samples
    std::uint32_t m_mask = 0;
    std::uint32_t m_write = 0;
    std::uint32_t m_latency = 0;
    std::uint32_t m_alignFade = 1, m_foldFade = 1;
    std::uint64_t m_seenEstimates = 0;

    SwitchFade m_mapFade;
    Mapping m_mapFrom{1.0f, 0.0f, 0.0f, 1.0f};
    Mapping m_mapTo{1.0f, 0.0f, 0.0f, 1.0f};

    // Audio thread.
    bool m_fresh = true;  // no audio since the last reset
    bool m_swap = false;
    float m_leftSign = 1.0f, m_rightSign = 1.0f;
    bool m_autoAlign = true;
    FoldDown m_foldDown = kFoldOff;
    int m_lag = 0, m_previousLag = 0;  // applied, and faded from
    std::uint32_t m_alignStep = 0;     // samples into the fade; m_alignFade when done
    FoldSource m_source = kSum;
    bool m_faultFold = false;  // a dead or inverted channel was found
    float m_fold = 0.0f;       // 0 stereo .. 1 mono
};
