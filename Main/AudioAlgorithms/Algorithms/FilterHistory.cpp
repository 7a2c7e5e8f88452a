#include "Algorithms/FilterHistory.h"

#include <algorithm>
#include <cstring>

namespace ora::numeric {

namespace {

constexpr std::size_t kLineFloats = kBufferAlignment / sizeof(float);

}  // namespace

void FilterHistory::Dimension(int channels, std::size_t history) {
    const std::size_t stride = (history + kChunk + kLineFloats - 1) / kLineFloats * kLineFloats;
    AlignedBuffer<float> data(static_cast<std::size_t>(std::max(channels, 0)) * stride);
    const std::size_t kept = std::min(history, m_history);
    for (int c = 0; c < std::min(channels, m_channels); ++c)
        std::memcpy(data.data() + static_cast<std::size_t>(c) * stride + history - kept, Run(c) + m_history - kept,
                    kept * sizeof(float));
    m_data = std::move(data);
    m_channels = std::max(channels, 0);
    m_history = history;
    m_stride = stride;
}

const float* FilterHistory::Load(int channel, const float* input, std::size_t frames) noexcept {
    float* run = Run(channel);
    std::memcpy(run + m_history, input, frames * sizeof(float));
    return run;
}

void FilterHistory::Advance(int channel, std::size_t frames) noexcept {
    float* run = Run(channel);
    std::memmove(run, run + frames, m_history * sizeof(float));
}

}  // namespace ora::numeric
