// Downward expander with a range: below the threshold the gain falls by
// `ratio` log units per log unit of level (clamped at ratio 1), down to the
// floor set by the range. Peak detection, linked across channels; the
// envelope never rises above the threshold, so the gain never exceeds unity.
#pragma once

#include <algorithm>
#include <atomic>
#include <cstdint>

#include "../ZenAudioAlgorithm.h"
#include "EnvelopeCoefficients.h"

class Expander : public ZenAudioAlgorithm {
    Q_OBJECT

public:
    enum Parameter : std::uint64_t { kThreshold, kRatio, kRange, kAttack, kHold, kRelease };
    // Meter 0: the gain applied to the last sample, in dB (<= 0).
    enum Meter : std::uint64_t { kGainMeter };

    Expander();

    static const zen::ParameterTableDefinition& Definitions();

    // Defaults at the new rate, then Reset.
    bool Prepare(float sampleRate, std::uint32_t maxBlock) override;
    bool SetParameter(std::uint64_t index, float value) override;
    // Closes the expander: the envelope rests at the floor.
    void Reset() override;
    bool Process(float* const* channels, std::uint64_t count) override;
    float GetMeter(std::uint64_t index) const override;

    // The gain of the last sample, in log units.
    float GetLastGain() const { return m_lastGain.load(std::memory_order_relaxed); }
    // The static law: the gain (log units) at a steady level (log units).
    float GainAt(float level) const { return (std::clamp(level, m_floor, m_threshold) - m_threshold) * m_slope; }

private:
    void UpdateLaw();

    float m_envelope = -1.75f;  // log units
    zen::EnvelopeCoefficients m_attack;
    std::int32_t m_holdCounter = 0;
    std::int32_t m_holdLength = 0;
    zen::EnvelopeCoefficients m_release;
    float m_threshold = -1.5f;
    float m_floor = -1.75f;
    float m_slope = 2.0f;
    std::atomic<float> m_lastGain{0.0f};
};
