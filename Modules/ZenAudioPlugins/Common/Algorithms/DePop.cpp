#include "DePop.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

namespace {

// A Butterworth low-pass: flat below the corner, so a pop's full weight
// reaches the detector, and 12 dB per octave above it, so the voice's
// fundamental and formants barely do.
constexpr float kDetectorQ = 0.707f;
constexpr std::uint32_t kDefaultBlock = 1024;

}  // namespace

DePop::DePop() : ZenAudioAlgorithm(Definitions()) {
    SetUpDetector();
    SetChannelCount(1);
    for (std::uint64_t i = 0; i < GetParameterCount(); ++i) SetParameter(i, GetParameter(i));
    m_scratchFrames = kDefaultBlock;
    m_scratch.assign(kMaxChannels * m_scratchFrames, 0.0f);
}

const zen::ParameterTableDefinition& DePop::Definitions() {
    static const zen::ParameterTableDefinition table = zen::MakeParameterTable(
        "DePop",
        {
            zen::ContinuousParameter("THRES", QT_TRANSLATE_NOOP("DePop", "Threshold"), -50.0f, 0.0f, -24.0f, 0.1f,
                                     "dB"),
            zen::ContinuousParameter("RATIO", QT_TRANSLATE_NOOP("DePop", "Ratio"), 1.2f, 20.0f, 6.0f, 0.1f),
            zen::LogarithmicParameter("FREQUENCY", QT_TRANSLATE_NOOP("DePop", "Frequency"), 40.0f, 400.0f, 120.0f,
                                      1.0f, "Hz"),
            zen::ContinuousParameter("ATTACK", QT_TRANSLATE_NOOP("DePop", "Attack"), 0.1f, 20.0f, 0.2f, 0.1f, "ms"),
            zen::ContinuousParameter("RELEASE", QT_TRANSLATE_NOOP("DePop", "Release"), 20.0f, 500.0f, 40.0f, 1.0f,
                                     "ms"),
        });
    return table;
}

void DePop::SetUpDetector() {
    m_filter.SetParameter(BiQuad::kShape, static_cast<float>(BiQuad::kLowPass));
    m_filter.SetParameter(BiQuad::kQ, kDetectorQ);
    m_filter.SetParameter(BiQuad::kIn, 1.0f);
    m_compressor.SetParameter(Compressor::kSidechainOn, 1.0f);
}

bool DePop::Prepare(float sampleRate, std::uint32_t maxBlock) {
    m_filter.Prepare(sampleRate, maxBlock);
    m_compressor.Prepare(sampleRate, maxBlock);
    SetUpDetector();
    m_scratchFrames = std::max<std::uint64_t>(maxBlock, 1);
    m_scratch.assign(kMaxChannels * m_scratchFrames, 0.0f);
    ZenAudioAlgorithm::Prepare(sampleRate, maxBlock);
    Reset();
    return true;
}

void DePop::SetChannelCount(std::uint64_t channels) {
    ZenAudioAlgorithm::SetChannelCount(channels);
    m_filter.SetChannelCount(channels);
    m_compressor.SetChannelCount(channels);
    m_compressor.SetSidechainChannelCount(channels);
}

bool DePop::SetParameter(std::uint64_t index, float value) {
    if (!ZenAudioAlgorithm::SetParameter(index, value)) return false;
    switch (index) {
        case kThreshold: m_compressor.SetParameter(Compressor::kThreshold, value); break;
        case kRatio: m_compressor.SetParameter(Compressor::kRatio, value); break;
        case kFrequency: m_filter.SetParameter(BiQuad::kFreq, value); break;
        case kAttack: m_compressor.SetParameter(Compressor::kAttack, value); break;
        case kRelease: m_compressor.SetParameter(Compressor::kRelease, value); break;
        default: break;
    }
    return true;
}

void DePop::Reset() {
    m_filter.Reset();
    m_compressor.Reset();
}

bool DePop::Process(float* const* channels, std::uint64_t count) {
    const std::uint64_t channelCount = GetChannelCount();
    if (channelCount == 0) return true;
    if (channelCount > kMaxChannels) return false;
    // The compressor sees the unfiltered channels first, then the filtered copies.
    float* lanes[2 * kMaxChannels];
    for (std::uint64_t done = 0; done < count;) {
        const std::uint64_t length = std::min(count - done, m_scratchFrames);
        for (std::uint64_t c = 0; c < channelCount; ++c) {
            lanes[c] = channels[c] + done;
            lanes[channelCount + c] = m_scratch.data() + c * m_scratchFrames;
        }
        m_filter.Process(lanes, lanes + channelCount, length);
        // A non-finite input would stay in the filter's state for good.
        for (std::uint64_t c = 0; c < channelCount; ++c)
            if (!std::isfinite(lanes[channelCount + c][length - 1])) m_filter.Reset();
        if (!m_compressor.Process(lanes, length)) return false;
        done += length;
    }
    return true;
}

float DePop::GetMeter(std::uint64_t index) const {
    return index == kGainReductionMeter ? m_compressor.GetMeter(Compressor::kGainReductionMeter) : 0.0f;
}
