// A short linear cross-fade for stepped switches: while it runs, an owner
// renders both the old and the new setting and blends them, so a switch
// never jumps. Real-time safe; Prepare only computes the length.
#pragma once

#include <cstdint>

class SwitchFade {
public:
    // Long enough to hide the step, short enough to feel immediate.
    static constexpr double kSeconds = 0.010;

    void Prepare(double sampleRate) noexcept;
    // Starts again from the old setting.
    void Start() noexcept { m_done = 0; }
    // Jumps to the new setting.
    void Finish() noexcept { m_done = m_length; }
    bool IsActive() const noexcept { return m_done < m_length; }

    // The new setting's weight at this sample (0 at the start, 1 when done); advances.
    float Next() noexcept {
        if (m_done >= m_length) return 1.0f;
        ++m_done;
        return static_cast<float>(m_done) * m_step;
    }

    // to[i] = from[i] + w (to[i] - from[i]) with the weights of the next
    // `frames` samples, without advancing: once per channel, then Advance.
    void Blend(const float* from, float* to, std::uint32_t frames) const noexcept;
    void Advance(std::uint32_t frames) noexcept { m_done = m_length - m_done > frames ? m_done + frames : m_length; }

private:
    std::uint32_t m_length = 1;
    std::uint32_t m_done = 1;
    float m_step = 1.0f;
};
