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

void zn_reflections_mod::Dimension(std::uint32_t inputs, float sampleRate, std::uint32_t maxFrames) {
    zn_reflections::Dimension(inputs,
                              DelayLines::MaxLength + static_cast<std::uint32_t>(DelayLines::MaxDepth) +
                                  kInterpolationFrames,
                              maxFrames);
    m_sineFrames.Resize(static_cast<std::size_t>(kTaps) * m_maxFrames);
    m_sines.Resize(static_cast<std::size_t>(kTaps) * m_maxFrames);
    for (std::uint32_t k = 0; k < kTaps; ++k) m_sineRows[k] = m_sines.data() + static_cast<std::size_t>(k) * m_maxFrames;
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
            m_rotor.rc[k] = static_cast<float>(std::cos(w));
            m_rotor.rs[k] = static_cast<float>(std::sin(w));
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
        m_rotor.c[k] = static_cast<float>(std::cos(phase));
        m_rotor.s[k] = static_cast<float>(std::sin(phase));
    }
    m_sinceRenormalised = 0;
    if (m_hasWaiting) StartFade();
    m_fade = 1.0f;
    std::copy(m_next, m_next + kTaps, m_previous);
}

float zn_reflections_mod::Tap(std::uint32_t k, float delay, std::uint32_t position) const noexcept {
    const auto whole = static_cast<std::uint32_t>(delay);
    const float fraction = delay - static_cast<float>(whole);
    const float* w = m_weights.data() + k * m_inputs;
    float acc = 0.0f;
    for (std::uint32_t ch = 0; ch < m_inputs; ++ch) {
        const float a = Sample(ch, position, whole), b = Sample(ch, position, whole + 1);
        acc += w[ch] * (a + fraction * (b - a));
    }
    return acc;
}

bool zn_reflections_mod::Settled() const noexcept {
    if (m_fade < 1.0f) return false;
    for (std::uint32_t k = 0; k < kTaps; ++k)
        if (m_depth[k] != m_depthTarget[k]) return false;
    return true;
}

void zn_reflections_mod::Process(const float* in, std::size_t inStride, float* lanes, std::size_t laneStride,
                                 std::size_t frames) noexcept {
    for (std::size_t done = 0; done < frames;) {
        const std::size_t n = std::min<std::size_t>(frames - done, m_maxFrames);
        std::uint32_t position = m_write;  // the newest frame before the block
        Push(in + done, inStride, n);
        for (std::size_t f = 0; f < n;) {
            position = Next(position);
            float* out = lanes + done + f;
            if (Settled()) {
                const std::size_t run = std::min({n - f, static_cast<std::size_t>(kRenormaliseFrames - m_sinceRenormalised),
                                                  static_cast<std::size_t>(m_capacity - position)});
                ProcessSettled(position, out, laneStride, run);
                AfterFrames(run);
                position += static_cast<std::uint32_t>(run - 1);
                f += run;
            } else {
                ProcessFrame(position, out, laneStride);
                AfterFrames(1);
                ++f;
            }
        }
        done += n;
    }
}

void zn_reflections_mod::ProcessFrame(std::uint32_t position, float* lanes, std::size_t laneStride) noexcept {
    if (m_fade < 1.0f) {
        m_fade += m_fadeStep;
        if (m_fade >= 1.0f) {
            m_fade = 1.0f;
            if (m_hasWaiting) StartFade();
        }
    }
    for (std::uint32_t k = 0; k < kTaps; ++k) {
        const float c = m_rotor.c[k] * m_rotor.rc[k] - m_rotor.s[k] * m_rotor.rs[k];
        m_rotor.s[k] = m_rotor.s[k] * m_rotor.rc[k] + m_rotor.c[k] * m_rotor.rs[k];
        m_rotor.c[k] = c;
        m_depth[k] += std::clamp(m_depthTarget[k] - m_depth[k], -kDepthGlide, kDepthGlide);
        const float swing = m_depth[k] * m_rotor.s[k];
        float lane = Tap(k, std::max(1.0f, static_cast<float>(m_next[k]) + swing), position);
        if (m_fade < 1.0f) {
            const float old = Tap(k, std::max(1.0f, static_cast<float>(m_previous[k]) + swing), position);
            lane = old + m_fade * (lane - old);
        }
        lanes[k * laneStride] = lane;
    }
}

void zn_reflections_mod::ProcessSettled(std::uint32_t position, float* lanes, std::size_t laneStride,
                                        std::size_t count) noexcept {
    m_rotorKernel.Process(m_rotor, m_sineFrames.data(), count);
    m_transpose.FromFrames(m_sineFrames.data(), m_sineRows, count);
    for (std::uint32_t k = 0; k < kTaps; ++k) {
        float* out = lanes + k * laneStride;
        const float* w = m_weights.data() + k * m_inputs;
        bool any = false;
        // A zero weight adds nothing: only the inputs a tap hears are read.
        for (std::uint32_t ch = 0; ch < m_inputs; ++ch) {
            if (w[ch] == 0.0f) continue;
            m_tap.Read(Line(ch) + position, m_sineRows[k], static_cast<float>(m_next[k]), m_depth[k], w[ch], out, count,
                       any);
            any = true;
        }
        if (!any) std::fill(out, out + count, 0.0f);
    }
}

// Keep the phasors on the unit circle, on a schedule of its own so that any
// split into blocks gives the same output.
void zn_reflections_mod::AfterFrames(std::size_t count) noexcept {
    m_sinceRenormalised += static_cast<std::uint32_t>(count);
    if (m_sinceRenormalised < kRenormaliseFrames) return;
    m_sinceRenormalised = 0;
    for (std::uint32_t k = 0; k < kTaps; ++k) {
        const float norm = 1.5f - 0.5f * (m_rotor.c[k] * m_rotor.c[k] + m_rotor.s[k] * m_rotor.s[k]);
        m_rotor.c[k] *= norm;
        m_rotor.s[k] *= norm;
    }
}

}  // namespace zen::reverb
