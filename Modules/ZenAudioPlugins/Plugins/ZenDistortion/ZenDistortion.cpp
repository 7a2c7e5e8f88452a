#include "ZenDistortion.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenDistortion::kDescriptor = {
    "Distortion", 1.0, zen::kPluginStateOffered, zen::MakePluginCode('Z', 'e', 'n', 's'),
    8, 8, "ZenDistortion", 0, 0, -1, nullptr};

namespace {

constexpr double kTwoPi = 6.283185307179586;
// The tail ends when the DC blocker's memory has fallen by 100 dB.
constexpr double kTailNepers = 11.5;

}  // namespace

ZenDistortion::ZenDistortion() : m_oversampler(kOversampling, Waveshaper::kDelayHalfSamples) {
    InitParameters(Definitions());
    InitMeters(Meters());
}

float ZenDistortion::TiltGain(float db) { return std::pow(10.0f, db / 40.0f); }

double ZenDistortion::DcPole(double sampleRate) { return std::exp(-kTwoPi * kDcBlockHz / sampleRate); }

double ZenDistortion::ToneCoefficient(double sampleRate) { return 1.0 - std::exp(-kTwoPi * kTonePivotHz / sampleRate); }

const zen::ParameterTableDefinition& ZenDistortion::Definitions() {
    using namespace zen;
    static const ParameterTableDefinition table = MakeParameterTable(
        "ZenDistortion",
        {
            ContinuousParameter("DRIVE", QT_TRANSLATE_NOOP("ZenDistortion", "Drive"), 0.0f, 36.0f, 12.0f, 0.1f, "dB")
                .Smoothed(working::DbToGain),
            ListParameter("CURVE", QT_TRANSLATE_NOOP("ZenDistortion", "Curve"),
                          {QT_TRANSLATE_NOOP("ZenDistortion", "Tape"), QT_TRANSLATE_NOOP("ZenDistortion", "Tube"),
                           QT_TRANSLATE_NOOP("ZenDistortion", "Hard"), QT_TRANSLATE_NOOP("ZenDistortion", "Fold-back")},
                          static_cast<float>(Waveshaper::kTube)),
            ContinuousParameter("CEILING", QT_TRANSLATE_NOOP("ZenDistortion", "Ceiling"), -kCeilingRangeDb, 0.0f, 0.0f,
                                0.1f, "dB")
                .Smoothed(working::DbToGain),
            ContinuousParameter("TONE", QT_TRANSLATE_NOOP("ZenDistortion", "Tone"), -12.0f, 12.0f, 0.0f, 0.1f, "dB")
                .Smoothed(TiltGain),
            ContinuousParameter("MIX", QT_TRANSLATE_NOOP("ZenDistortion", "Mix"), 0.0f, 100.0f, 100.0f, 0.1f, "%")
                .Smoothed(working::PercentToFraction),
            ContinuousParameter("OUTPUT_LEVEL", QT_TRANSLATE_NOOP("ZenDistortion", "Output Level"), -kCeilingRangeDb,
                                kCeilingRangeDb, 0.0f, 0.1f, "dB")
                .Smoothed(working::DbToGain),
        },
        zen::HostScale::PerMille);  // template integers are places along the controls
    return table;
}

const zen::MeterTableDefinition& ZenDistortion::Meters() {
    using namespace zen;
    static const MeterTableDefinition table = MakeMeterTable(
        "ZenDistortion",
        {
            LevelMeter("SATURATION", QT_TRANSLATE_NOOP("ZenDistortion", "Saturation"), "dB", -60.0f, 60.0f),
            LevelMeter("INPUT_PEAK", QT_TRANSLATE_NOOP("ZenDistortion", "Input Peak"), "dBFS", -60.0f, 6.0f)
                .PerChannel(),
            LevelMeter("OUTPUT_PEAK", QT_TRANSLATE_NOOP("ZenDistortion", "Output Peak"), "dBFS", -60.0f, 6.0f)
                .PerChannel(),
        });
    return table;
}

std::uint32_t ZenDistortion::GetTailLength() const {
    const double dcDecay = kTailNepers / (kTwoPi * kDcBlockHz) * GetSampleRate();
    return static_cast<std::uint32_t>(m_oversampler.GetLatency() + 1 + std::ceil(dcDecay));
}

