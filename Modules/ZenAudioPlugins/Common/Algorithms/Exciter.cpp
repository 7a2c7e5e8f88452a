#include "Exciter.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

#include "../Decibels.h"

namespace {

constexpr float kOn = 1.0f;
constexpr float kButterworthQ = 0.70710678f;
constexpr std::uint32_t kDefaultBlock = 1024;

}  // namespace

Exciter::Exciter() : ZenAudioAlgorithm(Definitions()) {
    for (BiQuad* filter : {&m_band, &m_post}) {
        filter->SetParameter(BiQuad::kShape, BiQuad::kHighPass);
        filter->SetParameter(BiQuad::kQ, kButterworthQ);
        filter->SetParameter(BiQuad::kIn, kOn);
    }
    SetChannelCount(1);
    for (std::uint64_t i = 0; i < GetParameterCount(); ++i) SetParameter(i, GetParameter(i));
    m_scratchFrames = kDefaultBlock;
    m_scratch.assign(kMaxChannels * m_scratchFrames, 0.0f);
}

const zen::ParameterTableDefinition& Exciter::Definitions() {
    static const zen::ParameterTableDefinition table = zen::MakeParameterTable(
        "Exciter",
        {
            zen::LogarithmicParameter("FREQUENCY", QT_TRANSLATE_NOOP("Exciter", "Frequency"), 1000.0f, 10000.0f,
                                      3000.0f, 1.0f, "Hz"),
            zen::ContinuousParameter("DRIVE", QT_TRANSLATE_NOOP("Exciter", "Drive"), 0.0f, 24.0f, 12.0f, 0.1f, "dB"),
            zen::ContinuousParameter("EVEN", QT_TRANSLATE_NOOP("Exciter", "Even"), 0.0f, 100.0f, 50.0f, 0.1f, "%"),
            zen::ContinuousParameter("MIX", QT_TRANSLATE_NOOP("Exciter", "Mix"), 0.0f, 100.0f, 20.0f, 0.1f, "%"),
        });
    return table;
}

bool Exciter::Prepare(float sampleRate, std::uint32_t maxBlock) {
    m_band.Prepare(sampleRate, maxBlock);
    m_post.Prepare(sampleRate, maxBlock);
    m_scratchFrames = std::max<std::uint64_t>(maxBlock, 1);
    m_scratch.assign(kMaxChannels * m_scratchFrames, 0.0f);
    ZenAudioAlgorithm::Prepare(sampleRate, maxBlock);
    Reset();
    return true;
}

void Exciter::SetChannelCount(std::uint64_t channels) {
    ZenAudioAlgorithm::SetChannelCount(channels);
    m_band.SetChannelCount(channels);
    m_post.SetChannelCount(channels);
}

bool Exciter::SetParameter(std::uint64_t index, float value) {
    if (!ZenAudioAlgorithm::SetParameter(index, value)) return false;
    switch (index) {
        case kFrequency:
            m_band.SetParameter(BiQuad::kFreq, value);
            m_post.SetParameter(BiQuad::kFreq, value);
            break;
        case kDrive: m_drive = zen::DbToGain(value); break;
        case kEven: m_bias = kMaxBias * std::clamp(value, 0.0f, 100.0f) / 100.0f; break;
        case kMix: m_mix = std::clamp(value, 0.0f, 100.0f) / 100.0f; break;
        default: break;
    }
    return true;
}

void Exciter::Reset() {
    m_band.Reset();
    m_post.Reset();
}

bool Exciter::Process(float* const* channels, std::uint64_t count) {
    const std::uint64_t channelCount = GetChannelCount();
    if (channelCount == 0) return true;
    if (channelCount > kMaxChannels) return false;
    float* pieces[kMaxChannels] = {};
    for (std::uint64_t done = 0; done < count;) {
        const std::uint64_t length = std::min(count - done, m_scratchFrames);
        for (std::uint64_t c = 0; c < channelCount; ++c) pieces[c] = channels[c] + done;
        ProcessPiece(pieces, channelCount, length);
        done += length;
    }
    return true;
}

void Exciter::ProcessPiece(float* const* channels, std::uint64_t channelCount, std::uint64_t count) noexcept {
    float* band[kMaxChannels] = {};
    for (std::uint64_t c = 0; c < channelCount; ++c) band[c] = m_scratch.data() + c * m_scratchFrames;
    m_band.Process(channels, band, count);
    const float drive = m_drive, bias = m_bias, offset = Saturate(m_bias), back = 1.0f / m_drive;
    for (std::uint64_t c = 0; c < channelCount; ++c)
        for (std::uint64_t i = 0; i < count; ++i) band[c][i] = (Saturate(drive * band[c][i] + bias) - offset) * back;
    m_post.Process(band, band, count);
    const float mix = m_mix;
    for (std::uint64_t c = 0; c < channelCount; ++c) {
        float* x = channels[c];
        const float* h = band[c];
        for (std::uint64_t i = 0; i < count; ++i) x[i] += mix * h[i];
    }
}
