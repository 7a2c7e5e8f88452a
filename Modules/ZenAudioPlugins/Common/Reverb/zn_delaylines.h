// The circular delay lines of the late reverberation, one per lane. Lines
// are read and written a chunk at a time: a chunk no longer than the
// shortest line reads every sample before the write that replaces it.
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

namespace zen::reverb {

class zn_delaylines {
public:
    // `lines` lines able to hold `capacity` samples each, all 1 long and
    // cleared. Allocates.
    void Dimension(std::uint32_t lines, std::uint32_t capacity);
    // New lengths (at least 1 each), cleared. Grows the memory, never
    // shrinks it, when a length exceeds the capacity (this allocates).
    void SetLengths(const std::uint32_t* lengths);
    void Clear() noexcept;

    std::uint32_t Count() const { return static_cast<std::uint32_t>(m_lengths.size()); }
    std::uint32_t Capacity() const { return m_capacity; }
    std::uint32_t Length(std::uint32_t line) const { return m_lengths[line]; }
    std::uint32_t Shortest() const { return m_shortest; }

    // Row i (at rows + i * stride) gets the `count` samples that entered
    // line i Length(i) samples before. count <= Shortest().
    void Read(float* rows, std::size_t stride, std::size_t count) const noexcept;
    // Row i enters line i; the lines advance by `count`.
    void Write(const float* rows, std::size_t stride, std::size_t count) noexcept;

private:
    std::vector<float> m_memory;  // line i at i * m_capacity
    std::vector<std::uint32_t> m_lengths;
    std::vector<std::uint32_t> m_positions;
    std::uint32_t m_capacity = 0;
    std::uint32_t m_shortest = 1;
};

}  // namespace zen::reverb
