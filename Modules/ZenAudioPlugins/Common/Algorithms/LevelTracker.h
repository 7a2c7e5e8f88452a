// Peak level detector for owners that combine envelopes themselves: Feed
// collects the largest magnitude since the last update, Update advances the
// attack/hold/release envelope once and returns it in log units (dB/20),
// never below the floor.
#pragma once

#include <atomic>
#include <cstdint>

#include "../ZenAudioAlgorithm.h"
#include "EnvelopeCoefficients.h"

class LevelTracker : public ZenAudioAlgorithm {
    Q_OBJECT

public:
    enum Parameter : std::uint64_t { kFloor, kAttack, kHold, kRelease };
    // Meter 0: the envelope after the last update, in dB.
    enum Meter : std::uint64_t { kEnvelopeMeter };

    LevelTracker();

    static const zen::ParameterTableDefinition& Definitions();

    // Defaults at the new rate, then Reset.
    bool Prepare(float sampleRate, std::uint32_t maxBlock) override;
    bool SetParameter(std::uint64_t index, float value) override;
    // Envelope at the floor, hold counter full, no peak collected.
    void Reset() override;
    // Tracks the loudest channel, sample by sample; the buffers are not changed.
    bool Process(float* const* channels, std::uint64_t count) override;
    float GetMeter(std::uint64_t index) const override;

    void Feed(float sample) noexcept {
        const float magnitude = sample < 0.0f ? -sample : sample;
        if (magnitude > m_peak) m_peak = magnitude;  // NaN never wins
    }
    float Update() noexcept {
        // While holding, a peak too small to lift the envelope changes
        // nothing but the counter, and needs no logarithm.
        if (m_holdCounter > 0 && m_peak <= m_holdBound) {
            --m_holdCounter;
            m_peak = zen::kDetectorFloor;
            return m_envelope;
        }
        return Step();
    }

    float GetEnvelope() const { return m_envelope; }

private:
    float Step() noexcept;
    // The largest magnitude whose level (log10, floored and capped as the
    // detector does) is at most `level`; -1 when there is none. Exact, since
    // log10f never decreases over the detector's range.
    static float MagnitudeBound(float level);
    void ForgetHoldBound() {
        m_holdBound = -1.0f;
        m_holdStreak = 0;
    }

    float m_floor = -0.75f;  // log units
    float m_envelope = -0.75f;
    zen::EnvelopeCoefficients m_attack;
    std::int32_t m_holdCounter = 0;
    std::int32_t m_holdLength = 0;
    zen::EnvelopeCoefficients m_release;
    float m_peak = zen::kDetectorFloor;  // linear, since the last update
    float m_floorBound = -1.0f;          // peaks at or below it read as the floor
    float m_holdBound = -1.0f;           // peaks at or below it keep the held envelope
    std::int32_t m_holdStreak = 0;       // held updates since the envelope last moved
    std::atomic<float> m_envelopeDb{-15.0f};
};
