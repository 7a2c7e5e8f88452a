#include "LoopPlayer.h"

#include <algorithm>

namespace zenfx {

LoopPlayer::LoopPlayer(PluginFeed& feed, const std::vector<float>& interleaved, std::uint32_t channels,
                       std::uint32_t deviceOutputs)
    : m_feed(feed),
      m_source(interleaved),
      m_channels(std::max(channels, 1u)),
      m_frames(interleaved.size() / m_channels),
      m_block(static_cast<std::size_t>(feed.MaxBlock()) * m_channels, 0.0f),
      m_deviceOutputs(deviceOutputs) {}

void LoopPlayer::ProcessBlock(const float* const*, float* const* outputs, std::uint32_t frames) noexcept {
    frames = std::min(frames, m_feed.MaxBlock());
    std::size_t filled = 0;
    const std::size_t wanted = std::size_t{frames} * m_channels;
    while (m_frames > 0 && filled < wanted) {
        const std::size_t from = static_cast<std::size_t>(m_position) * m_channels;
        const std::size_t count = std::min(wanted - filled, m_source.size() - from);
        std::copy_n(m_source.data() + from, count, m_block.data() + filled);
        filled += count;
        m_position = (m_position + count / m_channels) % m_frames;
    }
    std::fill(m_block.begin() + static_cast<std::ptrdiff_t>(filled), m_block.end(), 0.0f);
    if (!m_feed.Process(m_block.data(), frames)) return;
    for (std::uint32_t c = 0; c < std::min(m_feed.Outputs(), m_deviceOutputs); ++c)
        std::copy_n(m_feed.Output(c), frames, outputs[c]);
}

}  // namespace zenfx
