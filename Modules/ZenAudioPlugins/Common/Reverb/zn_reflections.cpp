#include "zn_reflections.h"

#include <algorithm>

namespace zen::reverb {

void zn_reflections::Dimension(std::uint32_t inputs, std::uint32_t maxDelay, std::uint32_t maxFrames) {
    m_inputs = std::max(inputs, 1u);
    m_maxFrames = std::max(maxFrames, 1u);
    m_weights.assign(static_cast<std::size_t>(kTaps) * m_inputs, 0.0f);
    for (std::uint32_t k = 0; k < kTaps; ++k) {
        m_weights[k * m_inputs + k % m_inputs] = 1.0f;
        m_delays[k] = 1;
    }
    m_capacity = 0;
    m_memory.clear();
    Grow(maxDelay + 1);
}

void zn_reflections::Grow(std::uint32_t frames) {
    // A block is written before its taps are read: its frames must not
    // reach the oldest sample the block's first frame reads.
    frames += m_maxFrames - 1;
    if (frames <= m_capacity) return;
    m_capacity = frames;
    m_memory.assign(static_cast<std::size_t>(m_capacity) * 2 * m_inputs, 0.0f);
    m_write = 0;
}

void zn_reflections::SetWeights(const ublas::matrix<float>& weights) {
    const std::size_t columns = std::min<std::size_t>(weights.size2(), m_inputs);
    for (std::uint32_t k = 0; k < kTaps && k < weights.size1(); ++k)
        for (std::size_t ch = 0; ch < columns; ++ch) m_weights[k * m_inputs + ch] = weights(k, ch);
}

void zn_reflections::Configure(const zn_reflections_param& param) {
    std::uint32_t longest = 1;
    for (std::uint32_t k = 0; k < kTaps; ++k) {
        m_delays[k] = std::max(param.delays(k), 1u);
        longest = std::max(longest, m_delays[k]);
    }
    Grow(longest + 1);
    SetWeights(param.weights);
}

void zn_reflections::Reset() noexcept { std::fill(m_memory.begin(), m_memory.end(), 0.0f); }

void zn_reflections::Push(const float* in, std::size_t inStride, std::size_t frames) noexcept {
    for (std::uint32_t ch = 0; ch < m_inputs; ++ch) {
        float* line = m_memory.data() + static_cast<std::size_t>(ch) * 2 * m_capacity;
        const float* x = in + ch * inStride;
        std::uint32_t p = m_write;
        for (std::size_t f = 0; f < frames; ++f) {
            p = Next(p);
            line[p] = line[p + m_capacity] = x[f];
        }
    }
    m_write = static_cast<std::uint32_t>((m_write + frames) % m_capacity);
}

void zn_reflections::Process(const float* in, std::size_t inStride, float* lanes, std::size_t laneStride,
                             std::size_t frames) noexcept {
    for (std::size_t f = 0; f < frames; ++f) {
        Push(in + f, inStride, 1);
        for (std::uint32_t k = 0; k < kTaps; ++k) {
            const float* w = m_weights.data() + k * m_inputs;
            float acc = 0.0f;
            for (std::uint32_t ch = 0; ch < m_inputs; ++ch) acc += w[ch] * Sample(ch, m_write, m_delays[k]);
            lanes[k * laneStride + f] = acc;
        }
    }
}

}  // namespace zen::reverb
