#include "ZenNoiseReduction.h"

#include <QCoreApplication>
#include <QJsonValue>
#include <algorithm>
#include <cmath>
#include <new>

#include "Common/NoiseReduction/zn_spectrum_points.h"
#include "Common/ZenAudioPlugin.h"

namespace nr = zen::noise_reduction;

const zen::PluginDescriptor ZenNoiseReduction::kDescriptor = {
    "Noise Reduction", 0.3, zen::kPluginStateOffered, zen::MakePluginCode('Z', 'n', 'N', 'r'),
    8, 8, "ZenNoiseReduction", 0, 0, -1, nullptr};

namespace {

// The sensitivity scales the noise the suppression gain sees, around the
// denoiser's own tuned factor at 0 dB.
const float kBaseOverSubtraction = nr::zn_denoise_settings{}.overSubtraction;

constexpr float kReductionMeterFloorDb = -40.0f;
constexpr float kGainFloorDb = -60.0f;

}  // namespace

ZenNoiseReduction::ZenNoiseReduction() {
    InitParameters(Definitions());
    InitMeters(Meters());
}

const zen::ParameterTableDefinition& ZenNoiseReduction::Definitions() {
    using namespace zen;
    static const ParameterTableDefinition table = MakeParameterTable(
        "ZenNoiseReduction",
        {
            ContinuousParameter("REDUCTION", QT_TRANSLATE_NOOP("ZenNoiseReduction", "Reduction"), 0.0f, 40.0f, 20.0f,
                                0.1f, "dB"),
            ContinuousParameter("SENSITIVITY", QT_TRANSLATE_NOOP("ZenNoiseReduction", "Sensitivity"), -10.0f, 10.0f,
                                0.0f, 0.1f, "dB"),
            ListParameter("ESTIMATE", QT_TRANSLATE_NOOP("ZenNoiseReduction", "Estimate"),
                          {QT_TRANSLATE_NOOP("ZenNoiseReduction", "Adaptive"),
                           QT_TRANSLATE_NOOP("ZenNoiseReduction", "Learned")},
                          0.0f),
            ContinuousParameter("SMOOTHING", QT_TRANSLATE_NOOP("ZenNoiseReduction", "Smoothing"), 0.0f, 100.0f, 50.0f,
                                1.0f, "%"),
            SwitchParameter("LISTEN", QT_TRANSLATE_NOOP("ZenNoiseReduction", "Listen to Removed Noise"), 0.0f),
            SwitchParameter("LEARN", QT_TRANSLATE_NOOP("ZenNoiseReduction", "Learn"), 0.0f),
        });
    return table;
}

const zen::MeterTableDefinition& ZenNoiseReduction::Meters() {
    using namespace zen;
    static const MeterTableDefinition table = MakeMeterTable(
        "ZenNoiseReduction",
        {
            ValueMeter("REDUCTION", QT_TRANSLATE_NOOP("ZenNoiseReduction", "Reduction"), "dB", kReductionMeterFloorDb,
                       0.0f)
                .PerChannel(),
            ArrayMeter("NOISE_SPECTRUM", QT_TRANSLATE_NOOP("ZenNoiseReduction", "Noise Spectrum"), "dB",
                       kSpectrumFloorDb, 0.0f, kSpectrumPoints)
                .AtRest(kSpectrumFloorDb),
            ArrayMeter("GAIN_SPECTRUM", QT_TRANSLATE_NOOP("ZenNoiseReduction", "Gain Spectrum"), "dB", kGainFloorDb,
                       0.0f, kSpectrumPoints),
            ValueMeter("PROFILE", QT_TRANSLATE_NOOP("ZenNoiseReduction", "Profile Learnt"), "", 0.0f, 1.0f),
        });
    return table;
}

