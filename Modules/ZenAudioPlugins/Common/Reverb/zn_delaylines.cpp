#include "zn_delaylines.h"

#include <algorithm>

namespace zen::reverb {

void zn_delaylines::Dimension(std::uint32_t lines, std::uint32_t capacity) {
    m_capacity = std::max(capacity, 1u);
    m_memory.assign(static_cast<std::size_t>(lines) * m_capacity, 0.0f);
    m_lengths.assign(lines, 1u);
    m_positions.assign(lines, 0u);
    m_shortest = 1;
}

void zn_delaylines::SetLengths(const std::uint32_t* lengths) {
    std::uint32_t longest = 1;
    for (std::uint32_t i = 0; i < Count(); ++i) longest = std::max(longest, lengths[i]);
    if (longest > m_capacity) {
        m_capacity = longest;
        m_memory.assign(m_lengths.size() * m_capacity, 0.0f);
    }
    m_shortest = longest;
    for (std::uint32_t i = 0; i < Count(); ++i) {
        m_lengths[i] = std::max(lengths[i], 1u);
        m_shortest = std::min(m_shortest, m_lengths[i]);
    }
    Clear();
}

void zn_delaylines::Clear() noexcept {
    std::fill(m_memory.begin(), m_memory.end(), 0.0f);
    std::fill(m_positions.begin(), m_positions.end(), 0u);
}

void zn_delaylines::Read(float* rows, std::size_t stride, std::size_t count) const noexcept {
    for (std::uint32_t i = 0; i < Count(); ++i) {
        const float* line = m_memory.data() + static_cast<std::size_t>(i) * m_capacity;
        const std::uint32_t p = m_positions[i];
        const std::size_t first = std::min<std::size_t>(count, m_lengths[i] - p);
        float* row = rows + i * stride;
        std::copy_n(line + p, first, row);
        std::copy_n(line, count - first, row + first);
    }
}

void zn_delaylines::Write(const float* rows, std::size_t stride, std::size_t count) noexcept {
    for (std::uint32_t i = 0; i < Count(); ++i) {
        float* line = m_memory.data() + static_cast<std::size_t>(i) * m_capacity;
        const std::uint32_t p = m_positions[i];
        const std::size_t first = std::min<std::size_t>(count, m_lengths[i] - p);
        const float* row = rows + i * stride;
        std::copy_n(row, first, line + p);
        std::copy_n(row + first, count - first, line);
        m_positions[i] = static_cast<std::uint32_t>((p + count) % m_lengths[i]);
    }
}

}  // namespace zen::reverb
