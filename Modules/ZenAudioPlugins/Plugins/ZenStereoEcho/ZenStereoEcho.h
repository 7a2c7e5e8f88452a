// "Echo": a tape-style echo. What is written to the "tape" (input plus
// repeats) saturates on a soft curve set by "Drive"; each repeat passes a
// high cut ("Tone") and a low cut again, so repeats darken as they fade;
// "Wow" (slow, wandering) and "Flutter" (fast) swing the delay as an uneven
// tape speed would. Feedback may pass 100 %: the echo then runs away into a
// sustained, saturated tone that the loop's limiter keeps bounded. Time
// changes glide with a pitch bend, as a tape's speed would. Mono or stereo,
// both channels on one tape (one time, one wow and flutter).
#pragma once

#include <array>

#include "Common/Algorithms/FeedbackPath.h"
#include "Common/Algorithms/Lfo.h"
#include "Common/Algorithms/ModulatedDelayLine.h"
#include "Common/Algorithms/TimeGlide.h"
#include "Common/ZenAudioPluginImpl.h"

class ZenStereoEcho : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    enum Parameter : std::uint32_t { kTime, kSync, kTempo, kFeedback, kDrive, kTone, kWow, kFlutter, kMix };
    enum Meter : std::uint32_t { kOutputPeak };

    static constexpr std::uint32_t kMaxChannels = 2;
    static constexpr double kMinTimeMs = 20.0;
    static constexpr double kMaxTimeMs = 2000.0;
    // Swings of the delay at 100 %: wow wanders at about kWowHz, flutter is a sine at kFlutterHz.
    static constexpr double kWowMs = 3.0;
    static constexpr double kWowHz = 0.5;
    static constexpr double kFlutterMs = 0.3;
    static constexpr double kFlutterHz = 7.0;
    // The repeats always lose their lowest octaves too.
    static constexpr double kLowCut = 100.0;
    static constexpr double kTailDb = 110.0;
    static constexpr double kLongestTailSeconds = 30.0;

    ZenStereoEcho();

    static const zen::ParameterTableDefinition& Definitions();
    static const zen::MeterTableDefinition& Meters();

    // The echo time: "Time", or the note value "Sync" (when not 0) at "Tempo", within the range.
    static double TimeMs(float time, int sync, float tempo);

    // The tape's curve at drive gain k: unity gain for small signals, a
    // Pade form of tanh(k x) / k, reaching +-1/k from k |x| = 3.
    static float Saturate(float x, float k) noexcept {
        const float u = k * x;
        if (!(std::fabs(u) < 3.0f)) return std::isnan(u) ? 0.0f : std::copysign(1.0f, u) / k;
        const float u2 = u * u;
        return u * (27.0f + u2) / (27.0f + 9.0f * u2) / k;
    }

    std::uint32_t GetTailLength() const override;
    bool ApplyNeutralSetting() override;

protected:
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    void PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    void UpdateTime() noexcept;

    std::array<ModulatedDelayLine, kMaxChannels> m_lines;
    TimeGlide m_glide;
    Lfo m_wow;
    Lfo m_flutter;
    FeedbackPath m_feedbackPath;

    // Audio thread.
    float m_time = 350.0f;
    int m_sync = 0;
    float m_tempo = 120.0f;
};
