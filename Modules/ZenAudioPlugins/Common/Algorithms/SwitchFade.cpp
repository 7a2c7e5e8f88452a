#include "SwitchFade.h"

#include <algorithm>
#include <cmath>

void SwitchFade::Prepare(double sampleRate) {
    const auto length = std::max(1u, static_cast<std::uint32_t>(std::lround(kSeconds * sampleRate)));
    m_curve.resize(length);
    for (std::uint32_t k = 0; k < length; ++k)
        m_curve[k] = static_cast<float>(0.5 - 0.5 * std::cos(3.141592653589793 * k / length));
    m_done = length;
}

void SwitchFade::Blend(const float* from, float* to, std::uint32_t frames) const noexcept {
    std::uint32_t done = m_done;
    for (std::uint32_t i = 0; i < frames; ++i) {
        if (done < Length()) ++done;
        const float w = done < Length() ? m_curve[done] : 1.0f;
        to[i] = from[i] + w * (to[i] - from[i]);
    }
}
