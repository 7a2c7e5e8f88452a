// Compressor on an RMS detector with a sine-shaped soft knee and automatic
// makeup. Detection is linked across channels (the loudest channel's RMS);
// the envelope and the law run in log units (dB/20).
//
// The knee is a quarter sine joining the unity line at threshold - knee to
// the ratio line at threshold + knee. The gain reduction is limited to 50 dB.
#pragma once

#include <array>
#include <atomic>
#include <cstdint>

#include "../ZenAudioAlgorithm.h"
#include "EnvelopeCoefficients.h"

class RmsCompressor : public ZenAudioAlgorithm {
    Q_OBJECT

public:
    enum Parameter : std::uint64_t {
        kRmsSpeed,
        kThreshold,
        kRatio,
        kKnee,
        kAttack,
        kRelease,
        kMakeup,
        kAutoMakeup,
        kMakeupReference,
    };
    // Meter 0: the gain reduction of the last sample, in dB (<= 0), without makeup.
    enum Meter : std::uint64_t { kGainReductionMeter };
    static constexpr std::uint64_t kMaxChannels = 31;

    RmsCompressor();

    static const zen::ParameterTableDefinition& Definitions();

    // Defaults at the new rate, then Reset.
    bool Prepare(float sampleRate, std::uint32_t maxBlock) override;
    bool SetParameter(std::uint64_t index, float value) override;
    void Reset() override;
    // False, buffers untouched, for more than kMaxChannels channels.
    bool Process(float* const* channels, std::uint64_t count) override;
    float GetMeter(std::uint64_t index) const override;

    // The static law: gain reduction in log units for an envelope in log units.
    float GainReduction(float envelope) const;
    float GetMakeup() const { return m_makeup; }

private:
    void UpdateKnee();
    void UpdateMakeup();

    std::array<float, kMaxChannels + 1> m_meanSquare{};
    zen::EnvelopeCoefficients m_rms;
    float m_lowerKnee = -1.0f;  // log units
    float m_upperKnee = -0.5f;
    float m_mid = -0.75f;
    float m_kneeRate = 0.0f;       // angle per log unit inside the knee
    float m_kneeAmplitude = 0.0f;
    bool m_kneeActive = false;
    float m_envelope = -0.75f;
    zen::EnvelopeCoefficients m_attack;
    zen::EnvelopeCoefficients m_release;
    float m_inverseRatio = 0.5f;
    float m_makeup = 0.0f;
    std::atomic<float> m_lastGain{0.0f};
};
