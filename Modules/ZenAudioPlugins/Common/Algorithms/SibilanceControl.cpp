#include "SibilanceControl.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>
#include <limits>

#include "../Decibels.h"

namespace {

// Both trackers rest here after preparation: quieter signals are left alone.
constexpr float kPreparedFloorDb = -50.0f;
// Per-sample smoothing of the gain, the same at every rate.
constexpr float kGainSmoothing = 0.08f;
constexpr float kDenormalGuard = 1e-18f;
// From here up, adding and taking away the guard leaves a value as it was.
constexpr float kGuardVanishes = 1e-10f;
constexpr std::uint32_t kDefaultBlock = 1024;

}  // namespace

SibilanceControl::SibilanceControl() : ZenAudioAlgorithm(Definitions()) {
    SetChannelCount(1);
    m_band.SetParameter(BiQuad::kIn, 1.0f);
    for (std::uint64_t i = 0; i < GetParameterCount(); ++i) SetParameter(i, GetParameter(i));
    m_scratchFrames = kDefaultBlock;
    m_scratch.assign(kMaxChannels * m_scratchFrames, 0.0f);
    m_gains.assign(m_scratchFrames, 0.0f);
}

const zen::ParameterTableDefinition& SibilanceControl::Definitions() {
    static const zen::ParameterTableDefinition table = zen::MakeParameterTable(
        "SibilanceControl",
        {
            zen::ListParameter("SIDECHAIN_FILTER_MODE", QT_TRANSLATE_NOOP("SibilanceControl", "SC Mode"),
                               {QT_TRANSLATE_NOOP("SibilanceControl", "LPF"), QT_TRANSLATE_NOOP("SibilanceControl", "HPF"),
                                QT_TRANSLATE_NOOP("SibilanceControl", "LShelf"),
                                QT_TRANSLATE_NOOP("SibilanceControl", "HShelf"),
                                QT_TRANSLATE_NOOP("SibilanceControl", "Bell")},
                               4.0f),
            zen::ContinuousParameter("SIDECHAIN_FREQ", QT_TRANSLATE_NOOP("SibilanceControl", "SC Freq"), 700.0f,
                                     9000.0f, 1000.0f, 1.0f, "Hz"),
            zen::ContinuousParameter("SIDECHAIN_GAIN", QT_TRANSLATE_NOOP("SibilanceControl", "SC Gain"), -18.0f, 18.0f,
                                     0.0f, 0.1f, "dB"),
            zen::ContinuousParameter("SIDECHAIN_Q", QT_TRANSLATE_NOOP("SibilanceControl", "SC Q"), 0.1f, 2.0f, 0.3f,
                                     1.0f),
            zen::ContinuousParameter("ATTACK", QT_TRANSLATE_NOOP("SibilanceControl", "Attack"), 0.7f, 100.0f, 1.4f,
                                     1.0f, "ms"),
            zen::ContinuousParameter("HOLD", QT_TRANSLATE_NOOP("SibilanceControl", "Hold"), 0.0f, 4000.0f, 0.0f, 1.0f,
                                     "ms"),
            zen::ContinuousParameter("RELEASE", QT_TRANSLATE_NOOP("SibilanceControl", "Release"), 50.0f, 4000.0f,
                                     93.0f, 1.0f, "ms"),
            zen::ContinuousParameter("FLOOR", QT_TRANSLATE_NOOP("SibilanceControl", "Floor"), -50.0f, 0.0f, -15.0f,
                                     1.0f, "dB"),
            zen::ListParameter("REACTION_TIME", QT_TRANSLATE_NOOP("SibilanceControl", "Reaction"),
                               {QT_TRANSLATE_NOOP("SibilanceControl", "Relaxed"),
                                QT_TRANSLATE_NOOP("SibilanceControl", "Fast"),
                                QT_TRANSLATE_NOOP("SibilanceControl", "Pre-emptive")},
                               1.0f),
            zen::ContinuousParameter("LISTEN_SWITCH", QT_TRANSLATE_NOOP("SibilanceControl", "Listen"), 0.0f, 1.0f,
                                     0.0f, 0.01f),
        });
    return table;
}

bool SibilanceControl::Prepare(float sampleRate, std::uint32_t maxBlock) {
    m_band.Prepare(sampleRate, maxBlock);
    m_band.SetParameter(BiQuad::kIn, 1.0f);
    for (LevelTracker* tracker : {&m_inputLevel, &m_bandLevel}) {
        tracker->Prepare(sampleRate, maxBlock);
        tracker->SetParameter(LevelTracker::kFloor, kPreparedFloorDb);
    }
    m_scratchFrames = std::max<std::uint64_t>(maxBlock, 1);
    m_scratch.assign(kMaxChannels * m_scratchFrames, 0.0f);
    m_gains.assign(m_scratchFrames, 0.0f);
    ZenAudioAlgorithm::Prepare(sampleRate, maxBlock);
    Reset();
    return true;
}

void SibilanceControl::SetChannelCount(std::uint64_t channels) {
    ZenAudioAlgorithm::SetChannelCount(channels);
    m_band.SetChannelCount(channels);
}

