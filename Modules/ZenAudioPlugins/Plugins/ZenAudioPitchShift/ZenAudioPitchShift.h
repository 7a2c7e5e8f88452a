// "Pitch": transposes by up to an octave (and a semitone of fine tuning)
// either way without changing the duration. A phase-vocoder stretch by the
// pitch ratio (frames of 4096, hop 1024, phases by heap integration or by
// the peak-locked vocoder) is read back at that ratio with cubic
// interpolation and mixed with the dry input delayed by the same latency.
//
// The engine lives from InitializePlugin to ShutdownPlugin behind a
// reader/writer lock: the audio thread holds it upgradable while processing
// and upgrades it to apply changed settings; building and destroying the
// engine take it exclusively. The audio thread only ever tries: a block that
// cannot have the engine plays the bypass path (the input delayed by the
// latency, so the stream keeps its timing) and waits in a backlog; when the
// engine is back it catches up on the backlog at twice real time, and the
// output fades from the bypass path into the processed signal. A change of
// settings that cannot have the upgrade waits for a later block.
#pragma once

#include <atomic>
#include <boost/thread/shared_mutex.hpp>
#include <memory>
#include <vector>

#include "Common/ZenAudioPluginImpl.h"
#include "InputBacklog.h"
#include "Retimer/PitchShiftEngine.h"

class ZenAudioPitchShift : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    enum Parameter : std::uint32_t {
        kCoarse,
        kFine,
        kDryWet,
        kJointOn,
        kAlgoType,
        kAlgoMode,
        kLog10EpsPeak,
        kMaxPeak,
        kLog10Tol,
    };

    // The engine's frame: length, overlap, transform length, frames of history.
    static constexpr std::size_t kFrameLength = 4096;
    static constexpr std::size_t kOverlap = 4;
    static constexpr std::size_t kFftLength = 4096;
    static constexpr int kHistory = 2;
    // Frames per engine call; longer blocks are processed in pieces.
    static constexpr std::uint32_t kWorkFrames = 1024;
    // Backlog samples the engine takes per block while catching up, per
    // sample of the block: the catching-up blocks cost at most twice as much.
    static constexpr std::uint32_t kCatchUpSpeed = 2;

    ZenAudioPitchShift();
    ~ZenAudioPitchShift() override;

    static const zen::ParameterTableDefinition& Definitions();

    bool InitializePlugin() override;
    void ShutdownPlugin() override;
    bool HasEngine() const;
    // For other threads that look at the engine beside the audio thread (a
    // display, a test): shared to read it, exclusive to change it. The audio
    // thread never waits for it.
    boost::upgrade_mutex& EngineLock() const { return m_engineLock; }

    // The synthesis window reaches half a frame past its centre, stretched
    // by the pitch ratio on reading: N/2 + N/(2 ratio) at the current settings.
    std::uint32_t GetTailLength() const override;
    bool LocksAudioPath() const override { return true; }
    // Defaults with a dry mix: the input passes exactly, delayed.
    bool ApplyNeutralSetting() override;

protected:
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    bool AcceptsChannelConfiguration(std::uint32_t inputs, std::uint32_t outputs) const override;
    void PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    // Builds the engine for the current channel count; the caller holds the
    // lock exclusively. False when it cannot be built.
    bool BuildEngine();
    // Hands m_tuning to the engine; the caller holds the lock exclusively.
    void ApplyTuning() noexcept;
    // The engine is there for a block of `channelCount`; the caller holds the lock.
    bool EngineReady(std::uint32_t channelCount) const noexcept;
    // Brings the engine to the host's settings, upgrading the lock if it can
    // be had at once; changes that cannot have it wait. False when the engine
    // must not run yet: a restart is waiting for the upgrade.
    bool ApplyChanges(boost::upgrade_lock<boost::upgrade_mutex>& lock) noexcept;
    // Runs `count` samples through the engine, from the backlog or else from
    // `io`; output sample i goes to io[i - keepFrom] from keepFrom on.
    void RunEngine(float* const* io, std::uint32_t channelCount, std::size_t count, std::size_t keepFrom,
                   bool fromBacklog) noexcept;
    // The block leaves as the bypass path plays it; the engine owes it.
    void PlayBypassPath(float* const* io, std::uint32_t channelCount, std::uint32_t frames) noexcept;
    // Fades the processed block in from the bypass path after a miss.
    void FadeIn(float* const* io, std::uint32_t channelCount, std::uint32_t frames) noexcept;

    mutable boost::upgrade_mutex m_engineLock;
    std::unique_ptr<ora::pitchshift::Engine> m_pEngine;
    std::unique_ptr<ora::pitchshift::EngineParam> m_param;
    std::vector<float> m_inWork;   // channel-major, kWorkFrames per channel
    std::vector<float> m_outWork;

    // The engine starts from its settings rather than gliding to them at
    // the next application: after it is built or prepared. Written under the
    // exclusive lock or by the audio thread holding the upgrade.
    bool m_settle = true;
    // Reset or Prepare asked for a fresh start: the audio thread takes it.
    std::atomic<bool> m_restart{true};
    bool m_forget = false;  // audio thread: the engine's shadow goes back to its defaults

    zen::InputBacklog m_backlog;  // audio thread, sized by PrepareProcessing
    float m_pathMix = 0.0f;       // 1: the bypass path plays, 0: the engine; audio thread
    float m_fadeStep = 1.0f;
    std::size_t m_warmUp = 0;  // backlog a restarted engine needs before the block it catches up with

    // The phase reconstruction's settings.
    struct Tuning {
        bool joint = true;
        float log10Eps = -2.3f;
        int maxPeak = 50;
        float log10Tol = -6.0f;
        bool operator!=(const Tuning& o) const {
            return joint != o.joint || log10Eps != o.log10Eps || maxPeak != o.maxPeak || log10Tol != o.log10Tol;
        }
    };
    // The host's settings as handed over (audio thread).
    ora::pitchshift::Engine::Settings m_wanted;
    Tuning m_wantedTuning;
    // The tuning last handed to the engine (audio thread, or under the
    // exclusive lock).
    Tuning m_tuning;
};
