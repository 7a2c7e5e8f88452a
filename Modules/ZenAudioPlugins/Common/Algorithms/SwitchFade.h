// A short cross-fade for stepped switches: while it runs, an owner renders
// both the old and the new setting and blends them, so a switch never
// jumps. The weight follows a raised cosine, whose slope starts and ends at
// zero, so the blend has no corner either. Prepare allocates; the rest is
// real-time safe.
#pragma once

#include <cstdint>
#include <vector>

class SwitchFade {
public:
    // Long enough to hide the step, short enough to feel immediate.
    static constexpr double kSeconds = 0.010;

    void Prepare(double sampleRate);
    // Starts again from the old setting.
    void Start() noexcept { m_done = 0; }
    // A switch back while fading: turns around from the present mix (the
    // old setting becomes the new one); from the start when at rest.
    void Restart() noexcept { m_done = Length() - m_done; }
    // Jumps to the new setting.
    void Finish() noexcept { m_done = Length(); }
    bool IsActive() const noexcept { return m_done < Length(); }

    // The new setting's weight at the last sample (1 at rest).
    float Weight() const noexcept { return m_done < Length() ? m_curve[m_done] : 1.0f; }
    // The new setting's weight at this sample (rising to 1); advances.
    float Next() noexcept {
        if (m_done < Length()) ++m_done;
        return Weight();
    }

    // to[i] = from[i] + w (to[i] - from[i]) with the weights of the next
    // `frames` samples, without advancing: once per channel, then Advance.
    void Blend(const float* from, float* to, std::uint32_t frames) const noexcept;
    void Advance(std::uint32_t frames) noexcept { m_done = Length() - m_done > frames ? m_done + frames : Length(); }

private:
    std::uint32_t Length() const noexcept { return static_cast<std::uint32_t>(m_curve.size()); }

    // Weight after k samples, k < length (m_curve[0] = 0).
    std::vector<float> m_curve = std::vector<float>(1, 0.0f);
    std::uint32_t m_done = 1;
};
