// "Flanger": the input mixed with a copy whose short delay sweeps from
// "Manual" up by "Depth" and back, never through zero, with positive or
// negative feedback around the delay (a soft limiter in the loop and a low
// cut that keeps DC from building up). "Spread" turns the right channel's
// sweep up to half a cycle against the left. Rate free in Hz or synced to a
// note value of "Tempo".
#pragma once

#include <array>

#include "Common/Algorithms/FeedbackPath.h"
#include "Common/Algorithms/Lfo.h"
#include "Common/Algorithms/LfoRate.h"
#include "Common/Algorithms/ModulatedDelayLine.h"
#include "Common/ZenAudioPluginImpl.h"

class ZenFlanger : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    enum Parameter : std::uint32_t { kManual, kDepth, kRate, kSync, kTempo, kFeedback, kShape, kSpread, kMix };
    enum Meter : std::uint32_t { kOutputPeak };

    static constexpr std::uint32_t kMaxChannels = 2;
    static constexpr double kMaxManualMs = 5.0;
    static constexpr double kMaxDepthMs = 10.0;
    static constexpr double kMaxFeedback = 95.0;
    static constexpr double kLoopLowCut = 5.0;  // Hz
    // The tail is followed until the repeats are this far down.
    static constexpr double kTailDb = 110.0;

    ZenFlanger();

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
    void UpdateRate() noexcept;
    void UpdatePhases() noexcept;

    std::array<ModulatedDelayLine, kMaxChannels> m_lines;
    std::array<Lfo, kMaxChannels> m_lfos;
    FeedbackPath m_feedbackPath;

    // Audio thread.
    bool m_fresh = true;  // no audio since the last reset
    LfoRate m_rate;
    float m_spread = 0.0f;
};