bool SibilanceControl::SetParameter(std::uint64_t index, float value) {
    if (!ZenAudioAlgorithm::SetParameter(index, value)) return false;
    switch (index) {
        case kMode: m_band.SetParameter(BiQuad::kShape, value); break;
        case kFrequency: m_band.SetParameter(BiQuad::kFreq, value); break;
        case kGain:
            m_band.SetParameter(BiQuad::kGain, value);
            m_bandGain = zen::DbToGainFloored(value);  // divided by when listening
            break;
        case kQ: m_band.SetParameter(BiQuad::kQ, value); break;
        case kAttack:
            m_inputLevel.SetParameter(LevelTracker::kAttack, value);
            m_bandLevel.SetParameter(LevelTracker::kAttack, value);
            break;
        case kHold:
            m_inputLevel.SetParameter(LevelTracker::kHold, value);
            m_bandLevel.SetParameter(LevelTracker::kHold, value);
            break;
        case kRelease:
            m_inputLevel.SetParameter(LevelTracker::kRelease, value);
            m_bandLevel.SetParameter(LevelTracker::kRelease, value);
            break;
        case kFloor:
            m_inputLevel.SetParameter(LevelTracker::kFloor, value);
            m_bandLevel.SetParameter(LevelTracker::kFloor, value);
            break;
        case kListen:
            m_listen = value;
            m_dry = 1.0f - value;
            break;
        default: break;
    }
    return true;
}

void SibilanceControl::Reset() {
    m_band.Reset();
    m_inputLevel.Reset();
    m_bandLevel.Reset();
    m_gain = 0.0f;
    m_reductionDb.store(0.0f, std::memory_order_relaxed);
}

bool SibilanceControl::Process(float* const* channels, std::uint64_t count) {
    const std::uint64_t channelCount = GetChannelCount();
    if (channelCount == 0 || channelCount > kMaxChannels) return false;
    float* piece[kMaxChannels];
    for (std::uint64_t done = 0; done < count;) {
        const std::uint64_t length = std::min(count - done, m_scratchFrames);
        for (std::uint64_t c = 0; c < channelCount; ++c) piece[c] = channels[c] + done;
        ProcessPiece(piece, channelCount, length);
        done += length;
    }
    m_reductionDb.store(zen::LogUnitsToDb(m_gain), std::memory_order_relaxed);
    return true;
}

void SibilanceControl::ProcessPiece(float* const* channels, std::uint64_t channelCount, std::uint64_t count) noexcept {
    float* filtered[kMaxChannels] = {m_scratch.data(), m_scratch.data() + m_scratchFrames};
    m_band.Process(channels, filtered, count);
    // A non-finite input would stay in the band's state for good and starve
    // the band tracker; where the copy went bad, the input stands in for it.
    for (std::uint64_t c = 0; c < channelCount; ++c) {
        if (std::isfinite(filtered[c][count - 1])) continue;
        m_band.Reset();
        for (std::uint64_t n = 0; n < count; ++n)
            if (!std::isfinite(filtered[c][n])) filtered[c][n] = channels[c][n];
    }
    const float listen = m_listen / m_bandGain;
    float* gains = m_gains.data();
    float smoothed = m_gain;
    // The gain of the last value of S, kept while S stands still.
    float lastSmoothed = std::numeric_limits<float>::quiet_NaN(), gain = 0.0f;
    for (std::uint64_t n = 0; n < count; ++n) {
        // The linked peaks gathered in registers, without a branch per
        // channel; NaN never wins, as in Feed.
        float inputPeak = zen::kDetectorFloor, bandPeak = zen::kDetectorFloor;
        for (std::uint64_t c = 0; c < channelCount; ++c) {
            const float x = std::fabs(channels[c][n]), f = std::fabs(filtered[c][n]);
            inputPeak = x > inputPeak ? x : inputPeak;
            bandPeak = f > bandPeak ? f : bandPeak;
        }
        m_inputLevel.Feed(inputPeak);
        m_bandLevel.Feed(bandPeak);
        const float input = m_inputLevel.Update();
        const float band = m_bandLevel.Update();
        const float next = kGainSmoothing * (input - band) + (1.0f - kGainSmoothing) * smoothed;
        // The guard changes only values too small for it to vanish in.
        smoothed = std::fabs(next) >= kGuardVanishes ? next : (next + kDenormalGuard) - kDenormalGuard;
        if (smoothed != lastSmoothed) {
            lastSmoothed = smoothed;
            gain = zen::LogUnitsToGain(smoothed) * m_dry;
        }
        gains[n] = gain;
    }
    m_gain = smoothed;
    if (m_listen == 0.0f) {
        for (std::uint64_t c = 0; c < channelCount; ++c) m_vec.Multiply(channels[c], gains, channels[c], count);
    } else {
        for (std::uint64_t c = 0; c < channelCount; ++c)
            for (std::uint64_t n = 0; n < count; ++n)
                channels[c][n] = channels[c][n] * gains[n] + filtered[c][n] * listen;
    }
}

float SibilanceControl::GetMeter(std::uint64_t index) const {
    return index == kReductionMeter ? m_reductionDb.load(std::memory_order_relaxed) : 0.0f;
}
