#include "SwitchFade.h"

#include <algorithm>
#include <cmath>

void SwitchFade::Prepare(double sampleRate) noexcept {
    m_length = std::max(1u, static_cast<std::uint32_t>(std::lround(kSeconds * sampleRate)));
    m_step = 1.0f / static_cast<float>(m_length);
    m_done = m_length;
}

void SwitchFade::Blend(const float* from, float* to, std::uint32_t frames) const noexcept {
    std::uint32_t done = m_done;
    for (std::uint32_t i = 0; i < frames; ++i) {
        if (done < m_length) ++done;
        const float w = static_cast<float>(done) * m_step;
        to[i] = from[i] + w * (to[i] - from[i]);
    }
}
