#include "ZenVoiceIsolationControl.h"

#include <QCoreApplication>
#include <cmath>
#include <new>

#include "Common/NoiseReduction/zn_spectrum_points.h"
#include "Common/ZenAudioPlugin.h"

namespace nr = zen::noise_reduction;

const zen::PluginDescriptor ZenVoiceIsolationControl::kDescriptor = {
    "Voice Isolation", 1.0, zen::kPluginStateOffered, zen::MakePluginCode('Z', 'n', 'V', 'I'),
    2, 2, "ZenVoiceIsolationControl", 0, 28, -1, nullptr};

namespace {

constexpr float kReductionMeterFloorDb = -60.0f;
constexpr float kGainFloorDb = -60.0f;

}  // namespace

ZenVoiceIsolationControl::ZenVoiceIsolationControl() {
    InitParameters(Definitions());
    InitMeters(Meters());
    m_settings.voiceGuided = true;
    m_settings.overSubtraction = kOverSubtraction;
}

const zen::ParameterTableDefinition& ZenVoiceIsolationControl::Definitions() {
    using namespace zen;
    static const ParameterTableDefinition table = MakeParameterTable(
        "ZenVoiceIsolationControl",
        {
            ContinuousParameter("AMOUNT", QT_TRANSLATE_NOOP("ZenVoiceIsolationControl", "Amount"), 0.0f, 100.0f,
                                100.0f, 1.0f, "%"),
            ContinuousParameter("BACKGROUND", QT_TRANSLATE_NOOP("ZenVoiceIsolationControl", "Background"), -60.0f,
                                0.0f, -30.0f, 0.1f, "dB"),
        });
    return table;
}

const zen::MeterTableDefinition& ZenVoiceIsolationControl::Meters() {
    using namespace zen;
    static const MeterTableDefinition table = MakeMeterTable(
        "ZenVoiceIsolationControl",
        {
            ValueMeter("REDUCTION", QT_TRANSLATE_NOOP("ZenVoiceIsolationControl", "Reduction"), "dB",
                       kReductionMeterFloorDb, 0.0f)
                .PerChannel(),
            ValueMeter("VOICE", QT_TRANSLATE_NOOP("ZenVoiceIsolationControl", "Voice"), "%", 0.0f, 100.0f),
            ArrayMeter("NOISE_SPECTRUM", QT_TRANSLATE_NOOP("ZenVoiceIsolationControl", "Noise Spectrum"), "dB",
                       kSpectrumFloorDb, 0.0f, kSpectrumPoints)
                .AtRest(kSpectrumFloorDb),
            ArrayMeter("GAIN_SPECTRUM", QT_TRANSLATE_NOOP("ZenVoiceIsolationControl", "Gain Spectrum"), "dB",
                       kGainFloorDb, 0.0f, kSpectrumPoints),
        });
    return table;
}

bool ZenVoiceIsolationControl::ApplyNeutralSetting() {
    ZenAudioPluginImpl::ApplyNeutralSetting();
    return SetParameter(kAmount, 0.0f);
}

void ZenVoiceIsolationControl::UpdateProcessingParameter(std::uint32_t index, float value) {
    switch (index) {
        case kAmount: m_settings.amount = value / 100.0f; break;
        case kBackground:
            m_settings.floor = std::pow(10.0f, value / 20.0f);
            m_settings.speechFloor = std::pow(10.0f, kSpeechFloorShare * value / 20.0f);
            break;
        default: return;
    }
    m_denoiser.Configure(m_settings);
}

void ZenVoiceIsolationControl::PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) {
    m_denoiser.SetChannelCount(GetProcessChannelCount());
    if (!m_denoiser.Prepare(sampleRate, maxBlockSize)) throw std::bad_alloc();
    m_denoiser.Configure(m_settings);
    SetLatency(m_denoiser.Latency());
}

void ZenVoiceIsolationControl::ProcessBlock(float* const* channels, std::uint32_t channelCount,
                                            std::uint32_t frames) noexcept {
    m_denoiser.Process(channels, frames);
    const nr::zn_denoise_frame& frame = m_denoiser.Frame();
    for (std::uint32_t c = 0; c < channelCount; ++c) PublishMeter(kReductionMeter, c, frame.ReductionDb(c));
    PublishMeter(kVoiceMeter, 100.0f * frame.ConfirmedVoice());
    nr::zn_spectrum_points_db(frame.NoiseSpectrum(), frame.Bins(), m_points, kSpectrumPoints, 10.0f, kSpectrumFloorDb);
    PublishArray(kNoiseSpectrum, 0, m_points);
    nr::zn_spectrum_points_db(frame.GainSpectrum(), frame.Bins(), m_points, kSpectrumPoints, 20.0f, kGainFloorDb);
    PublishArray(kGainSpectrum, 0, m_points);
}

void ZenVoiceIsolationControl::ResetProcessing() { m_denoiser.Reset(); }

template class ZenAudioPlugin<ZenVoiceIsolationControl>;