bool ZenDistortion::ApplyNeutralSetting() {
    ZenAudioPluginImpl::ApplyNeutralSetting();
    return SetParameter(kMix, 0.0f);
}

void ZenDistortion::UpdateProcessingParameter(std::uint32_t index, float value) {
    if (index == kCurve) m_shaper.SetParameter(Waveshaper::kCurve, value);
}

void ZenDistortion::PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) {
    const std::uint32_t channels = GetProcessChannelCount();
    m_oversampler.SetChannelCount(channels);
    m_oversampler.Prepare(sampleRate, maxBlockSize);
    m_shaper.SetChannelCount(channels);
    m_shaper.Prepare(sampleRate, maxBlockSize);
    m_dryDelay.Dimension(channels, maxBlockSize, m_oversampler.GetLatency());
    m_filters.assign(channels, Filters{});
    m_dry.assign(maxBlockSize, 0.0f);
    m_pre.assign(static_cast<std::size_t>(maxBlockSize) * kOversampling, 0.0f);
    m_post.assign(m_pre.size(), 0.0f);
    m_dcPole = DcPole(sampleRate);
    m_toneCoefficient = ToneCoefficient(sampleRate);
    SetLatency(m_oversampler.GetLatency());
    ResetProcessing();
}

void ZenDistortion::ResetProcessing() {
    m_oversampler.Reset();
    m_shaper.Reset();
    m_dryDelay.Reset();
    std::fill(m_filters.begin(), m_filters.end(), Filters{});
}

void ZenDistortion::ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    float saturation = 0.0f;
    for (std::uint32_t c = 0; c < channelCount; ++c) {
        float* x = channels[c];
        float inputPeak = 0.0f;
        for (std::uint32_t i = 0; i < frames; ++i) {
            float v = x[i];
            // NaN becomes silence and Inf the limit, so no filter keeps them.
            if (!(std::fabs(v) <= kInputLimit)) v = std::isnan(v) ? 0.0f : std::copysign(kInputLimit, v);
            inputPeak = std::max(inputPeak, std::fabs(v));
            x[i] = v;
            m_dry[i] = v;
        }

        auto drive = Smoothed(kDrive).Track(c);
        auto ceiling = Smoothed(kCeiling).Track(c);
        for (std::uint32_t i = 0; i < frames; ++i) {
            const double top = ceiling.Next();
            const auto pre = static_cast<float>(drive.Next() / top);
            for (std::size_t p = 0; p < kOversampling; ++p) {
                m_pre[i * kOversampling + p] = pre;
                m_post[i * kOversampling + p] = static_cast<float>(top);
            }
        }
        float* high = m_oversampler.Up(c, x, frames);
        saturation = std::max(saturation, m_shaper.Shape(c, high, m_pre.data(), m_post.data(), frames * kOversampling));
        m_oversampler.Down(c, x, frames);

        auto tone = Smoothed(kTone).Track(c);
        auto mix = Smoothed(kMix).Track(c);
        auto level = Smoothed(kOutputLevel).Track(c);
        Filters& f = m_filters[c];
        float outputPeak = 0.0f;
        for (std::uint32_t i = 0; i < frames; ++i) {
            const double wet = x[i];
            const double centred = wet - f.dcIn + m_dcPole * f.dcOut;
            f.dcIn = wet;
            f.dcOut = (centred + 1e-18) - 1e-18;
            f.low += m_toneCoefficient * (centred - f.low);
            f.low = (f.low + 1e-18) - 1e-18;
            const double treble = tone.Next();
            const double tilted = f.low / treble + (centred - f.low) * treble;
            const double m = mix.Next();
            const double dry = m_dryDelay.ReadWrite(c, m_dry[i]);
            const auto y = static_cast<float>(level.Next() * (m * tilted + (1.0 - m) * dry));
            x[i] = y;
            outputPeak = std::max(outputPeak, std::fabs(y));
        }
        PublishMeter(kInputPeak, c, inputPeak);
        PublishMeter(kOutputPeak, c, outputPeak);
    }
    PublishMeter(kSaturation, saturation);
}

template class ZenAudioPlugin<ZenDistortion>;