void ZenNoiseReduction::UpdateProcessingParameter(std::uint32_t index, float value) {
    nr::zn_denoise_settings& s = m_settings;
    switch (index) {
        case kReduction: s.floor = std::pow(10.0f, -value / 20.0f); break;
        case kSensitivity: s.overSubtraction = kBaseOverSubtraction * std::pow(10.0f, value / 10.0f); break;
        case kEstimate:
            s.estimate = value >= 0.5f ? nr::zn_denoise_settings::Estimate::Learned
                                       : nr::zn_denoise_settings::Estimate::Adaptive;
            break;
        case kSmoothing: s.smoothing = value / 100.0f; break;
        case kListen: s.listenToRemoved = value >= 0.5f; break;
        case kLearn: s.learning = value >= 0.5f; break;
        default: return;
    }
    nr::zn_noise_profile& profile = m_denoiser.Frame().Profile();
    const bool wasLearning = profile.IsLearning();
    m_denoiser.Configure(s);
    if (wasLearning && !profile.IsLearning() && profile.FramesLearnt() > 0) m_toUi.PublishCopy(profile.Learnt());
}

void ZenNoiseReduction::PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) {
    const std::uint32_t channels = GetProcessChannelCount();
    m_denoiser.SetChannelCount(channels);
    if (!m_denoiser.Prepare(sampleRate, maxBlockSize)) throw std::bad_alloc();
    m_denoiser.Configure(m_settings);
    m_toUi.Reserve(static_cast<std::size_t>(channels) * m_denoiser.Stft().Bins());
    SetLatency(m_denoiser.Latency());
}

void ZenNoiseReduction::ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    nr::zn_noise_profile& profile = m_denoiser.Frame().Profile();
    if (m_toAudio.Take()) profile.Adopt(m_toAudio.Front());
    m_denoiser.Process(channels, frames);
    for (std::uint32_t c = 0; c < channelCount; ++c)
        PublishMeter(kReductionMeter, c, m_denoiser.Frame().ReductionDb(c));
    PublishSpectra();
    PublishMeter(kProfileMeter, profile.HasProfile() ? 1.0f : 0.0f);
}

void ZenNoiseReduction::PublishSpectra() noexcept {
    const nr::zn_denoise_frame& frame = m_denoiser.Frame();
    nr::zn_spectrum_points_db(frame.NoiseSpectrum(), frame.Bins(), m_points, kSpectrumPoints, 10.0f, kSpectrumFloorDb);
    PublishArray(kNoiseSpectrum, 0, m_points);
    nr::zn_spectrum_points_db(frame.GainSpectrum(), frame.Bins(), m_points, kSpectrumPoints, 20.0f, kGainFloorDb);
    PublishArray(kGainSpectrum, 0, m_points);
}

void ZenNoiseReduction::ResetProcessing() { m_denoiser.Reset(); }

bool ZenNoiseReduction::ApplyNeutralSetting() {
    ZenAudioPluginImpl::ApplyNeutralSetting();
    return SetParameter(kReduction, 0.0f);
}

void ZenNoiseReduction::SaveStateFields(QJsonObject& root) const {
    const std::lock_guard<std::mutex> lock(m_stateMutex);
    if (m_toUi.Take()) m_profileText = nr::zn_noise_profile::Format(m_toUi.Front());
    root.insert(QString::fromLatin1(kProfileField), QString::fromStdString(m_profileText));
}

bool ZenNoiseReduction::LoadStateFields(const QJsonObject& root) {
    const QJsonValue field = root.value(QString::fromLatin1(kProfileField));
    if (field.isUndefined()) return true;  // presets leave the profile alone
    if (!field.isString()) return false;
    const std::string text = field.toString().toStdString();
    const std::lock_guard<std::mutex> lock(m_stateMutex);
    nr::zn_noise_profile::Snapshot& back = m_toAudio.Back();
    if (!nr::zn_noise_profile::Parse(text, back)) return false;
    m_toAudio.Publish();
    m_toUi.Take();  // a profile learnt before this state is replaced by it
    m_profileText = text;
    return true;
}

template class ZenAudioPlugin<ZenNoiseReduction>;
