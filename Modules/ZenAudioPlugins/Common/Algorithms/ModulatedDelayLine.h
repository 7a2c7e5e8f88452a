// A delay line read at any fractional delay, for delays that move (chorus,
// flanger, gliding echo times). Reads interpolate with a third-order
// Lagrange polynomial over four samples: exact at whole-sample delays, flat
// group delay at low frequencies, and far less modulation noise than linear
// interpolation, with none of an allpass interpolator's memory of past delays.
// Resize allocates; everything else is real-time safe.
#pragma once

#include <cmath>
#include <cstdint>
#include <vector>

class ModulatedDelayLine {
public:
    // Reads need a sample on either side of the delay.
    static constexpr double kMinDelay = 2.0;
    // Samples are clamped here on the way in, so reads of a line full of
    // huge values cannot overflow.
    static constexpr float kCeiling = 1e30f;

    // Room for delays up to `maxDelay` samples; clears the line.
    void Resize(double maxDelay);
    void Clear() noexcept;
    double GetMaxDelay() const { return m_maxDelay; }

    // The sample `delay` samples before the one the next Push stores, so a
    // read before the push is the input delayed by `delay`. The delay is
    // clamped to [kMinDelay, GetMaxDelay()].
    float Read(double delay) const noexcept {
        delay = delay > kMinDelay ? delay : kMinDelay;
        delay = delay < m_maxDelay ? delay : m_maxDelay;
        // Positive, so truncation is the floor (and no library call).
        const auto whole = static_cast<std::uint32_t>(delay);
        const auto f = static_cast<float>(delay - whole);
        // Newest of the four taps, one sample nearer than `whole`.
        const std::uint32_t i = (m_write - whole + 1u) & m_mask;
        const float x0 = m_line[i];
        const float x1 = m_line[(i - 1u) & m_mask];
        const float x2 = m_line[(i - 2u) & m_mask];
        const float x3 = m_line[(i - 3u) & m_mask];
        // The Lagrange polynomial through the taps at offsets -1, 0, 1, 2 from
        // `whole`, in powers of f (fewer operations than the four weights).
        const float c1 = x2 - (1.0f / 3.0f) * x0 - 0.5f * x1 - (1.0f / 6.0f) * x3;
        const float c2 = 0.5f * (x0 + x2) - x1;
        const float c3 = (1.0f / 6.0f) * (x3 - x0) + 0.5f * (x1 - x2);
        return ((c3 * f + c2) * f + c1) * f + x1;
    }

    // Stores the newest sample; non-finite samples are stored as silence.
    void Push(float x) noexcept {
        if (!(std::fabs(x) <= kCeiling)) x = std::isfinite(x) ? std::copysign(kCeiling, x) : 0.0f;
        m_line[m_write] = x;
        m_write = (m_write + 1u) & m_mask;
    }

private:
    std::vector<float> m_line;
    std::uint32_t m_mask = 0;
    std::uint32_t m_write = 0;
    double m_maxDelay = kMinDelay;
};
