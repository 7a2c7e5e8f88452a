// "Noise Reduction": a spectral noise reducer for 1 to 8 channels. The noise
// is estimated as it goes ("Adaptive") or taken from a profile learnt while
// "Learn" is on ("Learned"); an MMSE log-spectral-amplitude gain removes it
// down to "Reduction" below the input, with "Smoothing" against musical
// noise. "Listen to Removed Noise" plays what is taken away. Latency: the
// STFT frame less one sample (1023 at 44.1 and 48 kHz).
//
// The learnt profile is part of the state ("noiseProfile", the profile's
// text; a state without the field keeps the profile held). Profiles cross
// between the audio thread, which learns, and SaveState/LoadState through
// two lock-free exchanges, so saving never waits on processing.
#pragma once

#include <mutex>
#include <string>

#include "Common/NoiseReduction/zn_denoise_settings.h"
#include "Common/NoiseReduction/zn_denoiser.h"
#include "Common/NoiseReduction/zn_profile_exchange.h"
#include "Common/ZenAudioPluginImpl.h"

class ZenNoiseReduction : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    enum Parameter : std::uint32_t { kReduction, kSensitivity, kEstimate, kSmoothing, kListen, kLearn };
    // Reduction per channel (dB, <= 0), the noise estimate and the gain per
    // point of the spectra (kSpectrumPoints from 0 Hz to half the rate, dB),
    // and whether a learnt profile is held (0 or 1).
    enum Meter : std::uint32_t { kReductionMeter, kNoiseSpectrum, kGainSpectrum, kProfileMeter };

    static constexpr std::uint32_t kSpectrumPoints = 513;
    static constexpr float kSpectrumFloorDb = -150.0f;
    static constexpr const char* kProfileField = "noiseProfile";

    ZenNoiseReduction();

    static const zen::ParameterTableDefinition& Definitions();
    static const zen::MeterTableDefinition& Meters();

    // "Reduction" 0 dB: every gain is 1.
    bool ApplyNeutralSetting() override;
    // The last frame's gains spread over the frame: as long as the latency.
    std::uint32_t GetTailLength() const override { return GetLatency(); }

protected:
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    void PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;
    void SaveStateFields(QJsonObject& root) const override;
    bool LoadStateFields(const QJsonObject& root) override;

private:
    void PublishSpectra() noexcept;

    zen::noise_reduction::zn_denoiser m_denoiser;
    zen::noise_reduction::zn_denoise_settings m_settings;
    float m_points[kSpectrumPoints] = {};

    // Learnt profiles go to the UI side, loaded ones to the audio thread.
    mutable zen::noise_reduction::zn_profile_exchange m_toUi;
    zen::noise_reduction::zn_profile_exchange m_toAudio;
    mutable std::mutex m_stateMutex;  // the UI side only: never taken by the audio thread
    mutable std::string m_profileText;
};
