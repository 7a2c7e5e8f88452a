// Input the pitch engine has not seen yet: blocks that took the bypass path
// while the engine could not be reached, kept so that the engine's stream
// has no gap when it is back. Holds up to Capacity() samples per channel;
// beyond that the oldest go, and Overflowed() says the stream has a gap.
// Allocate allocates; everything else is real-time safe.
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "FFT/Buffer.h"

namespace zen {

class InputBacklog {
public:
    // At least `capacity` samples for each of `channels`; empties it.
    void Allocate(std::size_t channels, std::size_t capacity);
    void Clear() noexcept;

    std::size_t Capacity() const noexcept { return m_capacity; }
    std::size_t Size() const noexcept { return static_cast<std::size_t>(m_written - m_read); }
    bool Empty() const noexcept { return m_written == m_read; }
    bool Overflowed() const noexcept { return m_overflowed; }

    // Appends a block; non-finite samples enter as silence.
    void Push(const float* const* channels, std::size_t channelCount, std::size_t frames) noexcept;
    // Takes the oldest `frames` samples (at most Size()) of every channel.
    void Pop(float* const* out, std::size_t channelCount, std::size_t frames) noexcept;
    // Drops all but the newest `kept` samples and forgets an overflow.
    void Keep(std::size_t kept) noexcept;

private:
    std::vector<ora::fft::Buffer> m_lines;
    std::size_t m_capacity = 0;
    std::int64_t m_written = 0;
    std::int64_t m_read = 0;
    bool m_overflowed = false;
};

}  // namespace zen
