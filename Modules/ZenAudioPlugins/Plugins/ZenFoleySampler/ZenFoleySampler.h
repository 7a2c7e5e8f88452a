// "Foley Sampler": plays one-shot sounds from a bank of pads, the built-in
// synthesised ones and the user's WAV/FLAC files from a folder. A rising
// edge of "Trigger" starts the selected pad at the first sample of the next
// block, with the current pitch and gain and a random variation of take,
// pitch and level; when every voice sounds, the oldest is faded out.
//
// The folder is part of the state text ("folder"); loading it decodes the
// files on the calling thread and hands the new bank to the audio thread
// through an atomic pointer. Files that cannot be read are skipped and
// named in the state's "skipped" list.
#pragma once

#include <array>
#include <atomic>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

#include "Common/ZenAudioPluginImpl.h"
#include "FoleyBank.h"
#include "FoleyVoice.h"

class ZenFoleySampler : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    static constexpr std::uint32_t kMaxPads = 128;
    static constexpr std::uint32_t kMaxVoices = 64;
    // Voices fading out after being stolen sound on in extra slots.
    static constexpr std::uint32_t kFadeSlots = 16;
    static constexpr double kStealFadeSeconds = 0.005;
    // Full "Variation" spreads each trigger this far either way.
    static constexpr double kVariationSemitones = 1.0;
    static constexpr double kVariationDb = 3.0;
    static constexpr double kMinPitchSemitones = -24.0;
    static constexpr double kMaxPitchSemitones = 24.0;

    // Stepped, in hand-over order: the trigger comes last so that a pad and
    // settings changed with it apply to that trigger.
    enum Parameter : std::uint32_t { kPad, kPitch, kGain, kVariation, kVoices, kTrigger };
    enum Meter : std::uint32_t { kVoicesMeter, kPadsMeter, kOutputPeak };

    ZenFoleySampler();
    ~ZenFoleySampler() override;

    static const zen::ParameterTableDefinition& Definitions();
    static const zen::MeterTableDefinition& Meters();

    std::string SaveState() const override;
    bool LoadState(const std::string& state) override;

    std::uint32_t GetTailLength() const override;
    bool ApplyNeutralSetting() override { return false; }

protected:
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    void PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    // Loads `folder` (empty: built-ins only) and hands the bank over.
    void LoadFolder(const std::string& folder);
    void Publish(std::unique_ptr<FoleyBank> bank);
    // Audio thread: adopts a bank handed over since the last block.
    void AdoptPendingBank() noexcept;
    void StartVoice(std::uint32_t padNumber) noexcept;
    FoleyVoice* FreeVoice() noexcept;
    double NextRandom() noexcept;

    // Audio thread's bank; the pending one is handed over at a block start,
    // the replaced one parked in m_retired until the next load frees it.
    std::unique_ptr<FoleyBank> m_active;
    std::atomic<FoleyBank*> m_pending{nullptr};
    std::atomic<FoleyBank*> m_retired{nullptr};
    std::atomic<double> m_longestSeconds{0.0};

    // Folder and load report; touched by state calls only, never audio.
    mutable std::mutex m_folderMutex;
    std::string m_folder;
    std::vector<std::string> m_skipped;

    std::array<FoleyVoice, kMaxVoices + kFadeSlots> m_voices;
    // The voices mix here: mono takes once, stereo takes per side.
    std::vector<float> m_mono, m_left, m_right;
    std::uint64_t m_triggerCount = 0;
    std::uint32_t m_random = 1;
    bool m_triggerHigh = false;
    bool m_triggerPending = false;
    std::uint32_t m_pad = 1;
    double m_pitch = 0.0;
    double m_gainDb = 0.0;
    double m_variation = 0.25;
    std::uint32_t m_voiceLimit = 32;
    double m_sampleRate = 48000.0;
};
