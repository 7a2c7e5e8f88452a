#include "FoleyVoice.h"

namespace {

// Four-point, third-order Hermite through p[1] (t = 0) and p[2] (t = 1).
inline float Hermite(const float* p, float t) noexcept {
    const float c1 = 0.5f * (p[2] - p[0]);
    const float c2 = p[0] - 2.5f * p[1] + 2.0f * p[2] - 0.5f * p[3];
    const float c3 = 0.5f * (p[3] - p[0]) + 1.5f * (p[1] - p[2]);
    return ((c3 * t + c2) * t + c1) * t + p[1];
}

}  // namespace

void FoleyVoice::Start(const FoleySound* sound, double increment, float gain, std::uint64_t order) noexcept {
    m_sound = sound;
    m_position = 0.0;
    m_increment = increment;
    m_gain = gain;
    m_fade = 1.0f;
    m_fadeStep = 0.0f;
    m_order = order;
}

void FoleyVoice::Release(std::uint32_t frames) noexcept {
    if (m_sound == nullptr || IsReleasing()) return;
    m_fadeStep = 1.0f / static_cast<float>(frames < 1 ? 1 : frames);
}

void FoleyVoice::Render(float* const* out, std::uint32_t channels, std::uint32_t frames) noexcept {
    if (m_sound == nullptr || channels == 0) return;
    const std::uint64_t length = m_sound->Frames();
    const bool stereo = m_sound->Channels() == 2;
    // Data(c) + i reaches x[i - 1] .. x[i + 2] around source sample i.
    const float* left = m_sound->Data(0);
    const float* right = m_sound->Data(stereo ? 1 : 0);
    const float sourceMix = stereo && channels == 1 ? 0.5f : 1.0f;
    double position = m_position;
    float fade = m_fade;
    std::uint32_t i = 0;
    // The common case, a mono take at full level into two outputs, runs without per-sample choices.
    if (!stereo && channels == 2 && !IsReleasing()) {
        const auto end = static_cast<double>(length);
        float* out0 = out[0];
        float* out1 = out[1];
        const float g = m_gain;
        for (; i < frames && position < end; ++i) {
            const auto index = static_cast<std::uint64_t>(position);
            const float y = Hermite(left + index, static_cast<float>(position - static_cast<double>(index))) * g;
            out0[i] += y;
            out1[i] += y;
            position += m_increment;
        }
        m_position = position;
        if (i < frames) m_sound = nullptr;
        return;
    }
    for (; i < frames; ++i) {
        const auto index = static_cast<std::uint64_t>(position);
        if (index >= length || fade <= 0.0f) break;
        const auto t = static_cast<float>(position - static_cast<double>(index));
        const float g = m_gain * fade;
        const float l = Hermite(left + index, t) * g;
        if (channels == 1) {
            out[0][i] += stereo ? sourceMix * (l + Hermite(right + index, t) * g) : l;
        } else {
            out[0][i] += l;
            out[1][i] += stereo ? Hermite(right + index, t) * g : l;
        }
        position += m_increment;
        fade -= m_fadeStep;
    }
    m_position = position;
    m_fade = fade;
    if (i < frames) m_sound = nullptr;
}
