#include "ModulatedDelayLine.h"

#include <algorithm>

void ModulatedDelayLine::Resize(double maxDelay) {
    m_maxDelay = std::max(maxDelay, kMinDelay);
    // A power of two holding the longest delay and the taps around it.
    std::uint32_t size = 4;
    while (size < static_cast<std::uint32_t>(std::ceil(m_maxDelay)) + 3u) size *= 2;
    m_line.assign(size, 0.0f);
    m_mask = size - 1;
    m_write = 0;
}

void ModulatedDelayLine::Clear() noexcept {
    std::fill(m_line.begin(), m_line.end(), 0.0f);
    m_write = 0;
}
