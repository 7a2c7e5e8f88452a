// Base of every processing object a plug-in owns: filters, detectors, delay
// lines and the engines built from them. One small contract, so that
// algorithms nest and plug-ins treat them alike:
//
//   construction (coefficients for 48000 Hz) -> SetChannelCount -> Prepare
//   -> the owner's SetParameter calls -> Process / ProcessChannel, interleaved
//   with SetParameter, GetParameter, GetMeter and Reset -> Release.
//
// Prepare resets every parameter to its default on purpose; an owner whose
// settings differ applies them again before the next block. Process,
// ProcessChannel and Reset never allocate, lock or throw.
#pragma once

#include <QObject>
#include <cstdint>
#include <memory>
#include <vector>

#include "ParameterDefinition.h"
#include "ZenControlValueBase.h"

class ZenAudioAlgorithm : public QObject {
    Q_OBJECT

public:
    // Per-instance record: a copy of the definition and the live value.
    struct ParameterRecord {
        ParameterRecord(const zen::ParameterDefinition& d, ZenAudioAlgorithm* owner)
            : definition(d), value(owner, d.defaultValue) {}
        zen::ParameterDefinition definition;
        ZenControlValueBase value;
    };

    static constexpr int kDefaultSampleRate = 48000;

    explicit ZenAudioAlgorithm(const zen::ParameterTableDefinition& definitions = {});
    ~ZenAudioAlgorithm() override;

    // Stores the block size and the rate truncated to an integer, then sets
    // every parameter to its default through SetParameter, so that derived
    // coefficients follow the new rate. Subclasses clear their derived state
    // first and may grow scratch memory to maxBlock here.
    virtual bool Prepare(float sampleRate, std::uint32_t maxBlock);
    // Gives back what Prepare acquired.
    virtual void Release() {}
    virtual bool SetSampleRate(std::uint32_t sampleRate);
    virtual bool SetMaxBlockSize(std::uint32_t maxBlock);
    // Subclasses with per-channel state resize it: new channels start zeroed.
    virtual void SetChannelCount(std::uint64_t channels);

    // One channel's block in place. The base does not process (assertion, false).
    virtual bool ProcessChannel(std::uint64_t channel, float* samples, std::uint64_t count);
    // All channels' blocks in place. The base does not process (assertion,
    // false). Subclasses answer true for zero channels and false for layouts
    // they do not support.
    virtual bool Process(float* const* channels, std::uint64_t count);

    // False, changing nothing, for an index out of range; else exchanges the
    // value. Subclasses call this, then recompute what depends on it.
    virtual bool SetParameter(std::uint64_t index, float value);
    // 0 for an index out of range.
    virtual float GetParameter(std::uint64_t index) const;

    // Clears all signal state, never parameters.
    virtual void Reset() = 0;

    // Read-outs for meters; 0 unless a subclass says otherwise.
    virtual float GetMeter(std::uint64_t index) const;

    std::uint64_t GetParameterCount() const { return m_parameters.size(); }
    const ParameterRecord& GetParameterRecord(std::uint64_t index) const { return *m_parameters[index]; }
    int GetSampleRate() const { return m_sampleRate; }
    std::uint32_t GetMaxBlockSize() const { return m_maxBlock; }
    std::uint64_t GetChannelCount() const { return m_channels; }

private:
    std::vector<std::unique_ptr<ParameterRecord>> m_parameters;
    int m_sampleRate = kDefaultSampleRate;
    std::uint32_t m_maxBlock = 0;
    std::uint64_t m_channels = 0;
};

