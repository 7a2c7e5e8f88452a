#include "RmsCompressor.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

namespace {

// Gain reduction never goes below -50 dB.
constexpr float kLimitFloor = -2.5f;
// Mean squares of the detector's floor and ceiling magnitudes.
constexpr float kMeanSquareFloor = zen::kDetectorFloor * zen::kDetectorFloor;
constexpr float kMeanSquareCeiling = zen::kDetectorCeiling * zen::kDetectorCeiling;
// Added to and taken from the stored mean squares: values that would turn
// denormal in silence vanish (they lie far below the floor anyway).
constexpr float kDenormalGuard = 1e-18f;

}  // namespace

RmsCompressor::RmsCompressor() : ZenAudioAlgorithm(Definitions()) {
    for (std::uint64_t i = 0; i < GetParameterCount(); ++i) SetParameter(i, GetParameter(i));
    Reset();
    m_envelope = -0.75f;
}

const zen::ParameterTableDefinition& RmsCompressor::Definitions() {
    static const zen::ParameterTableDefinition table = zen::MakeParameterTable(
        "RmsCompressor",
        {
            zen::ContinuousParameter("RMS_SPEED", QT_TRANSLATE_NOOP("RmsCompressor", "RMS Speed"), 0.1f, 200.0f, 30.0f,
                                     0.1f, "ms"),
            zen::ContinuousParameter("THRES", QT_TRANSLATE_NOOP("RmsCompressor", "Threshold"), -50.0f, 0.0f, -15.0f,
                                     0.1f, "dB"),
            zen::ContinuousParameter("RATIO", QT_TRANSLATE_NOOP("RmsCompressor", "Ratio"), 1.2f, 20.0f, 2.0f, 0.1f),
            zen::ContinuousParameter("KNEE", QT_TRANSLATE_NOOP("RmsCompressor", "Knee"), 0.0f, 15.0f, 5.0f, 0.1f),
            zen::ContinuousParameter("ATTACK", QT_TRANSLATE_NOOP("RmsCompressor", "Attack"), 0.1f, 100.0f, 1.4f, 0.1f,
                                     "ms"),
            zen::ContinuousParameter("RELEASE", QT_TRANSLATE_NOOP("RmsCompressor", "Release"), 50.0f, 4000.0f, 150.0f,
                                     1.0f, "ms"),
            zen::ContinuousParameter("MAKEUP_GAIN", QT_TRANSLATE_NOOP("RmsCompressor", "Makeup"), 0.0f, 20.0f, 0.0f,
                                     0.1f, "dB"),
            zen::SwitchParameter("AUTO_MAKEUP", QT_TRANSLATE_NOOP("RmsCompressor", "Auto Makeup"), 0.0f, "dB"),
            zen::ContinuousParameter("MAKEUP_REF", QT_TRANSLATE_NOOP("RmsCompressor", "Makeup Ref"), -30.0f, 0.0f,
                                     -13.0f, 0.1f, "dB"),
        });
    return table;
}

bool RmsCompressor::Prepare(float sampleRate, std::uint32_t maxBlock) {
    ZenAudioAlgorithm::Prepare(sampleRate, maxBlock);
    Reset();
    return true;
}

bool RmsCompressor::SetParameter(std::uint64_t index, float value) {
    if (!ZenAudioAlgorithm::SetParameter(index, value)) return false;
    const int fs = GetSampleRate();
    switch (index) {
        case kRmsSpeed: m_rms = zen::EnvelopeCoefficients::FromMilliseconds(fs, value); break;
        case kAttack: m_attack = zen::EnvelopeCoefficients::FromMilliseconds(fs, value); break;
        case kRelease: m_release = zen::EnvelopeCoefficients::FromMilliseconds(fs, value); break;
        case kThreshold:
        case kRatio:
            UpdateKnee();
            UpdateMakeup();
            break;
        case kKnee: UpdateKnee(); break;
        case kMakeup:
        case kAutoMakeup:
        case kMakeupReference: UpdateMakeup(); break;
        default: break;
    }
    return true;
}

