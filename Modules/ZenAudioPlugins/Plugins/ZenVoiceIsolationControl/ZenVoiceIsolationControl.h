// "Voice Isolation": keeps dialogue and lowers what is behind it, mono or
// stereo. A voice-activity detector steers the noise estimate (every frame
// outside speech is learnt as background) and the floor: in pauses the
// background falls to "Background", during speech only to a third of that
// in dB, so the voice keeps its room and its breath. "Amount" is the share
// of the suppression applied. Latency: the STFT frame less one sample.
#pragma once

#include "Common/NoiseReduction/zn_denoise_settings.h"
#include "Common/NoiseReduction/zn_denoiser.h"
#include "Common/ZenAudioPluginImpl.h"

class ZenVoiceIsolationControl : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    enum Parameter : std::uint32_t { kAmount, kBackground };
    // Reduction per channel (dB, <= 0), how far the last frame counted as
    // voice (%: the detector as the noise tracker confirms it), and the
    // noise estimate and the gain per point of the spectra (as "Noise
    // Reduction" publishes them).
    enum Meter : std::uint32_t { kReductionMeter, kVoiceMeter, kNoiseSpectrum, kGainSpectrum };

    static constexpr std::uint32_t kSpectrumPoints = 513;
    static constexpr float kSpectrumFloorDb = -150.0f;
    // The floor during speech, as a share of "Background" in dB.
    static constexpr float kSpeechFloorShare = 1.0f / 3.0f;
    // The noise the gain sees during speech, linear power (-5.2 dB): tuned
    // with the two floors, where "Noise Reduction" lifts one floor instead.
    static constexpr float kOverSubtraction = 0.3f;

    ZenVoiceIsolationControl();

    static const zen::ParameterTableDefinition& Definitions();
    static const zen::MeterTableDefinition& Meters();

    // "Amount" 0: every gain is 1.
    bool ApplyNeutralSetting() override;
    // The last frame's gains spread over the frame: as long as the latency.
    std::uint32_t GetTailLength() const override { return GetLatency(); }

protected:
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    void PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    zen::noise_reduction::zn_denoiser m_denoiser;
    zen::noise_reduction::zn_denoise_settings m_settings;
    float m_points[kSpectrumPoints] = {};
};
