#include "zn_denoiser.h"

#include <algorithm>

namespace zen::noise_reduction {

zn_denoiser::zn_denoiser() = default;

bool zn_denoiser::Prepare(float sampleRate, std::uint32_t maxBlock) {
    ZenAudioAlgorithm::Prepare(sampleRate, maxBlock);
    const std::uint64_t channels = GetChannelCount();
    if (channels == 0) return true;
    m_frame.SetSampleRate(sampleRate);
    return m_stft.Configure(channels, sampleRate, &m_frame) &&
           m_voice.Configure(sampleRate, std::max<std::uint32_t>(maxBlock, 1));
}

void zn_denoiser::Configure(const zn_denoise_settings& settings) noexcept {
    m_frame.Apply(settings);
}

void zn_denoiser::Reset() {
    m_stft.Reset();
    m_voice.Reset();
}

bool zn_denoiser::Process(float* const* channels, std::uint64_t count) {
    const std::uint64_t channelCount = GetChannelCount();
    if (channelCount == 0) return true;
    if (!m_stft.IsConfigured()) return false;
    const bool guided = m_frame.Settings().voiceGuided;
    for (std::uint64_t done = 0; done < count;) {
        const std::size_t n = std::min<std::uint64_t>(count - done, m_stft.ToNextFrame());
        if (guided) {
            m_voice.Process(channels, channelCount, done, n);
            m_frame.SetVoice(m_voice.Probability());
        }
        m_stft.Process(channels, done, n);
        done += n;
    }
    return true;
}

}  // namespace zen::noise_reduction
