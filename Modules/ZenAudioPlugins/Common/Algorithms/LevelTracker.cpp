#include "LevelTracker.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>
#include <limits>

LevelTracker::LevelTracker() : ZenAudioAlgorithm(Definitions()) {
    for (std::uint64_t i = 0; i < GetParameterCount(); ++i) SetParameter(i, GetParameter(i));
    Reset();
}

const zen::ParameterTableDefinition& LevelTracker::Definitions() {
    static const zen::ParameterTableDefinition table = zen::MakeParameterTable(
        "LevelTracker",
        {
            zen::ContinuousParameter("FLOOR", QT_TRANSLATE_NOOP("LevelTracker", "Floor"), -70.0f, 0.0f, -15.0f, 0.1f,
                                     "dB"),
            zen::ContinuousParameter("ATTACK", QT_TRANSLATE_NOOP("LevelTracker", "Attack"), 0.1f, 100.0f, 1.4f, 0.1f,
                                     "ms"),
            zen::ContinuousParameter("HOLD", QT_TRANSLATE_NOOP("LevelTracker", "Hold"), 0.0f, 4000.0f, 0.0f, 1.0f,
                                     "ms"),
            zen::ContinuousParameter("RELEASE", QT_TRANSLATE_NOOP("LevelTracker", "Release"), 50.0f, 4000.0f, 150.0f,
                                     1.0f, "ms"),
        });
    return table;
}

bool LevelTracker::Prepare(float sampleRate, std::uint32_t maxBlock) {
    ZenAudioAlgorithm::Prepare(sampleRate, maxBlock);
    Reset();
    return true;
}

bool LevelTracker::SetParameter(std::uint64_t index, float value) {
    if (!ZenAudioAlgorithm::SetParameter(index, value)) return false;
    const int fs = GetSampleRate();
    switch (index) {
        case kFloor:
            m_floor = zen::DbToLogUnits(value);
            m_floorBound = MagnitudeBound(m_floor);
            ForgetHoldBound();
            break;
        case kAttack: m_attack = zen::EnvelopeCoefficients::FromMilliseconds(fs, value); break;
        case kHold: m_holdLength = zen::HoldSamples(fs, value); break;
        case kRelease: m_release = zen::EnvelopeCoefficients::FromMilliseconds(fs, value); break;
        default: break;
    }
    return true;
}

void LevelTracker::Reset() {
    m_envelope = m_floor;
    m_holdCounter = m_holdLength;
    m_peak = zen::kDetectorFloor;
    ForgetHoldBound();
    m_envelopeDb.store(zen::LogUnitsToDb(m_envelope), std::memory_order_relaxed);
}

float LevelTracker::MagnitudeBound(float level) {
    if (!(zen::LogLevel(0.0f) <= level)) return -1.0f;
    if (zen::LogLevel(zen::kDetectorCeiling) <= level) return std::numeric_limits<float>::max();
    float p = std::min(std::max(static_cast<float>(std::pow(10.0, level)), zen::kDetectorFloor), zen::kDetectorCeiling);
    while (zen::LogLevel(p) > level) p = std::nextafter(p, 0.0f);
    for (float q = std::nextafter(p, zen::kDetectorCeiling); zen::LogLevel(q) <= level;
         q = std::nextafter(q, zen::kDetectorCeiling))
        p = q;
    return p;
}

float LevelTracker::Step() noexcept {
    const float level = m_peak <= m_floorBound ? m_floor : std::max(m_floor, zen::LogLevel(m_peak));
    m_peak = zen::kDetectorFloor;
    if (level > m_envelope) {
        m_envelope = m_attack.Step(m_envelope, level);
        m_holdCounter = m_holdLength;
        ForgetHoldBound();
    } else if (m_holdCounter > 0) {
        --m_holdCounter;
        // A second held update in a row: the hold is likely to last, worth
        // the few logarithms the bound costs.
        if (++m_holdStreak == 2 && m_floor <= m_envelope) m_holdBound = MagnitudeBound(m_envelope);
    } else {
        m_envelope = m_release.Step(m_envelope, level);
        ForgetHoldBound();
    }
    return m_envelope;
}

bool LevelTracker::Process(float* const* channels, std::uint64_t count) {
    const std::uint64_t channelCount = GetChannelCount();
    if (channelCount == 0) return true;
    for (std::uint64_t n = 0; n < count; ++n) {
        for (std::uint64_t c = 0; c < channelCount; ++c) Feed(channels[c][n]);
        Update();
    }
    m_envelopeDb.store(zen::LogUnitsToDb(m_envelope), std::memory_order_relaxed);
    return true;
}

float LevelTracker::GetMeter(std::uint64_t index) const {
    return index == kEnvelopeMeter ? m_envelopeDb.load(std::memory_order_relaxed) : 0.0f;
}
