#include "zn_reflections_mod.h"

#include <algorithm>
#include <cmath>

#include "Common/ZenAssert.h"

namespace zen::reverb {

namespace {

constexpr double kTwoPi = 6.283185307179586;
constexpr double kGoldenAngle = 2.399963229728653;  // spreads the taps' start phases
constexpr double kRateSpread = 1.0 / 32.0;          // tap k runs (1 + k/32) times the slowest rate
constexpr std::uint32_t kInterpolationFrames = 2;   // the neighbour read past the deepest position
constexpr std::uint32_t kRenormaliseFrames = 1024;

}  // namespace

void zn_reflections_mod::Dimension(std::uint32_t inputs, float sampleRate) {
    zn_reflections::Dimension(inputs, DelayLines::MaxLength + static_cast<std::uint32_t>(DelayLines::MaxDepth) +
                                          kInterpolationFrames);
    m_sampleRate = sampleRate;
    m_configured = false;
    m_hasWaiting = false;
    m_fade = 1.0f;
    for (std::uint32_t k = 0; k < kTaps; ++k) {
        m_previous[k] = m_next[k] = m_waiting[k] = 1;
        m_depth[k] = m_depthTarget[k] = 0.0f;
    }
    Reset();
}

void zn_reflections_mod::Configure(const zn_reflections_mod_param& param) noexcept {
    std::uint32_t max_length = 0;
    for (std::uint32_t k = 0; k < kTaps; ++k) max_length = std::max(max_length, param.delays(k));
    ZEN_ASSERT(max_length <= zn_reflections_mod_param::DelayLines::MaxLength,
               "max_length <= zn_reflections_mod_param::DelayLines::MaxLength");
    SetWeights(param.weights);
    m_fadeStep = std::clamp(param.crossfadeStep, 1e-6f, 1.0f);
    const bool newPeriod = param.periodMs != m_periodMs;
    m_periodMs = param.periodMs > 0.0f ? param.periodMs : 1000.0f;
    if (newPeriod || !m_configured) {
        const double slowest = 1000.0 / static_cast<double>(m_periodMs);
        for (std::uint32_t k = 0; k < kTaps; ++k) {
            const double w = kTwoPi * slowest * (1.0 + kRateSpread * k) / m_sampleRate;
            m_rotCos[k] = static_cast<float>(std::cos(w));
            m_rotSin[k] = static_cast<float>(std::sin(w));
        }
    }

    std::uint32_t delays[kTaps];
    bool changed = false;
    for (std::uint32_t k = 0; k < kTaps; ++k) {
        delays[k] = std::clamp(param.delays(k), DelayLines::MinLength, DelayLines::MaxLength);
        m_depthTarget[k] = std::clamp(param.depths(k), 0.0f, DelayLines::MaxDepth);
        changed |= delays[k] != (m_hasWaiting ? m_waiting[k] : m_next[k]);
    }
    if (!m_configured) {
        m_configured = true;
        std::copy(delays, delays + kTaps, m_next);
        std::copy(delays, delays + kTaps, m_previous);
        std::copy(m_depthTarget, m_depthTarget + kTaps, m_depth);
        return;
    }
    if (!changed) return;
    std::copy(delays, delays + kTaps, m_waiting);
    m_hasWaiting = true;
    if (!Fading()) StartFade();
}

void zn_reflections_mod::StartFade() noexcept {
    std::copy(m_next, m_next + kTaps, m_previous);
    std::copy(m_waiting, m_waiting + kTaps, m_next);
    m_hasWaiting = false;
    m_fade = 0.0f;
}

void zn_reflections_mod::Reset() noexcept {
    zn_reflections::Reset();
    for (std::uint32_t k = 0; k < kTaps; ++k) {
        const double phase = kGoldenAngle * k;
        m_cos[k] = static_cast<float>(std::cos(phase));
        m_sin[k] = static_cast<float>(std::sin(phase));
    }
    m_sinceRenormalised = 0;
    if (m_hasWaiting) StartFade();
    m_fade = 1.0f;
    std::copy(m_next, m_next + kTaps, m_previous);
}

float zn_reflections_mod::Tap(std::uint32_t k, float delay) const noexcept {
    const auto whole = static_cast<std::uint32_t>(delay);
    const float fraction = delay - static_cast<float>(whole);
    const float* a = FrameAt(whole);
    const float* b = FrameAt(whole + 1);
    const float* w = m_weights.data() + k * m_inputs;
    float acc = 0.0f;
    for (std::uint32_t ch = 0; ch < m_inputs; ++ch) acc += w[ch] * (a[ch] + fraction * (b[ch] - a[ch]));
    return acc;
}

void zn_reflections_mod::Process(const float* in, float* lanes, std::size_t frames) noexcept {
    for (std::size_t f = 0; f < frames; ++f, in += m_inputs, lanes += kTaps) {
        Push(in);
        if (m_fade < 1.0f) {
            m_fade += m_fadeStep;
            if (m_fade >= 1.0f) {
                m_fade = 1.0f;
                if (m_hasWaiting) StartFade();
            }
        }
        for (std::uint32_t k = 0; k < kTaps; ++k) {
            const float c = m_cos[k] * m_rotCos[k] - m_sin[k] * m_rotSin[k];
            m_sin[k] = m_sin[k] * m_rotCos[k] + m_cos[k] * m_rotSin[k];
            m_cos[k] = c;
            m_depth[k] += std::clamp(m_depthTarget[k] - m_depth[k], -kDepthGlide, kDepthGlide);
            const float swing = m_depth[k] * m_sin[k];
            float lane = Tap(k, std::max(1.0f, static_cast<float>(m_next[k]) + swing));
            if (m_fade < 1.0f) {
                const float old = Tap(k, std::max(1.0f, static_cast<float>(m_previous[k]) + swing));
                lane = old + m_fade * (lane - old);
            }
            lanes[k] = lane;
        }
        // Keep the phasors on the unit circle, on a schedule of its own so
        // that any split into blocks gives the same output.
        if (++m_sinceRenormalised == kRenormaliseFrames) {
            m_sinceRenormalised = 0;
            for (std::uint32_t k = 0; k < kTaps; ++k) {
                const float norm = 1.5f - 0.5f * (m_cos[k] * m_cos[k] + m_sin[k] * m_sin[k]);
                m_cos[k] *= norm;
                m_sin[k] *= norm;
            }
        }
    }
}

}  // namespace zen::reverb
