// "Delay": a stereo delay with a time per side (or one for both, "Link"),
// free in ms or synced to note values of a "Tempo" (hosts pass none), with
// feedback through a low and high cut and a soft limiter, ping-pong, and a
// mix. Time changes glide (the pitch bends) instead of clicking. Mono or
// stereo; with ping-pong, both inputs enter the left line and the repeats
// alternate sides.
#pragma once

#include <array>

#include "Common/Algorithms/FeedbackPath.h"
#include "Common/Algorithms/ModulatedDelayLine.h"
#include "Common/Algorithms/TimeGlide.h"
#include "Common/ZenAudioPluginImpl.h"

class ZenStereoDelay : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    enum Parameter : std::uint32_t {
        kTimeL,
        kTimeR,
        kLink,
        kSyncL,
        kSyncR,
        kTempo,
        kFeedback,
        kPingPong,
        kLowCut,
        kHighCut,
        kMix,
    };
    enum Meter : std::uint32_t { kOutputPeak };

    static constexpr double kMaxTimeMs = 2000.0;
    // The repeats are followed until they are this far down.
    static constexpr double kTailDb = 110.0;
    // With feedback near 100 % they hardly decay: the reported tail stops here.
    static constexpr double kLongestTailSeconds = 30.0;

    ZenStereoDelay();

    static const zen::ParameterTableDefinition& Definitions();
    static const zen::MeterTableDefinition& Meters();

    // A side's time in ms: the note value at the tempo when synced, else the
    // time, at most kMaxTimeMs.
    static double SideTimeMs(float time, float sync, float tempo);

    std::uint32_t GetTailLength() const override;
    bool ApplyNeutralSetting() override;

protected:
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    void PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    void UpdateTimes() noexcept;

    std::array<ModulatedDelayLine, 2> m_lines;
    std::array<TimeGlide, 2> m_glides;
    FeedbackPath m_feedbackPath;

    // Audio thread.
    std::array<float, kMix + 1> m_values{};
    bool m_pingPong = false;
};
