#include "InputBacklog.h"

#include <algorithm>
#include <limits>

namespace zen {

void InputBacklog::Allocate(std::size_t channels, std::size_t capacity) {
    m_lines.resize(channels);
    for (auto& line : m_lines) line.Allocate(capacity, ora::fft::Buffer::Layout::Ring);
    m_capacity = m_lines.empty() ? 0 : m_lines.front().Capacity();
    Clear();
}

void InputBacklog::Clear() noexcept {
    m_read = m_written;
    m_overflowed = false;
}

void InputBacklog::Push(const float* const* channels, std::size_t channelCount, std::size_t frames) noexcept {
    channelCount = std::min(channelCount, m_lines.size());
    for (std::size_t c = 0; c < channelCount; ++c)
        m_lines[c].WriteLimited(channels[c], frames, std::numeric_limits<float>::max());
    m_written += static_cast<std::int64_t>(frames);
    const auto capacity = static_cast<std::int64_t>(m_capacity);
    if (m_written - m_read > capacity) {
        m_read = m_written - capacity;
        m_overflowed = true;
    }
}

void InputBacklog::Pop(float* const* out, std::size_t channelCount, std::size_t frames) noexcept {
    frames = std::min(frames, Size());
    channelCount = std::min(channelCount, m_lines.size());
    for (std::size_t c = 0; c < channelCount; ++c) m_lines[c].Read(m_read, out[c], frames);
    m_read += static_cast<std::int64_t>(frames);
}

void InputBacklog::Keep(std::size_t kept) noexcept {
    m_read = std::max(m_read, m_written - static_cast<std::int64_t>(kept));
    m_overflowed = false;
}

}  // namespace zen
