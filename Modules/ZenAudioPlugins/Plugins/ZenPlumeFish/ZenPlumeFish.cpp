#include "ZenPlumeFish.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

#include "Common/Algorithms/LfeChoice.h"
#include "Common/Algorithms/SpeakerLayout.h"
#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenPlumeFish::kDescriptor = {
    "Surround Analyzer", 0.1, zen::kPluginStateOffered, zen::MakePluginCode('Z', 'n', 'P', 'f'),
    32, 32, "ZenPlumeFish", 0, 0, -1, nullptr};

namespace {

constexpr std::uint32_t kLeft = 0, kRight = 1, kCentre = 2;
// LUFS of a mean square of K-weighted samples: -0.691 + 10 log10(power).
constexpr double kLufsOffset = -0.691;

float Lufs(double lufs) { return std::max(ZenPlumeFish::kSilenceLufs, static_cast<float>(lufs)); }

}  // namespace

ZenPlumeFish::ZenPlumeFish() {
    InitParameters(Definitions());
    InitMeters(Meters());
}

const zen::ParameterTableDefinition& ZenPlumeFish::Definitions() {
    using namespace zen;
    static const ParameterTableDefinition table = MakeParameterTable(
        "ZenPlumeFish", {
                            LfeChoice::Parameter(),
                            LogarithmicParameter("TIME", QT_TRANSLATE_NOOP("ZenPlumeFish", "Time"), 10.0f, 5000.0f,
                                                 300.0f, 1.0f, "ms"),
                        });
    return table;
}

const zen::MeterTableDefinition& ZenPlumeFish::Meters() {
    using namespace zen;
    static const MeterTableDefinition table = MakeMeterTable(
        "ZenPlumeFish",
        {
            ValueMeter("LOUDNESS", QT_TRANSLATE_NOOP("ZenPlumeFish", "Loudness"), "LUFS", -59.0f, -5.0f)
                .AtRest(kSilenceLufs),
            ValueMeter("DIRECTION", QT_TRANSLATE_NOOP("ZenPlumeFish", "Direction"), "deg", -180.0f, 180.0f),
            ValueMeter("SPREAD", QT_TRANSLATE_NOOP("ZenPlumeFish", "Spread"), "deg", 0.0f, 180.0f),
            ValueMeter("CORRELATION_LR", QT_TRANSLATE_NOOP("ZenPlumeFish", "Correlation L/R"), "", -1.0f, 1.0f),
            ValueMeter("CORRELATION_LC", QT_TRANSLATE_NOOP("ZenPlumeFish", "Correlation L/C"), "", -1.0f, 1.0f),
            ValueMeter("CORRELATION_CR", QT_TRANSLATE_NOOP("ZenPlumeFish", "Correlation C/R"), "", -1.0f, 1.0f),
            LevelMeter("LEVEL", QT_TRANSLATE_NOOP("ZenPlumeFish", "Level"), "dBFS", -60.0f, 6.0f).PerChannel(),
            ValueMeter("CHANNEL_LOUDNESS", QT_TRANSLATE_NOOP("ZenPlumeFish", "Loudness"), "LUFS", -59.0f, -5.0f)
                .PerChannel()
                .AtRest(kSilenceLufs),
            ValueMeter("SHARE", QT_TRANSLATE_NOOP("ZenPlumeFish", "Share"), "%", 0.0f, 100.0f).PerChannel(),
        });
    return table;
}

void ZenPlumeFish::UpdateProcessingParameter(std::uint32_t index, float value) {
    if (index == kLfeChannel) {
        m_lfeChoice = value;
        Configure();
    } else if (index == kTime) {
        for (CorrelationMeter& pair : m_pairs) pair.SetParameter(CorrelationMeter::kTime, value);
    }
}

void ZenPlumeFish::Configure() noexcept {
    const auto channels = static_cast<std::size_t>(m_loudness.GetChannelCount());
    const int lfe = zen::LfeChoice::ApplyWeights(m_loudness, m_lfeChoice);
    m_image.Configure(channels, lfe);
    const bool centre = zen::SpeakerLayout::HasAzimuths(channels) && channels >= 3 &&
                        !zen::SpeakerLayout::IsSurround(channels, kCentre) && lfe != static_cast<int>(kCentre);
    const bool stereo = channels >= 2 && lfe != static_cast<int>(kLeft) && lfe != static_cast<int>(kRight);
    m_hasPair[kLeftRight] = stereo;
    m_hasPair[kLeftCentre] = m_hasPair[kCentreRight] = stereo && centre;
}

void ZenPlumeFish::PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) {
    m_loudness.SetChannelCount(GetProcessChannelCount());
    m_loudness.Prepare(sampleRate, maxBlockSize);
    m_loudness.SetTruePeakEnabled(false);
    const std::uint32_t pairs[kPairs][2] = {{kLeft, kRight}, {kLeft, kCentre}, {kCentre, kRight}};
    for (std::uint32_t p = 0; p < kPairs; ++p) {
        m_pairChannels[p][0] = pairs[p][0];
        m_pairChannels[p][1] = pairs[p][1];
        m_pairs[p].SetChannelCount(2);
        m_pairs[p].Prepare(sampleRate, maxBlockSize);
    }
    Configure();
    SetLatency(0);
}

void ZenPlumeFish::ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    m_loudness.Process(channels, frames);
    for (std::uint32_t p = 0; p < kPairs; ++p) {
        float correlation = 0.0f;
        if (m_hasPair[p]) {
            float* pair[2] = {channels[m_pairChannels[p][0]], channels[m_pairChannels[p][1]]};
            m_pairs[p].Process(pair, frames);
            correlation = static_cast<float>(m_pairs[p].Current().correlation);
        }
        PublishMeter(kCorrelationLeftRight + p, correlation);
    }

    double weighted = 0.0;
    for (std::uint32_t c = 0; c < channelCount; ++c) {
        m_powers[c] = std::pow(10.0, (m_loudness.ChannelMomentary(c) - kLufsOffset) / 10.0);
        weighted += m_loudness.GetChannelWeight(c) * m_powers[c];
    }
    for (std::uint32_t c = 0; c < channelCount; ++c) {
        const double share = weighted > 0.0 ? 100.0 * m_loudness.GetChannelWeight(c) * m_powers[c] / weighted : 0.0;
        PublishMeter(kLevel, c, static_cast<float>(m_loudness.Rms(c)));
        PublishMeter(kChannelLoudness, c, Lufs(m_loudness.ChannelMomentary(c)));
        PublishMeter(kShare, c, static_cast<float>(share));
    }
    PublishMeter(kLoudness, Lufs(m_loudness.Momentary()));
    const zen::SurroundImage::Image image = m_image.Compute(m_powers);
    PublishMeter(kDirection, image.valid ? static_cast<float>(image.direction) : 0.0f);
    PublishMeter(kSpread, image.valid ? static_cast<float>(image.spread) : 0.0f);
}

void ZenPlumeFish::ResetProcessing() {
    m_loudness.Reset();
    for (CorrelationMeter& pair : m_pairs) pair.Reset();
}

template class ZenAudioPlugin<ZenPlumeFish>;
