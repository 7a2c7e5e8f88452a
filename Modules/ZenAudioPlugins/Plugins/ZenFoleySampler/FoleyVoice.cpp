#include "FoleyVoice.h"

#include <cmath>

namespace {

constexpr float kFraction = 1.0f / 4294967296.0f;

// Four-point, third-order Hermite through p[1] (t = 0) and p[2] (t = 1),
// its coefficients shared out so that it costs ten operations.
inline float Hermite(const float* p, float t) noexcept {
    const float c = 0.5f * (p[2] - p[0]);
    const float v = p[1] - p[2];
    const float w = c + v;
    const float a = w + v + 0.5f * (p[3] - p[1]);
    const float b = w + a;
    return ((a * t - b) * t + c) * t + p[1];
}

// One loop per kind of voice, so the per-sample path has no choices.
// `x` points at the lead pad: source sample i is x[i + 1].
template <bool kStereo, bool kFading>
void Pitched(const float* x0, const float* x1, float* out0, float* out1, std::uint64_t& position,
             std::uint64_t increment, float gain, float& fade, float fadeStep, std::uint32_t frames) noexcept {
    for (std::uint32_t i = 0; i < frames; ++i) {
        const auto index = static_cast<std::size_t>(position >> 32);
        const float t = static_cast<float>(static_cast<std::uint32_t>(position)) * kFraction;
        float g = gain;
        if (kFading) {
            g *= fade;
            fade -= fadeStep;
        }
        out0[i] += Hermite(x0 + index, t) * g;
        if (kStereo) out1[i] += Hermite(x1 + index, t) * g;
        position += increment;
    }
}

template <bool kStereo, bool kFading>
void Unpitched(const float* x0, const float* x1, float* out0, float* out1, std::uint64_t& position, float gain,
               float& fade, float fadeStep, std::uint32_t frames) noexcept {
    const std::size_t start = static_cast<std::size_t>(position >> 32) + 1;
    for (std::uint32_t i = 0; i < frames; ++i) {
        float g = gain;
        if (kFading) {
            g *= fade;
            fade -= fadeStep;
        }
        out0[i] += x0[start + i] * g;
        if (kStereo) out1[i] += x1[start + i] * g;
    }
    position += static_cast<std::uint64_t>(frames) << 32;
}

}  // namespace

void FoleyVoice::Start(const FoleySound* sound, double increment, float gain, std::uint64_t order) noexcept {
    m_sound = sound;
    m_position = 0;
    m_increment = static_cast<std::uint64_t>(std::llround(increment * kOne));
    if (m_increment == 0) m_increment = 1;
    m_gain = gain;
    m_fade = 1.0f;
    m_fadeStep = 0.0f;
    m_order = order;
}

void FoleyVoice::Release(std::uint32_t frames) noexcept {
    if (m_sound == nullptr || IsReleasing()) return;
    m_fadeStep = 1.0f / static_cast<float>(frames < 1 ? 1 : frames);
}

std::uint32_t FoleyVoice::FramesLeft(std::uint32_t frames) const noexcept {
    const std::uint64_t end = m_sound->Frames() << 32;
    if (m_position >= end) return 0;
    const std::uint64_t left = (end - m_position + m_increment - 1) / m_increment;
    std::uint32_t n = left < frames ? static_cast<std::uint32_t>(left) : frames;
    if (IsReleasing()) {
        // The samples still above silence: fade, fade - step, ... > 0.
        const float steps = m_fade / m_fadeStep - 1e-4f;
        const std::uint32_t audible = steps > 0.0f ? static_cast<std::uint32_t>(std::ceil(steps)) : 0u;
        n = audible < n ? audible : n;
    }
    return n;
}

void FoleyVoice::Render(float* mono, float* left, float* right, std::uint32_t frames) noexcept {
    if (m_sound == nullptr) return;
    const std::uint32_t n = FramesLeft(frames);
    const bool stereo = m_sound->Channels() == 2;
    const float* x0 = m_sound->Data(0);
    const float* x1 = m_sound->Data(stereo ? 1 : 0);
    float* out0 = stereo ? left : mono;
    float* out1 = stereo ? right : mono;
    const bool pitched = m_increment != (std::uint64_t{1} << 32) || static_cast<std::uint32_t>(m_position) != 0;
    const bool fading = IsReleasing();
    if (pitched) {
        if (stereo) {
            if (fading) Pitched<true, true>(x0, x1, out0, out1, m_position, m_increment, m_gain, m_fade, m_fadeStep, n);
            else Pitched<true, false>(x0, x1, out0, out1, m_position, m_increment, m_gain, m_fade, m_fadeStep, n);
        } else {
            if (fading) Pitched<false, true>(x0, x1, out0, out1, m_position, m_increment, m_gain, m_fade, m_fadeStep, n);
            else Pitched<false, false>(x0, x1, out0, out1, m_position, m_increment, m_gain, m_fade, m_fadeStep, n);
        }
    } else {
        if (stereo) {
            if (fading) Unpitched<true, true>(x0, x1, out0, out1, m_position, m_gain, m_fade, m_fadeStep, n);
            else Unpitched<true, false>(x0, x1, out0, out1, m_position, m_gain, m_fade, m_fadeStep, n);
        } else {
            if (fading) Unpitched<false, true>(x0, x1, out0, out1, m_position, m_gain, m_fade, m_fadeStep, n);
            else Unpitched<false, false>(x0, x1, out0, out1, m_position, m_gain, m_fade, m_fadeStep, n);
        }
    }
    if (n < frames) m_sound = nullptr;
}
