#include "SoftKneeCompressor.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

namespace {

constexpr float kLimitFloor = -SoftKneeCompressor::kReductionLimitDb / 20.0f;
constexpr float kLog10Of2 = 0.30103f;

// zen::LogLevel by way of log2, which the C library computes several times
// faster than log10; a few units in the last place apart.
inline float Level(float magnitude) {
    magnitude = magnitude > zen::kDetectorFloor ? magnitude : zen::kDetectorFloor;
    magnitude = magnitude < zen::kDetectorCeiling ? magnitude : zen::kDetectorCeiling;
    return std::log2(magnitude) * kLog10Of2;
}

}  // namespace

SoftKneeCompressor::SoftKneeCompressor() : ZenAudioAlgorithm(Definitions()) {
    for (std::uint64_t i = 0; i < GetParameterCount(); ++i) SetParameter(i, GetParameter(i));
    Reset();
}

const zen::ParameterTableDefinition& SoftKneeCompressor::Definitions() {
    using namespace zen;
    static const ParameterTableDefinition table = MakeParameterTable(
        "SoftKneeCompressor",
        {
            ContinuousParameter("THRES", QT_TRANSLATE_NOOP("SoftKneeCompressor", "Threshold"), -60.0f, 0.0f, -20.0f,
                                0.1f, "dB"),
            ContinuousParameter("RATIO", QT_TRANSLATE_NOOP("SoftKneeCompressor", "Ratio"), 1.0f, 20.0f, 2.0f, 0.1f),
            ContinuousParameter("KNEE", QT_TRANSLATE_NOOP("SoftKneeCompressor", "Knee"), 0.0f, 24.0f, 6.0f, 0.1f,
                                "dB"),
            ContinuousParameter("ATTACK", QT_TRANSLATE_NOOP("SoftKneeCompressor", "Attack"), 0.1f, 100.0f, 10.0f,
                                0.1f, "ms"),
            ContinuousParameter("RELEASE", QT_TRANSLATE_NOOP("SoftKneeCompressor", "Release"), 10.0f, 4000.0f, 150.0f,
                                1.0f, "ms"),
            ContinuousParameter("MAKEUP_GAIN", QT_TRANSLATE_NOOP("SoftKneeCompressor", "Makeup"), -20.0f, 20.0f,
                                0.0f, 0.1f, "dB"),
        });
    return table;
}

float SoftKneeCompressor::Reduction(float envelope, const Law& law) noexcept {
    const float over = envelope - law.threshold;
    const float half = 0.5f * law.knee;
    float g;
    if (over >= half) {
        g = -over * law.slope;
    } else if (over > -half) {
        const float into = over + half;  // > 0, so the knee is wider than 0
        g = -law.slope * into * into / (2.0f * law.knee);
    } else {
        g = 0.0f;
    }
    return std::max(g, kLimitFloor);
}

bool SoftKneeCompressor::Prepare(float sampleRate, std::uint32_t maxBlock) {
    m_gains.assign(maxBlock, 1.0f);
    ZenAudioAlgorithm::Prepare(sampleRate, maxBlock);
    Reset();
    return true;
}

bool SoftKneeCompressor::SetParameter(std::uint64_t index, float value) {
    if (!ZenAudioAlgorithm::SetParameter(index, value)) return false;
    const int fs = GetSampleRate();
    switch (index) {
        case kThreshold: m_law.threshold = zen::DbToLogUnits(value); break;
        case kRatio: m_law.slope = SlopeOfRatio(value); break;
        case kKnee: m_law.knee = zen::DbToLogUnits(std::max(value, 0.0f)); break;
        case kAttack: m_attack = zen::EnvelopeCoefficients::FromMilliseconds(fs, value); break;
        case kRelease: m_release = zen::EnvelopeCoefficients::FromMilliseconds(fs, value); break;
        case kMakeup: m_law.makeup = zen::DbToLogUnits(value); break;
        default: break;
    }
    return true;
}

void SoftKneeCompressor::Reset() { Reset(m_law); }

void SoftKneeCompressor::Reset(const Law& law) {
    m_envelope = law.threshold - 0.5f * law.knee;
    m_reduction = 0.0f;
    m_reductionDb.store(0.0f, std::memory_order_relaxed);
}

template <bool kPerSample>
void SoftKneeCompressor::Run(const float* const* detectors, std::size_t detectorCount, float* gains,
                             std::size_t count, const Law* law) noexcept {
    float envelope = m_envelope;
    float reduction = m_reduction;
    const zen::EnvelopeCoefficients attack = m_attack, release = m_release;
    for (std::size_t n = 0; n < count; ++n) {
        const Law& l = law[kPerSample ? n : 0];
        float peak = 0.0f;
        for (std::size_t c = 0; c < detectorCount; ++c) peak = std::max(peak, std::fabs(detectors[c][n]));
        // The detector never falls below the knee: the envelope rests there.
        const float level = std::max(Level(peak), l.threshold - 0.5f * l.knee);
        envelope = level > envelope ? attack.Step(envelope, level) : release.Step(envelope, level);
        reduction = Reduction(envelope, l);
        gains[n] = zen::LogUnitsToGain(reduction + l.makeup);
    }
    m_envelope = envelope;
    m_reduction = reduction;
}

void SoftKneeCompressor::ComputeGains(const float* const* detectors, std::size_t detectorCount, float* gains,
                                      std::size_t count, const Law* law) noexcept {
    if (law != nullptr)
        Run<true>(detectors, detectorCount, gains, count, law);
    else
        Run<false>(detectors, detectorCount, gains, count, &m_law);
    if (count > 0) m_reductionDb.store(zen::LogUnitsToDb(m_reduction), std::memory_order_relaxed);
}

void SoftKneeCompressor::ComputeGains(const float* const* detectors, std::size_t detectorCount, float* gains,
                                      std::size_t count, const Law& law) noexcept {
    Run<false>(detectors, detectorCount, gains, count, &law);
    if (count > 0) m_reductionDb.store(zen::LogUnitsToDb(m_reduction), std::memory_order_relaxed);
}

bool SoftKneeCompressor::Process(float* const* channels, std::uint64_t count) {
    const std::size_t channelCount = GetChannelCount();
    if (channelCount == 0 || count == 0) return true;
    if (m_gains.empty() || channelCount > kMaxChannels) return false;
    for (std::uint64_t done = 0; done < count; done += m_gains.size()) {
        const auto n = static_cast<std::size_t>(std::min<std::uint64_t>(m_gains.size(), count - done));
        const float* detectors[kMaxChannels];
        for (std::size_t c = 0; c < channelCount; ++c) detectors[c] = channels[c] + done;
        ComputeGains(detectors, channelCount, m_gains.data(), n);
        for (std::size_t c = 0; c < channelCount; ++c)
            for (std::size_t i = 0; i < n; ++i) channels[c][done + i] *= m_gains[i];
    }
    return true;
}

float SoftKneeCompressor::GetMeter(std::uint64_t index) const {
    return index == kGainReductionMeter ? m_reductionDb.load(std::memory_order_relaxed) : 0.0f;
}
