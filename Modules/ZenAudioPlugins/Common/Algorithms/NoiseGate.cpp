#include "NoiseGate.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

namespace {

// A gain this close to its target (log units, 2e-5 dB) has arrived.
constexpr float kArrived = 1e-6f;

}  // namespace

NoiseGate::NoiseGate() : ZenAudioAlgorithm(Definitions()) {
    m_detectorDecay = zen::EnvelopeCoefficients::FromMilliseconds(GetSampleRate(), kDetectorReleaseMs).a;
    for (std::uint64_t i = 0; i < GetParameterCount(); ++i) SetParameter(i, GetParameter(i));
    Reset();
}

const zen::ParameterTableDefinition& NoiseGate::Definitions() {
    static const zen::ParameterTableDefinition table = zen::MakeParameterTable(
        "NoiseGate",
        {
            zen::ContinuousParameter("THRES", QT_TRANSLATE_NOOP("NoiseGate", "Threshold"), -80.0f, 0.0f, -45.0f, 0.1f,
                                     "dB"),
            zen::ContinuousParameter("HYSTERESIS", QT_TRANSLATE_NOOP("NoiseGate", "Hysteresis"), 0.0f, 20.0f, 6.0f,
                                     0.1f, "dB"),
            zen::ContinuousParameter("RANGE", QT_TRANSLATE_NOOP("NoiseGate", "Range"), 0.0f, 90.0f, 40.0f, 0.1f, "dB"),
            zen::ContinuousParameter("ATTACK", QT_TRANSLATE_NOOP("NoiseGate", "Attack"), 0.05f, 50.0f, 0.5f, 0.01f,
                                     "ms"),
            zen::ContinuousParameter("HOLD", QT_TRANSLATE_NOOP("NoiseGate", "Hold"), 0.0f, 2000.0f, 50.0f, 1.0f, "ms"),
            zen::ContinuousParameter("RELEASE", QT_TRANSLATE_NOOP("NoiseGate", "Release"), 5.0f, 4000.0f, 150.0f, 1.0f,
                                     "ms"),
        });
    return table;
}

bool NoiseGate::Prepare(float sampleRate, std::uint32_t maxBlock) {
    ZenAudioAlgorithm::Prepare(sampleRate, maxBlock);
    m_detectorDecay = zen::EnvelopeCoefficients::FromMilliseconds(GetSampleRate(), kDetectorReleaseMs).a;
    Reset();
    return true;
}

bool NoiseGate::SetParameter(std::uint64_t index, float value) {
    if (!ZenAudioAlgorithm::SetParameter(index, value)) return false;
    const int fs = GetSampleRate();
    switch (index) {
        case kThreshold:
        case kHysteresis:
        case kRange: UpdateLevels(); break;
        case kAttack: m_attack = zen::EnvelopeCoefficients::FromMilliseconds(fs, value); break;
        case kHold: m_holdLength = zen::HoldSamples(fs, value); break;
        case kRelease: m_release = zen::EnvelopeCoefficients::FromMilliseconds(fs, value); break;
        default: break;
    }
    return true;
}

void NoiseGate::UpdateLevels() {
    const float threshold = GetParameter(kThreshold);
    m_openLevel = zen::LogUnitsToGain(zen::DbToLogUnits(threshold));
    m_closeLevel = zen::LogUnitsToGain(zen::DbToLogUnits(threshold - std::max(0.0f, GetParameter(kHysteresis))));
    // The gain glides to a new floor at the gate's own pace.
    m_floor = -zen::DbToLogUnits(std::max(0.0f, GetParameter(kRange)));
}

void NoiseGate::Reset() {
    m_detector = 0.0f;
    m_open = false;
    m_holdCounter = 0;
    m_gain = m_floor;
    m_gainDb.store(zen::LogUnitsToDb(m_gain), std::memory_order_relaxed);
    m_openMeter.store(false, std::memory_order_relaxed);
}

bool NoiseGate::Process(float* const* channels, std::uint64_t count) {
    const std::uint64_t channelCount = GetChannelCount();
    if (channelCount == 0) return true;
    float gain = m_gain;
    float linear = zen::LogUnitsToGain(gain);
    for (std::uint64_t n = 0; n < count; ++n) {
        float peak = 0.0f;
        for (std::uint64_t c = 0; c < channelCount; ++c) {
            const float magnitude = std::fabs(channels[c][n]);
            if (magnitude > peak) peak = magnitude;  // NaN never wins
        }
        m_detector = std::max(std::min(peak, zen::kDetectorCeiling), m_detector * m_detectorDecay);
        if (m_detector >= m_openLevel) {
            m_open = true;
            m_holdCounter = m_holdLength;
        } else if (m_detector >= m_closeLevel) {
            if (m_open) m_holdCounter = m_holdLength;
        } else if (m_holdCounter > 0) {
            --m_holdCounter;
        } else {
            m_open = false;
        }
        const float target = m_open ? 0.0f : m_floor;
        if (gain != target) {
            // A float one-pole stalls short of its target once a step rounds
            // to nothing: that too counts as arrived.
            const float next = (target > gain ? m_attack : m_release).Step(gain, target);
            gain = next == gain || std::fabs(next - target) < kArrived ? target : next;
            linear = zen::LogUnitsToGain(gain);
        }
        if (gain != 0.0f)
            for (std::uint64_t c = 0; c < channelCount; ++c) channels[c][n] *= linear;
    }
    m_gain = gain;
    m_gainDb.store(zen::LogUnitsToDb(gain), std::memory_order_relaxed);
    m_openMeter.store(m_open, std::memory_order_relaxed);
    return true;
}

float NoiseGate::GetMeter(std::uint64_t index) const {
    switch (index) {
        case kGainMeter: return m_gainDb.load(std::memory_order_relaxed);
        case kOpenMeter: return m_openMeter.load(std::memory_order_relaxed) ? 1.0f : 0.0f;
        default: return 0.0f;
    }
}
