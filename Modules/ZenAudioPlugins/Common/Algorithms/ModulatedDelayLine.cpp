#include "ModulatedDelayLine.h"

#include <algorithm>

#include "PowerOfTwo.h"

void ModulatedDelayLine::Resize(double maxDelay) {
    m_maxDelay = std::max(maxDelay, kMinDelay);
    // A power of two holding the longest delay and the taps around it.
    const std::uint32_t size = zen::NextPowerOfTwo(static_cast<std::uint32_t>(std::ceil(m_maxDelay)) + 3u);
    m_line.assign(size, 0.0f);
    m_mask = size - 1;
    m_write = 0;
}

void ModulatedDelayLine::Clear() noexcept {
    std::fill(m_line.begin(), m_line.end(), 0.0f);
    m_write = 0;
}
