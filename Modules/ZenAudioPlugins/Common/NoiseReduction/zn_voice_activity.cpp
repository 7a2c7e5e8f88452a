#include "zn_voice_activity.h"

#include <algorithm>
#include <cmath>
#include <new>

#include "zen/fvad.h"

namespace zen::noise_reduction {

namespace {

constexpr double kFrameSeconds = static_cast<double>(zn_voice_activity::kDetectorFrame) / zn_voice_activity::kDetectorRate;
// Butterworth pair of a fourth-order low-pass.
constexpr float kSectionQ[2] = {0.5412f, 1.3066f};

}  // namespace

zn_voice_activity::zn_voice_activity() : m_vad(fvad_new()) {
    if (m_vad == nullptr) throw std::bad_alloc();
}

zn_voice_activity::~zn_voice_activity() {
    fvad_free(m_vad);
}

bool zn_voice_activity::Configure(double sampleRate, std::size_t maxBlock) {
    if (!(sampleRate >= kDetectorRate) || maxBlock == 0) return false;
    try {
        m_mono.Resize(maxBlock);
    } catch (const std::bad_alloc&) {
        return false;
    }
    m_sampleRate = sampleRate;
    m_step = sampleRate / kDetectorRate;
    for (int i = 0; i < 2; ++i) {
        BiQuad& f = m_antiAlias[i];
        f.SetChannelCount(1);
        f.Prepare(static_cast<float>(sampleRate), static_cast<std::uint32_t>(maxBlock));
        f.SetParameter(BiQuad::kShape, BiQuad::kLowPass);
        f.SetParameter(BiQuad::kFreq, static_cast<float>(std::min(kAntiAliasHz, 0.45 * sampleRate)));
        f.SetParameter(BiQuad::kQ, kSectionQ[i]);
        f.SetParameter(BiQuad::kIn, 1.0f);
    }
    m_holdFrames = static_cast<std::uint32_t>(std::lround(kHoldSeconds / kFrameSeconds));
    m_fallPerFrame = static_cast<float>(kFrameSeconds / kFallSeconds);
    Reset();
    return true;
}

void zn_voice_activity::Reset() noexcept {
    fvad_reset(m_vad);
    fvad_set_sample_rate(m_vad, kDetectorRate);
    fvad_set_mode(m_vad, kMode);
    for (BiQuad& f : m_antiAlias) f.Reset();
    m_phase = 0.0;
    m_previous = 0.0f;
    m_filled = 0;
    m_holdLeft = 0;
    m_probability = 0.0f;
    m_lastDecision = false;
    m_decisions = 0;
}

void zn_voice_activity::Process(const float* const* channels, std::size_t channelCount, std::size_t offset,
                                std::size_t count) noexcept {
    if (channelCount == 0) return;
    const float share = 1.0f / static_cast<float>(channelCount);
    for (std::size_t done = 0; done < count;) {
        const std::size_t n = std::min(count - done, m_mono.size());
        float* mono = m_mono.data();
        for (std::size_t i = 0; i < n; ++i) {
            float sum = 0.0f;
            for (std::size_t c = 0; c < channelCount; ++c) {
                const float x = channels[c][offset + done + i];
                sum += std::isfinite(x) ? std::clamp(x, -kLargestInput, kLargestInput) : 0.0f;
            }
            mono[i] = sum * share;
        }
        for (BiQuad& f : m_antiAlias) f.ProcessChannel(0, mono, n);
        // Linear interpolation between input samples at the detector's rate.
        for (std::size_t i = 0; i < n; ++i) {
            const float x = mono[i];
            while (m_phase < 1.0) {
                const auto y = static_cast<float>(m_previous + (x - m_previous) * m_phase);
                m_frame[m_filled++] = static_cast<std::int16_t>(std::lround(std::clamp(y, -1.0f, 1.0f) * 32767.0f));
                if (m_filled == kDetectorFrame) Decide();
                m_phase += m_step;
            }
            m_phase -= 1.0;
            m_previous = x;
        }
        done += n;
    }
}

void zn_voice_activity::Decide() noexcept {
    m_filled = 0;
    m_lastDecision = fvad_process(m_vad, m_frame, kDetectorFrame) == 1;
    ++m_decisions;
    if (m_lastDecision) {
        m_probability = 1.0f;
        m_holdLeft = m_holdFrames;
    } else if (m_holdLeft > 0) {
        --m_holdLeft;
    } else {
        m_probability = std::max(0.0f, m_probability - m_fallPerFrame);
    }
}

}  // namespace zen::noise_reduction
