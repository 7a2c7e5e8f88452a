#include "Compressor.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

Compressor::Compressor() : ZenAudioAlgorithm(Definitions()) {
    // Coefficients of the defaults at the construction rate.
    for (std::uint64_t i = 0; i < GetParameterCount(); ++i) SetParameter(i, GetParameter(i));
    Reset();
}

const zen::ParameterTableDefinition& Compressor::Definitions() {
    static const zen::ParameterTableDefinition table = zen::MakeParameterTable(
        "Compressor",
        {
            zen::ContinuousParameter("RATIO", QT_TRANSLATE_NOOP("Compressor", "Ratio"), 1.2f, 20.0f, 2.0f, 0.1f),
            zen::ContinuousParameter("THRES", QT_TRANSLATE_NOOP("Compressor", "Threshold"), -50.0f, 0.0f, -15.0f,
                                     0.1f, "dB"),
            zen::ContinuousParameter("ATTACK", QT_TRANSLATE_NOOP("Compressor", "Attack"), 0.1f, 100.0f, 1.4f, 0.1f,
                                     "ms"),
            zen::ContinuousParameter("HOLD", QT_TRANSLATE_NOOP("Compressor", "Hold"), 0.0f, 4000.0f, 0.0f, 1.0f, "ms"),
            zen::ContinuousParameter("RELEASE", QT_TRANSLATE_NOOP("Compressor", "Release"), 50.0f, 4000.0f, 150.0f,
                                     1.0f, "ms"),
            zen::ContinuousParameter("MAKEUP_GAIN", QT_TRANSLATE_NOOP("Compressor", "Makeup"), 0.0f, 20.0f, 0.0f,
                                     0.1f, "dB"),
            zen::SwitchParameter("SIDECHAIN_ON", QT_TRANSLATE_NOOP("Compressor", "Sidechain"), 0.0f),
            zen::ContinuousParameter("GR_LIMIT", QT_TRANSLATE_NOOP("Compressor", "Gain Redc Limit"), 0.0f, 50.0f,
                                     50.0f, 0.1f, "dB"),
        });
    return table;
}

bool Compressor::Prepare(float sampleRate, std::uint32_t maxBlock) {
    ZenAudioAlgorithm::Prepare(sampleRate, maxBlock);
    Reset();
    return true;
}

bool Compressor::SetParameter(std::uint64_t index, float value) {
    if (!ZenAudioAlgorithm::SetParameter(index, value)) return false;
    const int fs = GetSampleRate();
    switch (index) {
        case kRatio:
            if (value > 0.0f) m_slope = 1.0f - 1.0f / value;
            break;
        case kThreshold: m_threshold = zen::DbToLogUnits(value); break;
        case kAttack: m_attack = zen::EnvelopeCoefficients::FromMilliseconds(fs, value); break;
        case kHold: m_holdLength = zen::HoldSamples(fs, value); break;
        case kRelease: m_release = zen::EnvelopeCoefficients::FromMilliseconds(fs, value); break;
        case kMakeup: m_makeup = zen::DbToLogUnits(value); break;
        case kSidechainOn: m_sidechain = std::trunc(value + 0.5f) != 0.0f; break;
        case kGrLimit: m_limitFloor = -zen::DbToLogUnits(value); break;
        default: break;
    }
    return true;
}

void Compressor::Reset() {
    m_envelope = m_threshold;
    m_holdCounter = 0;
    m_reductionDb.store(0.0f, std::memory_order_relaxed);
    m_gainDb.store(zen::LogUnitsToDb(m_makeup), std::memory_order_relaxed);
}

bool Compressor::AcceptsLayout() const {
    const std::uint64_t mains = GetChannelCount();
    if (!m_sidechain) return true;
    return m_sidechainChannels == 1 || (mains == 1 && m_sidechainChannels > 0) || m_sidechainChannels == mains;
}

bool Compressor::Process(float* const* channels, std::uint64_t count) {
    const std::uint64_t mains = GetChannelCount();
    if (mains == 0) return true;
    if (!AcceptsLayout()) return false;
    float* const* detectors = m_sidechain ? channels + mains : channels;
    const std::uint64_t detectorCount = m_sidechain ? m_sidechainChannels : mains;

    float reduction = 0.0f;
    for (std::uint64_t n = 0; n < count; ++n) {
        float peak = 0.0f;
        for (std::uint64_t c = 0; c < detectorCount; ++c) peak = std::max(peak, std::fabs(detectors[c][n]));
        // The detector never falls below the threshold.
        const float level = std::max(zen::LogLevel(peak), m_threshold);
        if (level > m_envelope) {
            m_envelope = m_attack.Step(m_envelope, level);
            m_holdCounter = m_holdLength;
        } else if (m_holdCounter > 0) {
            --m_holdCounter;
        } else {
            m_envelope = m_release.Step(m_envelope, level);
        }
        reduction = std::max(m_limitFloor, (m_threshold - m_envelope) * m_slope);
        const float gain = zen::LogUnitsToGain(reduction + m_makeup);
        for (std::uint64_t c = 0; c < mains; ++c) channels[c][n] *= gain;
    }
    if (count > 0) {
        m_reductionDb.store(zen::LogUnitsToDb(reduction), std::memory_order_relaxed);
        m_gainDb.store(zen::LogUnitsToDb(reduction + m_makeup), std::memory_order_relaxed);
    }
    return true;
}

float Compressor::GetMeter(std::uint64_t index) const {
    switch (index) {
        case kGainReductionMeter: return m_reductionDb.load(std::memory_order_relaxed);
        case kGainMeter: return m_gainDb.load(std::memory_order_relaxed);
        default: return 0.0f;
    }
}
