// The early-reflection tap network: a multi-tap delay over planar input
// channels. Per frame, the frame is written first; then tap k's lane is the
// inner product of its input weights with the frame `delay_k` samples old.
// The 16 lanes leave as 16 planar rows.
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "zn_reflections_param.h"

namespace zen::reverb {

class zn_reflections {
public:
    static constexpr std::uint32_t kTaps = zn_reflections_param::kTaps;

    // Memory for `inputs` channels, delays up to `maxDelay` and blocks of up
    // to `maxFrames`; cleared. Allocates.
    void Dimension(std::uint32_t inputs, std::uint32_t maxDelay, std::uint32_t maxFrames = 1);
    // Delays below 1 count as 1. The memory grows (never shrinks) for a
    // longer tap; that allocates, so owners dimension for their longest.
    void Configure(const zn_reflections_param& param);
    void Reset() noexcept;

    // `frames` frames of input (channel ch at in + ch * inStride) to the 16
    // lanes (lane k at lanes + k * laneStride).
    void Process(const float* in, std::size_t inStride, float* lanes, std::size_t laneStride,
                 std::size_t frames) noexcept;

    std::uint32_t Inputs() const { return m_inputs; }
    std::uint32_t Delay(std::uint32_t tap) const { return m_delays[tap]; }
    // Frames the memory holds.
    std::uint32_t Capacity() const { return m_capacity; }

protected:
    void Grow(std::uint32_t frames);
    // Writes `frames` frames after the newest one; the newest is then the last of them.
    void Push(const float* in, std::size_t inStride, std::size_t frames) noexcept;
    // Channel ch's line, indexed by position: the sample `delay` frames
    // before the one at position p is Line(ch)[p - delay], for any delay
    // below the capacity (every sample is stored twice, a capacity apart).
    const float* Line(std::uint32_t ch) const noexcept {
        return m_memory.data() + static_cast<std::size_t>(ch) * 2 * m_capacity + m_capacity;
    }
    float Sample(std::uint32_t ch, std::uint32_t p, std::uint32_t delay) const noexcept {
        return Line(ch)[static_cast<std::ptrdiff_t>(p) - static_cast<std::ptrdiff_t>(delay)];
    }
    // The position after `p`.
    std::uint32_t Next(std::uint32_t p) const noexcept { return p + 1 == m_capacity ? 0 : p + 1; }
    void SetWeights(const ublas::matrix<float>& weights);

    std::vector<float> m_memory;   // per input: 2 x capacity samples
    std::vector<float> m_weights;  // kTaps x inputs
    std::uint32_t m_delays[kTaps] = {};
    std::uint32_t m_inputs = 1;
    std::uint32_t m_capacity = 1;
    std::uint32_t m_maxFrames = 1;
    std::uint32_t m_write = 0;  // position of the newest frame
};

}  // namespace zen::reverb
