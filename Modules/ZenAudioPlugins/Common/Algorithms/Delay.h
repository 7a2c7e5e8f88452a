// Fixed delay lines, one per channel, all of the same length in samples.
// Carries look-ahead in dynamics plug-ins and the latency of a bypassed
// plug-in. Dimension allocates; everything else is real-time safe.
#pragma once

#include <cstdint>
#include <vector>

#include "../ZenAudioAlgorithm.h"

namespace zen {

class Delay : public ZenAudioAlgorithm {
    Q_OBJECT

public:
    Delay();

    // Sizes the lines for a channel count, a block size and a delay in
    // samples, and clears them.
    void Dimension(std::uint64_t channels, std::uint32_t blockSize, std::uint32_t delaySamples);
    std::uint32_t GetDelay() const { return m_delay; }

    // Takes one sample into a channel's line and returns the sample that
    // entered GetDelay() samples earlier. The channel must be dimensioned.
    float ReadWrite(std::uint64_t channel, float x) noexcept {
        if (m_delay == 0) return x;
        std::uint32_t& position = m_positions[channel];
        float& slot = m_lines[channel * m_delay + position];
        const float y = slot;
        slot = x;
        if (++position == m_delay) position = 0;
        return y;
    }

    bool Prepare(float sampleRate, std::uint32_t maxBlock) override;
    void SetChannelCount(std::uint64_t channels) override;
    bool ProcessChannel(std::uint64_t channel, float* samples, std::uint64_t count) override;
    bool Process(float* const* channels, std::uint64_t count) override;
    // Clears every line.
    void Reset() override;

private:
    std::vector<float> m_lines;  // channel-major, m_delay samples each
    std::vector<float> m_scratch;  // m_delay samples
    std::vector<std::uint32_t> m_positions;
    std::uint32_t m_delay = 0;
};

}  // namespace zen
