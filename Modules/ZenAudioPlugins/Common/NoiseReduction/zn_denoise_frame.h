// The denoiser's step of the FFT engine's pipeline (between In2Dft and
// Dft2Out): per channel, the periodogram of the frame feeds the noise
// profile (while learning) and the adaptive tracker; the chosen noise
// estimate sets the suppression gains, which are smoothed against musical
// noise and applied to the spectrum (or their complement, to listen to what
// is removed). It keeps the last frame's figures for meters.
//
// Voice guided, the owner's voice probability is confirmed by the tracker's
// own speech presence in the voice band, held over the pauses between words
// (the detector can take noise for voice for a while after a loud passage;
// the tracker cannot): a frame counts as voice only as far as both agree.
// Outside voice the floor and the sensitivity move to their pause values.
//
// Not voice guided, the floor up to the top of the voice band rises by the
// settings' speech lift as far as the tracker hears speech in the channel's
// voice band in this very frame (no hold: noise after a word goes back down
// at once). Above the band a voice has little energy to keep, and most of a
// white noise's would pass. The lift shapes only the gain applied: the
// speech presence and the decision-directed memory of the next frame see the
// gain under the plain floor, so noise never lifts itself.
#pragma once

#include <cstddef>

#include "FFT/Plugin.h"
#include "System/AlignedBuffer.h"
#include "zn_denoise_settings.h"
#include "zn_gain_smoother.h"
#include "zn_lsa_gain.h"
#include "zn_noise_profile.h"
#include "zn_noise_tracker.h"

namespace zen::noise_reduction {

class zn_denoise_frame final : public ora::fft::Plugin {
public:
    static constexpr float kSilentPower = 1e-18f;  // a frame below this per bin reports no reduction
    static constexpr double kVoiceBandHz[2] = {200.0, 4000.0};
    static constexpr float kVoicedPresence = 0.1f;  // mean presence in the voice band that confirms voice fully
    static constexpr double kEvidenceHoldSeconds = 0.5;  // the confirmation falls to nothing over this
    static constexpr float kPauseOverSubtraction = 2.0f; // noise estimate x2 (+3 dB) where there is no voice

    zn_denoise_frame() : Plugin(ora::fft::plugin::PROCESS) {}
    const char* Name() const override { return "zn_denoise_frame"; }
    // Allocates; `sampleRate` places the bins in frequency.
    bool Configure(ora::fft::Frame& frame, const ora::fft::Context& context) override;
    void Reset() noexcept override;
    void Process(ora::fft::Frame& frame, ora::fft::Context& context) noexcept override;

    void SetSampleRate(double sampleRate) { m_sampleRate = sampleRate; }
    void Apply(const zn_denoise_settings& settings) noexcept;
    const zn_denoise_settings& Settings() const { return m_settings; }
    // Voice probability (0..1) of the frame about to run.
    void SetVoice(float probability) noexcept { m_voice = probability; }
    // Voice guided: how far the last frame counted as voice (0..1), the
    // detector's probability as the tracker confirmed it.
    float ConfirmedVoice() const { return m_confirmed; }

    zn_noise_profile& Profile() { return m_profile; }
    const zn_noise_profile& Profile() const { return m_profile; }

    // Of the last frame: power removed per channel in dB (<= 0), and per bin,
    // averaged over channels, the gain and the noise estimate's power per
    // unit window energy (white noise of variance v reads v in every bin).
    float ReductionDb(std::size_t channel) const;
    const float* NoiseSpectrum() const { return m_noiseSpectrum.data(); }
    const float* GainSpectrum() const { return m_gainSpectrum.data(); }
    std::size_t Bins() const { return m_bins; }

private:
    float SpeechEvidence() noexcept;
    // The tracker's presence in a channel's voice band, as a share of
    // kVoicedPresence (0..1).
    float VoiceBandPresence(std::size_t channel) const noexcept;

    zn_denoise_settings m_settings;
    std::size_t m_bandBegin = 0;
    std::size_t m_bandEnd = 0;
    float m_evidence = 0.0f;
    float m_evidenceFall = 0.0f;
    double m_sampleRate = 48000.0;
    float m_noisePerEnergy = 1.0f;
    float m_voice = 1.0f;
    float m_confirmed = 0.0f;
    std::size_t m_channels = 0;
    std::size_t m_bins = 0;
    zn_noise_tracker m_tracker;
    zn_noise_profile m_profile;
    zn_lsa_gain m_gain;
    zn_gain_smoother m_smoother;
    ora::AlignedBuffer<float> m_power;
    ora::AlignedBuffer<float> m_gains;
    ora::AlignedBuffer<float> m_reductionDb;
    ora::AlignedBuffer<float> m_noiseSpectrum;
    ora::AlignedBuffer<float> m_gainSpectrum;
};

}  // namespace zen::noise_reduction
