// Peak compressor with a hard knee, optional external sidechain and a limit
// on the gain reduction. Detection is linked across channels; the envelope
// and the law run in log units (dB/20).
//
// With the sidechain on, the channel array handed to Process lists the main
// channels first, then the sidechain channels (SetSidechainChannelCount).
// Accepted layouts: one sidechain channel for any number of mains, one main
// channel for any number of sidechains, or as many sidechains as mains.
#pragma once

#include <atomic>
#include <cstdint>

#include "../ZenAudioAlgorithm.h"
#include "EnvelopeCoefficients.h"

class Compressor : public ZenAudioAlgorithm {
    Q_OBJECT

public:
    enum Parameter : std::uint64_t { kRatio, kThreshold, kAttack, kHold, kRelease, kMakeup, kSidechainOn, kGrLimit };
    // Meters, in dB: the gain reduction alone (<= 0), and the gain applied with makeup.
    enum Meter : std::uint64_t { kGainReductionMeter, kGainMeter };

    Compressor();

    static const zen::ParameterTableDefinition& Definitions();

    // Defaults at the new rate, then Reset.
    bool Prepare(float sampleRate, std::uint32_t maxBlock) override;
    bool SetParameter(std::uint64_t index, float value) override;
    void Reset() override;
    bool Process(float* const* channels, std::uint64_t count) override;
    float GetMeter(std::uint64_t index) const override;

    void SetSidechainChannelCount(std::uint64_t channels) { m_sidechainChannels = channels; }
    std::uint64_t GetSidechainChannelCount() const { return m_sidechainChannels; }
    bool IsSidechainOn() const { return m_sidechain; }

private:
    bool AcceptsLayout() const;

    std::uint64_t m_sidechainChannels = 1;
    bool m_sidechain = false;
    float m_threshold = -0.75f;  // log units
    float m_envelope = -0.75f;
    zen::EnvelopeCoefficients m_attack;
    std::int32_t m_holdLength = 0;
    std::int32_t m_holdCounter = 0;
    zen::EnvelopeCoefficients m_release;
    float m_slope = 0.5f;  // 1 - 1/ratio
    float m_makeup = 0.0f;
    float m_limitFloor = -2.5f;  // -limit/20

    std::atomic<float> m_reductionDb{0.0f};
    std::atomic<float> m_gainDb{0.0f};
};
