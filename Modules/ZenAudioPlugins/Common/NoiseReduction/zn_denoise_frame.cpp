#include "zn_denoise_frame.h"

#include <algorithm>
#include <cmath>
#include <new>

namespace zen::noise_reduction {

using ora::fft::Complex;

bool zn_denoise_frame::Configure(ora::fft::Frame& frame, const ora::fft::Context& context) {
    m_channels = 0;
    m_bins = 0;
    const std::size_t channels = context.channels, bins = context.bins;
    const double hopSeconds = static_cast<double>(context.synthesisHop) / m_sampleRate;
    const float* window = context.window->Analysis();
    double windowEnergy = 0.0;
    for (std::size_t n = 0; n < context.frameLength; ++n) windowEnergy += static_cast<double>(window[n]) * window[n];
    if (!frame.RequireVector(ora::fft::variable::FSIG, ora::fft::type::FREQ_CPLX_VECTOR, channels, bins) ||
        !m_tracker.Configure(channels, bins, hopSeconds) ||
        !m_profile.Configure(channels, bins, m_sampleRate, windowEnergy) || !m_gain.Configure(channels, bins, m_sampleRate / static_cast<double>(context.fftLength), hopSeconds) ||
        !m_smoother.Configure(channels, bins, m_sampleRate, hopSeconds))
        return false;
    try {
        m_power.Resize(bins);
        m_gains.Resize(bins);
        m_reductionDb.Resize(channels);
        m_noiseSpectrum.Resize(bins);
        m_gainSpectrum.Resize(bins);
    } catch (const std::bad_alloc&) {
        return false;
    }
    m_channels = channels;
    m_bins = bins;
    m_noisePerEnergy = static_cast<float>(1.0 / windowEnergy);
    const double binHz = m_sampleRate / static_cast<double>(context.fftLength);
    m_bandBegin = std::min(bins, static_cast<std::size_t>(kVoiceBandHz[0] / binHz));
    m_bandEnd = std::min(bins, static_cast<std::size_t>(kVoiceBandHz[1] / binHz) + 1);
    m_evidenceFall = static_cast<float>(hopSeconds / kEvidenceHoldSeconds);
    m_smoother.SetAmount(m_settings.smoothing);
    if (m_settings.learning) m_profile.Begin();
    Reset();
    return true;
}

void zn_denoise_frame::Reset() noexcept {
    m_tracker.Reset();
    m_gain.Reset();
    m_smoother.Reset();
    m_reductionDb.Clear();
    m_noiseSpectrum.Clear();
    std::fill(m_gainSpectrum.begin(), m_gainSpectrum.end(), 1.0f);
    m_voice = 1.0f;
    m_confirmed = 0.0f;
    m_evidence = 0.0f;
}

void zn_denoise_frame::Apply(const zn_denoise_settings& settings) noexcept {
    if (settings.learning && !m_settings.learning) m_profile.Begin();
    if (!settings.learning && m_settings.learning) m_profile.End();
    m_settings = settings;
    m_smoother.SetAmount(settings.smoothing);
}

float zn_denoise_frame::VoiceBandPresence(std::size_t channel) const noexcept {
    if (m_bandEnd <= m_bandBegin) return 1.0f;
    const float* p = m_tracker.Presence(channel);
    float sum = 0.0f;
    for (std::size_t k = m_bandBegin; k < m_bandEnd; ++k) sum += p[k];
    return std::min(1.0f, sum / static_cast<float>(m_bandEnd - m_bandBegin) / kVoicedPresence);
}

float zn_denoise_frame::SpeechEvidence() noexcept {
    float sum = 0.0f;
    for (std::size_t c = 0; c < m_channels; ++c) sum += VoiceBandPresence(c);
    m_evidence = std::max(sum / static_cast<float>(m_channels), m_evidence - m_evidenceFall);
    return m_evidence;
}

float zn_denoise_frame::ReductionDb(std::size_t channel) const {
    return channel < m_channels ? m_reductionDb[channel] : 0.0f;
}

void zn_denoise_frame::Process(ora::fft::Frame& frame, ora::fft::Context& context) noexcept {
    Complex* fsig = frame.Cplx(ora::fft::variable::FSIG, ora::fft::type::FREQ_CPLX_VECTOR);
    if (fsig == nullptr || m_channels == 0) return;
    const zn_denoise_settings& s = m_settings;
    // The detector steers the tracker; the floor follows only what both agree on.
    const float voice = s.voiceGuided ? std::clamp(m_voice, 0.0f, 1.0f) : 1.0f;
    const float confirmed = s.voiceGuided ? voice * SpeechEvidence() : 1.0f;
    m_confirmed = confirmed;
    const float floor = s.voiceGuided ? std::pow(s.speechFloor, confirmed) * std::pow(s.floor, 1.0f - confirmed) : s.floor;
    const float overSubtraction =
        s.voiceGuided ? std::pow(s.overSubtraction, confirmed) * std::pow(kPauseOverSubtraction, 1.0f - confirmed)
                      : s.overSubtraction;
    const float amount = std::clamp(s.amount, 0.0f, 1.0f);
    const bool learned = s.estimate == zn_denoise_settings::Estimate::Learned && m_profile.HasProfile();
    const float share = 1.0f / static_cast<float>(m_channels);
    const float noiseShare = share * m_noisePerEnergy;
    float* power = m_power.data();
    float* gain = m_gains.data();
    for (std::size_t c = 0; c < m_channels; ++c) {
        Complex* x = fsig + c * context.bins;
        double total = 0.0;
        for (std::size_t k = 0; k < m_bins; ++k) {
            power[k] = x[k].real() * x[k].real() + x[k].imag() * x[k].imag();
            total += power[k];
        }
        // The estimates of the frames before this one: a frame is no
        // measure of its own noise.
        const float* noise = learned ? m_profile.Power(c) : m_tracker.Noise(c);
        m_gain.Compute(c, power, noise, overSubtraction, floor, m_tracker.Presence(c), gain);
        // Frames that begin before the stream does hold leading silence,
        // which is no measure of the noise.
        if (context.analysisStart >= 0) {
            if (s.learning) m_profile.Learn(c, power);
            m_tracker.Update(c, power, voice);
        }
        if (!s.voiceGuided && s.speechFloorLift > 0.0f) {
            const float lift = std::clamp(s.speechFloorLift, 0.0f, 1.0f) * VoiceBandPresence(c);
            const float lifted = std::pow(floor, 1.0f - lift);
            for (std::size_t k = 0; k < m_bandEnd; ++k) gain[k] = std::max(gain[k], lifted);
        }
        m_smoother.Process(c, gain, floor);
        double kept = 0.0;
        for (std::size_t k = 0; k < m_bins; ++k) {
            const float g = 1.0f - amount * (1.0f - gain[k]);
            const float applied = s.listenToRemoved ? 1.0f - g : g;
            x[k] *= applied;
            kept += static_cast<double>(g) * g * power[k];
            m_noiseSpectrum[k] = (c == 0 ? 0.0f : m_noiseSpectrum[k]) + noiseShare * noise[k];
            m_gainSpectrum[k] = (c == 0 ? 0.0f : m_gainSpectrum[k]) + share * g;
        }
        const double silent = static_cast<double>(kSilentPower) * static_cast<double>(m_bins);
        m_reductionDb[c] = total > silent ? static_cast<float>(10.0 * std::log10(std::max(kept / total, 1e-12))) : 0.0f;
    }
}

}  // namespace zen::noise_reduction
