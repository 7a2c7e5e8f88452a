// Per-channel input history of a filter that reads back in time. Each
// channel's run holds the last History() inputs followed by the chunk being
// filtered, so that vector kernels read one contiguous run. The history is
// the state a filter front hands to a rebuilt implementation.
#pragma once

#include <cstddef>

#include "System/AlignedBuffer.h"

namespace ora::numeric {

class FilterHistory {
public:
    // Inputs filtered per pass; longer blocks are split.
    static constexpr std::size_t kChunk = 256;

    FilterHistory() = default;
    FilterHistory(int channels, std::size_t history) { Dimension(channels, history); }

    // Allocates. Channels that stay keep their newest inputs; new ones start silent.
    void Dimension(int channels, std::size_t history);

    int Channels() const { return m_channels; }
    std::size_t History() const { return m_history; }

    // Copies `frames` (at most kChunk) inputs behind the channel's history and
    // returns the start of its run (History() + frames samples).
    const float* Load(int channel, const float* input, std::size_t frames) noexcept;
    // After a loaded chunk was filtered: its newest inputs become the history.
    void Advance(int channel, std::size_t frames) noexcept;
    void Clear() noexcept { m_data.Clear(); }

private:
    float* Run(int channel) noexcept { return m_data.data() + static_cast<std::size_t>(channel) * m_stride; }

    int m_channels = 0;
    std::size_t m_history = 0;
    std::size_t m_stride = 0;  // floats per channel, a whole number of 64-byte lines
    AlignedBuffer<float> m_data;
};

}  // namespace ora::numeric
