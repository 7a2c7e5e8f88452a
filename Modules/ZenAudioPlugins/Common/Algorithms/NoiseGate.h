// Noise gate: opens when the signal's peak reaches the threshold, stays open
// while it is above the threshold less the hysteresis and for the hold after
// it falls below, then closes down to the range. The gain moves in dB (log
// units) with one time constant opening and another closing, so a closing
// gate fades at an even rate in dB. Detection is linked across channels.
//
// Open and settled, the gate is an exact wire; closed, an exact gain.
#pragma once

#include <atomic>
#include <cstdint>

#include "../ZenAudioAlgorithm.h"
#include "EnvelopeCoefficients.h"

class NoiseGate : public ZenAudioAlgorithm {
    Q_OBJECT

public:
    enum Parameter : std::uint64_t { kThreshold, kHysteresis, kRange, kAttack, kHold, kRelease };
    // Meter 0: the gain of the last sample in dB (<= 0); meter 1: 1 while
    // the gate is open, 0 while closed.
    enum Meter : std::uint64_t { kGainMeter, kOpenMeter };
    // The detector's peak falls with this time constant, so the gate does
    // not see the zero crossings of a low tone as silence.
    static constexpr float kDetectorReleaseMs = 10.0f;

    NoiseGate();

    static const zen::ParameterTableDefinition& Definitions();

    // Defaults at the new rate, then Reset.
    bool Prepare(float sampleRate, std::uint32_t maxBlock) override;
    bool SetParameter(std::uint64_t index, float value) override;
    // Closed, detector and hold cleared.
    void Reset() override;
    bool Process(float* const* channels, std::uint64_t count) override;
    float GetMeter(std::uint64_t index) const override;

    bool IsOpen() const { return m_open; }

private:
    void UpdateLevels();

    // Settings (linear thresholds, log-unit floor).
    float m_openLevel = 0.0f;
    float m_closeLevel = 0.0f;
    float m_floor = 0.0f;
    zen::EnvelopeCoefficients m_attack;
    zen::EnvelopeCoefficients m_release;
    float m_detectorDecay = 0.0f;
    std::int32_t m_holdLength = 0;

    // Signal state.
    float m_detector = 0.0f;  // linear peak
    bool m_open = false;
    std::int32_t m_holdCounter = 0;
    float m_gain = 0.0f;  // log units
    std::atomic<float> m_gainDb{0.0f};
    std::atomic<bool> m_openMeter{false};
};