void RmsCompressor::UpdateKnee() {
    const float threshold = GetParameter(kThreshold);
    const float knee = GetParameter(kKnee);
    // A ratio below 1 would expand; it counts as 1, no compression.
    const float ratio = std::max(GetParameter(kRatio), 1.0f);
    m_inverseRatio = 1.0f / ratio;
    m_upperKnee = zen::DbToLogUnits(threshold + knee);
    m_lowerKnee = zen::DbToLogUnits(threshold - knee);
    m_mid = static_cast<float>((static_cast<double>(m_upperKnee) + m_lowerKnee) / 2.0);
    // Knee 0 leaves only the ratio line; ratio 1 leaves only the unity line.
    m_kneeActive = m_upperKnee > m_lowerKnee && m_inverseRatio < 1.0f;
    if (m_kneeActive) {
        const float angle = std::acos(m_inverseRatio);
        m_kneeRate = angle / (m_upperKnee - m_lowerKnee);
        m_kneeAmplitude = ((m_upperKnee - m_mid) * m_inverseRatio + m_mid - m_lowerKnee) / std::sin(angle);
    } else {
        m_kneeRate = 0.0f;
        m_kneeAmplitude = 0.0f;
    }
}

void RmsCompressor::UpdateMakeup() {
    if (GetParameter(kAutoMakeup) > 0.0f) {
        // What brings a signal at the reference level back to that level.
        const float threshold = GetParameter(kThreshold);
        const float reference = GetParameter(kMakeupReference);
        const float compressed = std::max(0.0f, reference - threshold) * m_inverseRatio + threshold;
        m_makeup = zen::DbToLogUnits(std::max(0.0f, reference - compressed));
    } else {
        m_makeup = zen::DbToLogUnits(GetParameter(kMakeup));
    }
}

void RmsCompressor::Reset() {
    m_envelope = m_lowerKnee;
    m_meanSquare.fill(0.0f);
    m_lastGain.store(0.0f, std::memory_order_relaxed);
}

float RmsCompressor::GainReduction(float envelope) const {
    float gain = 0.0f;
    if (envelope >= m_upperKnee) {
        gain = (envelope - m_mid) * m_inverseRatio - (envelope - m_mid);
    } else if (envelope >= m_lowerKnee && m_kneeActive) {
        const float d = envelope - m_lowerKnee;
        gain = m_kneeAmplitude * std::sin(m_kneeRate * d) - d;
    }
    return std::max(kLimitFloor, gain);
}

bool RmsCompressor::Process(float* const* channels, std::uint64_t count) {
    const std::uint64_t channelCount = GetChannelCount();
    if (channelCount == 0) return true;
    if (channelCount > kMaxChannels) return false;
    float gain = m_lastGain.load(std::memory_order_relaxed);
    for (std::uint64_t n = 0; n < count; ++n) {
        float loudest = kMeanSquareFloor;
        for (std::uint64_t c = 0; c < channelCount; ++c) {
            float square = channels[c][n] * channels[c][n];
            // NaN adds nothing, infinity no more than the ceiling.
            if (!(square < kMeanSquareCeiling)) square = square >= kMeanSquareCeiling ? kMeanSquareCeiling : 0.0f;
            m_meanSquare[c] = (m_rms.Step(m_meanSquare[c], square) + kDenormalGuard) - kDenormalGuard;
            loudest = std::max(loudest, m_meanSquare[c]);
        }
        // log10 of the RMS: half the log of the mean square.
        const float level = std::max(0.5f * std::log10(loudest), m_lowerKnee);
        m_envelope = (level > m_envelope ? m_attack : m_release).Step(m_envelope, level);
        gain = GainReduction(m_envelope);
        const float linear = zen::LogUnitsToGain(gain + m_makeup);
        for (std::uint64_t c = 0; c < channelCount; ++c) channels[c][n] *= linear;
    }
    m_lastGain.store(gain, std::memory_order_relaxed);
    return true;
}

float RmsCompressor::GetMeter(std::uint64_t index) const {
    return index == kGainReductionMeter ? zen::LogUnitsToDb(m_lastGain.load(std::memory_order_relaxed)) : 0.0f;
}
