#include "Expander.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

namespace {

// Silence reads as this magnitude: its logarithm lies below any floor.
constexpr float kSilence = 1.1754944e-38f;

}  // namespace

Expander::Expander() : ZenAudioAlgorithm(Definitions()) {
    for (std::uint64_t i = 0; i < GetParameterCount(); ++i) SetParameter(i, GetParameter(i));
    Reset();
}

const zen::ParameterTableDefinition& Expander::Definitions() {
    static const zen::ParameterTableDefinition table = zen::MakeParameterTable(
        "Expander",
        {
            zen::ContinuousParameter("THRES", QT_TRANSLATE_NOOP("Expander", "Threshold"), -80.0f, 0.0f, -30.0f, 0.1f,
                                     "dB"),
            zen::ContinuousParameter("RATIO", QT_TRANSLATE_NOOP("Expander", "Ratio"), 1.0f, 20.0f, 2.0f, 0.1f),
            zen::ContinuousParameter("RANGE", QT_TRANSLATE_NOOP("Expander", "Range"), 0.0f, 50.0f, 10.0f, 0.1f, "dB"),
            zen::ContinuousParameter("ATTACK", QT_TRANSLATE_NOOP("Expander", "Attack"), 0.1f, 100.0f, 1.4f, 0.1f,
                                     "ms"),
            // The hold shares the attack's range on purpose.
            zen::ContinuousParameter("HOLD", QT_TRANSLATE_NOOP("Expander", "Hold"), 0.1f, 100.0f, 1.4f, 0.1f, "ms"),
            zen::ContinuousParameter("RELEASE", QT_TRANSLATE_NOOP("Expander", "Release"), 50.0f, 4000.0f, 150.0f,
                                     1.0f, "ms"),
        });
    return table;
}

bool Expander::Prepare(float sampleRate, std::uint32_t maxBlock) {
    ZenAudioAlgorithm::Prepare(sampleRate, maxBlock);
    Reset();
    return true;
}

bool Expander::SetParameter(std::uint64_t index, float value) {
    if (!ZenAudioAlgorithm::SetParameter(index, value)) return false;
    const int fs = GetSampleRate();
    switch (index) {
        case kThreshold:
        case kRatio:
        case kRange: UpdateLaw(); break;
        case kAttack: m_attack = zen::EnvelopeCoefficients::FromMilliseconds(fs, value); break;
        case kHold: m_holdLength = zen::HoldSamples(fs, value); break;
        case kRelease: m_release = zen::EnvelopeCoefficients::FromMilliseconds(fs, value); break;
        default: break;
    }
    return true;
}

void Expander::UpdateLaw() {
    m_slope = std::max(GetParameter(kRatio), 1.0f);
    m_threshold = zen::DbToLogUnits(GetParameter(kThreshold));
    m_floor = m_threshold - zen::DbToLogUnits(GetParameter(kRange)) / m_slope;
    // A lowered threshold must not turn an open envelope into a boost.
    m_envelope = std::min(m_envelope, m_threshold);
}

void Expander::Reset() {
    m_envelope = m_floor;
    m_holdCounter = 0;
    m_lastGain.store((m_envelope - m_threshold) * m_slope, std::memory_order_relaxed);
}

bool Expander::Process(float* const* channels, std::uint64_t count) {
    const std::uint64_t channelCount = GetChannelCount();
    if (channelCount == 0) return true;
    float gain = m_lastGain.load(std::memory_order_relaxed);
    // Open (or resting at the floor) the gain repeats: one power for the run.
    float linearOf = gain;
    float linear = zen::LogUnitsToGain(gain);
    for (std::uint64_t n = 0; n < count; ++n) {
        float peak = kSilence;
        for (std::uint64_t c = 0; c < channelCount; ++c) peak = std::max(peak, std::fabs(channels[c][n]));
        const float level = std::max(std::log10(std::min(peak, zen::kDetectorCeiling)), m_floor);
        if (level > m_envelope) {
            m_envelope = m_attack.Step(m_envelope, level);
            // Fully open: clamp and hold there.
            if (m_envelope >= m_threshold) {
                m_envelope = m_threshold;
                m_holdCounter = m_holdLength;
            }
        } else if (m_holdCounter > 0) {
            --m_holdCounter;
        } else {
            m_envelope = m_release.Step(m_envelope, level);
        }
        gain = (m_envelope - m_threshold) * m_slope;
        if (gain != linearOf) {
            linear = zen::LogUnitsToGain(gain);
            linearOf = gain;
        }
        for (std::uint64_t c = 0; c < channelCount; ++c) channels[c][n] *= linear;
    }
    m_lastGain.store(gain, std::memory_order_relaxed);
    return true;
}

float Expander::GetMeter(std::uint64_t index) const {
    return index == kGainMeter ? zen::LogUnitsToDb(m_lastGain.load(std::memory_order_relaxed)) : 0.0f;
}
