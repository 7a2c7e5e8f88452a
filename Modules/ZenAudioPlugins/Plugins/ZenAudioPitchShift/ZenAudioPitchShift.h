// "Pitch": transposes by up to an octave (and a semitone of fine tuning)
// either way without changing the duration. A phase-vocoder stretch by the
// pitch ratio (frames of 4096, hop 1024, phases by heap integration or by
// the peak-locked vocoder) is read back at that ratio with cubic
// interpolation and mixed with the dry input delayed by the same latency.
//
// The engine lives from InitializePlugin to ShutdownPlugin behind a
// reader/writer lock: the audio thread holds it shared (upgradable) while
// processing and upgrades it to apply changed settings; building and
// destroying the engine take it exclusively. If the audio thread cannot have
// the lock, or there is no engine, the block passes unchanged.
#pragma once

#include <boost/thread/shared_mutex.hpp>
#include <memory>
#include <vector>

#include "Common/ZenAudioPluginImpl.h"
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

    ZenAudioPitchShift();
    ~ZenAudioPitchShift() override;

    static const zen::ParameterTableDefinition& Definitions();

    bool InitializePlugin() override;
    void ShutdownPlugin() override;
    bool HasEngine() const;

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
    // Applies changed settings; the caller holds the lock at least upgradable.
    // The first application after a preparation or reset also settles the
    // engine there, so it starts at its settings instead of gliding to them.
    void ApplyChanges(boost::upgrade_lock<boost::upgrade_mutex>& lock) noexcept;

    mutable boost::upgrade_mutex m_engineLock;
    std::unique_ptr<ora::pitchshift::Engine> m_pEngine;
    std::unique_ptr<ora::pitchshift::EngineParam> m_param;
    std::vector<float> m_inWork;   // channel-major, kWorkFrames per channel
    std::vector<float> m_outWork;

    bool m_settle = true;  // audio thread, or under the exclusive lock

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
