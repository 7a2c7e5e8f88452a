// The early-reflection tap network: a multi-tap delay over interleaved input
// frames. Per frame, the frame is written first; then tap k's lane is the
// inner product of its input weights with the frame `delay_k` samples old.
// The 16 lanes leave as one 16-float frame.
#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <vector>

#include "zn_reflections_param.h"

namespace zen::reverb {

class zn_reflections {
public:
    static constexpr std::uint32_t kTaps = zn_reflections_param::kTaps;

    // Memory for `inputs` channels and delays up to `maxDelay`; cleared. Allocates.
    void Dimension(std::uint32_t inputs, std::uint32_t maxDelay);
    // Delays below 1 count as 1. The memory grows (never shrinks) for a
    // longer tap; that allocates, so owners dimension for their longest.
    void Configure(const zn_reflections_param& param);
    void Reset() noexcept;

    // `frames` input frames (`Inputs()` floats each) to 16-float lane frames.
    void Process(const float* in, float* lanes, std::size_t frames) noexcept;

    std::uint32_t Inputs() const { return m_inputs; }
    std::uint32_t Delay(std::uint32_t tap) const { return m_delays[tap]; }
    // Frames the memory holds.
    std::uint32_t Capacity() const { return m_capacity; }

protected:
    void Grow(std::uint32_t frames);
    void Push(const float* frame) noexcept {
        if (++m_write == m_capacity) m_write = 0;
        std::copy(frame, frame + m_inputs, m_memory.data() + static_cast<std::size_t>(m_write) * m_inputs);
    }
    // The frame `delay` samples before the newest one (delay < capacity).
    const float* FrameAt(std::uint32_t delay) const noexcept {
        const std::uint32_t index = m_write >= delay ? m_write - delay : m_write + m_capacity - delay;
        return m_memory.data() + static_cast<std::size_t>(index) * m_inputs;
    }
    void SetWeights(const ublas::matrix<float>& weights);

    std::vector<float> m_memory;   // interleaved frames
    std::vector<float> m_weights;  // kTaps x inputs
    std::uint32_t m_delays[kTaps] = {};
    std::uint32_t m_inputs = 1;
    std::uint32_t m_capacity = 1;
    std::uint32_t m_write = 0;
};

}  // namespace zen::reverb
