#include "Delay.h"

#include <algorithm>
#include <cstring>

namespace zen {

Delay::Delay() = default;

void Delay::Dimension(std::uint64_t channels, std::uint32_t blockSize, std::uint32_t delaySamples) {
    ZenAudioAlgorithm::SetChannelCount(channels);
    SetMaxBlockSize(blockSize);
    m_delay = delaySamples;
    m_lines.assign(channels * delaySamples, 0.0f);
    m_scratch.assign(delaySamples, 0.0f);
    m_positions.assign(channels, 0);
}

bool Delay::Prepare(float sampleRate, std::uint32_t maxBlock) {
    Reset();
    return ZenAudioAlgorithm::Prepare(sampleRate, maxBlock);
}

void Delay::SetChannelCount(std::uint64_t channels) {
    // Channel-major lines: kept channels keep their contents, new ones start silent.
    ZenAudioAlgorithm::SetChannelCount(channels);
    m_lines.resize(channels * m_delay, 0.0f);
    m_positions.resize(channels, 0);
}

bool Delay::ProcessChannel(std::uint64_t channel, float* samples, std::uint64_t count) {
    if (channel >= GetChannelCount()) return false;
    if (m_delay == 0) return true;
    float* line = m_lines.data() + channel * m_delay;
    std::uint32_t& position = m_positions[channel];
    const std::size_t bytes = sizeof(float);
    if (count >= m_delay) {
        // The block's last m_delay samples become the line; the line, oldest
        // first, then the rest of the block come out: a few long copies.
        const std::uint64_t kept = count - m_delay;
        std::memcpy(m_scratch.data(), samples + kept, m_delay * bytes);
        std::memmove(samples + m_delay, samples, kept * bytes);
        std::memcpy(samples, line + position, (m_delay - position) * bytes);
        std::memcpy(samples + (m_delay - position), line, position * bytes);
        std::memcpy(line, m_scratch.data(), m_delay * bytes);
        position = 0;
        return true;
    }
    // Shorter blocks swap with the line in at most two runs.
    for (std::uint64_t done = 0; done < count;) {
        const std::uint64_t run = std::min<std::uint64_t>(count - done, m_delay - position);
        float* x = samples + done;
        float* slot = line + position;
        std::memcpy(m_scratch.data(), slot, run * bytes);
        std::memcpy(slot, x, run * bytes);
        std::memcpy(x, m_scratch.data(), run * bytes);
        done += run;
        position = static_cast<std::uint32_t>((position + run) % m_delay);
    }
    return true;
}

bool Delay::Process(float* const* channels, std::uint64_t count) {
    for (std::uint64_t c = 0; c < GetChannelCount(); ++c)
        if (!ProcessChannel(c, channels[c], count)) return false;
    return true;
}

void Delay::Reset() {
    std::fill(m_lines.begin(), m_lines.end(), 0.0f);
    std::fill(m_positions.begin(), m_positions.end(), 0u);
}

}  // namespace zen
