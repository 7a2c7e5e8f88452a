// "AI": applies the levelling gain curve the host's engine computes from the
// channel's own speech, and configures other plug-ins of the channel through
// a control template. Registered as "AI" (the "Template" parameter chooses)
// and as the rows "Dialogue Leveller", "Mix Assistant" and "Dialogue
// Leveler", whose template is fixed by their descriptor.
//
// Audio thread: measures the speech loudness of each entry of kEntryFrames
// samples into the gain list and applies the answered gain of the current
// entry, smoothed, to channels 0 and 1. Background thread
// (zen::BackgroundTask): applies template controls through host actions and
// feeds the engine. Reset keeps the gain list, so a host can analyse a file
// in one pass and apply the curve in a second.
#pragma once

#include <atomic>
#include <memory>
#include <vector>

#include "AIControlTemplate.h"
#include "Common/ZenAudioPluginImpl.h"
#include "GainList.h"
#include "LevellerFeed.h"
#include "SpeechLoudnessMeter.h"
#include "zen/BackgroundTask.h"
#include "zen/LevellerEngine.h"

class ZenAudioIntelligence : public ZenAudioPluginImpl, public zen::BackgroundTask, private AITemplateOwner {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    // The gain moves toward its target after every 16th sample of a block by
    // a hundredth of the distance: 1 - 1/e of a step in about 1,600 samples.
    static constexpr std::uint32_t kSmoothingInterval = 16;
    static constexpr float kSmoothingKeep = 0.99f;
    static constexpr float kSmoothingTake = 0.01f;
    static constexpr int kReadTraceLimit = 8;
    static constexpr float kSpeechMeterFloor = -70.0f;  // LUFS shown for "no speech"
    static constexpr std::uint32_t kHistoryCapacity = 1024;

    enum Parameter : std::uint32_t {
        kTemplate,
        kLevellingMode,
        kCleanup,
        kCleanUpAmount,
        kEnhance,
        kEnhanceAmount,
        kBalanceLevel,
        kMusicLevel,
        kNormalized,
        kAutoDuck,
        kDuckAmount,
        kBoost,
        kBoostAmount,
        kCrunch,
        kCrunchAmount,
        kReverb,
        kReverbSize,
        kReverbAmount,
        kWidthOn,
        kWidthSize,
        kRiderCurve,
        kLifterCurve,
        kGateCurve,
        kEngineFirst,  // the 38 levelling-engine parameters follow, by engine index
        kParameterCount = kEngineFirst + zen::levelling::kParameterCount
    };
    enum Meter : std::uint32_t { kGainMeter, kOutputPeak, kSpeechIn, kSpeechOut, kGainHistory };

    ZenAudioIntelligence();

    static const zen::ParameterTableDefinition& Definitions();
    static const zen::MeterTableDefinition& Meters();

    // Linear target of a gain in tenths of a dB: 0 below -999, else 10^(gain/200).
    static float TargetGain(std::int32_t tenths) noexcept;
    // The controls of template `number` (the plug-in's parameter names).
    static std::vector<const char*> ControlsOf(int number);

    // The template in effect: the descriptor's, or the "Template" choice.
    int TemplateNumber() const;

    void RunBackgroundTask(bool inputEnded) override;
    void* QueryInterface(const char* interfaceName) override;
    bool InitializePlugin() override;
    // The smoothing steps at fixed sample indexes of each block.
    bool IsBlockBased() const override { return true; }

protected:
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    void PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    bool CallTemplateAction(const char* action, const std::vector<std::string>& arguments,
                            std::string* result) override;
    void SetEngineParameter(std::uint32_t index, float value) override;
    void ForwardEngineParameter(std::uint32_t index, float value) override;
    bool CallEngine(const std::vector<std::string>& arguments, std::string* answer);
    void Measure(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept;

    // Audio thread.
    SpeechLoudnessMeter m_meter;
    std::uint64_t m_position = 0;  // frames since Reset
    float m_gain[2] = {1.0f, 1.0f};
    bool m_levelling = false;
    bool m_apply = false;
    std::int64_t m_lastReadEntry = -1;
    float m_lastSpeech = kSpeechMeterFloor;

    // Shared.
    GainList m_list;
    std::atomic<std::uint64_t> m_touched{0};  // entries the input has reached
    std::atomic<std::int64_t> m_readEntry{-1};
    std::atomic<std::uint64_t> m_readPosition{0};

    // Background thread.
    std::unique_ptr<AIControlTemplate> m_template;
    int m_templateNumber = -1;
    std::vector<float> m_applied;  // control values last applied
    float m_sentMode = -1.0f;
    std::vector<float> m_sentEngine;
    bool m_engineLevelling = false;
    LevellerFeed m_feed;
    int m_readTraces = 0;
    std::int64_t m_tracedEntry = -1;
};
