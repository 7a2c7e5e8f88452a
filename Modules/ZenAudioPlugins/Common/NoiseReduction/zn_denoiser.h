// The spectral denoiser behind "Noise Reduction" and "Voice Isolation": an
// STFT (zn_stft) whose frames run through zn_denoise_frame, optionally
// guided by a voice-activity detector (zn_voice_activity) that runs on the
// same input, sample for sample ahead of each frame. Settings arrive whole
// (zn_denoise_settings) on the audio thread.
//
// Latency: the STFT's frame length - 1 samples. Prepare allocates; Process,
// Configure and Reset are real-time safe.
#pragma once

#include <cstdint>

#include "Common/ZenAudioAlgorithm.h"
#include "zn_denoise_frame.h"
#include "zn_denoise_settings.h"
#include "zn_stft.h"
#include "zn_voice_activity.h"

namespace zen::noise_reduction {

class zn_denoiser : public ZenAudioAlgorithm {
    Q_OBJECT

public:
    zn_denoiser();

    bool Prepare(float sampleRate, std::uint32_t maxBlock) override;
    void Configure(const zn_denoise_settings& settings) noexcept;
    bool Process(float* const* channels, std::uint64_t count) override;
    void Reset() override;

    bool IsPrepared() const { return m_stft.IsConfigured(); }
    std::uint32_t Latency() const { return static_cast<std::uint32_t>(m_stft.Latency()); }
    const zn_stft& Stft() const { return m_stft; }
    zn_denoise_frame& Frame() { return m_frame; }
    const zn_denoise_frame& Frame() const { return m_frame; }
    const zn_voice_activity& VoiceActivity() const { return m_voice; }

private:
    zn_stft m_stft;
    zn_denoise_frame m_frame;
    zn_voice_activity m_voice;
};

}  // namespace zen::noise_reduction
