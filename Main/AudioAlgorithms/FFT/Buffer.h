// A channel's sample buffer in the FFT engine: either a ring addressed by
// absolute sample position (the input history frames are read from), or a
// linear buffer (the overlap-add accumulator frames are added into).
#pragma once

#include <cstddef>
#include <cstdint>

#include "System/AlignedBuffer.h"

namespace ora::fft {

class Buffer {
public:
    enum class Layout { Ring, Linear };

    // Allocates; throws std::bad_alloc. A ring's capacity is rounded up to a
    // power of two.
    void Allocate(std::size_t capacity, Layout layout);
    void Clear() noexcept;

    bool is_linearized() const { return m_layout == Layout::Linear; }
    std::size_t Capacity() const { return m_data.size(); }
    float* data() noexcept { return m_data.data(); }
    const float* data() const noexcept { return m_data.data(); }

    // Ring: appends samples at the write position.
    void Write(const float* samples, std::size_t count) noexcept;
    // Ring: appends samples limited to +-limit, non-finite ones as zero.
    void WriteLimited(const float* samples, std::size_t count, float limit) noexcept;
    std::int64_t Written() const { return m_written; }
    // Ring: samples [start, start + count); positions never written or
    // already overwritten read as zero.
    void Read(std::int64_t start, float* out, std::size_t count) const noexcept;
    float At(std::int64_t position) const noexcept;
    // Ring: a position the caller knows to be held (written, not yet overwritten).
    float Held(std::int64_t position) const noexcept { return m_data[static_cast<std::size_t>(position) & m_mask]; }

    // Linear: drops the first `count` samples and zero-fills the end.
    void Shift(std::size_t count) noexcept;

private:
    AlignedBuffer<float> m_data;
    Layout m_layout = Layout::Linear;
    std::size_t m_mask = 0;
    std::int64_t m_written = 0;
};

}  // namespace ora::fft
