// Carries a delay time to a new setting without a click: two one-pole stages
// in series, so the read position accelerates and settles smoothly (the
// pitch bends and returns) instead of jumping. Plain value type, real-time safe.
#pragma once

#include <cmath>

class TimeGlide {
public:
    // Each stage's time constant; a change is mostly done after 3 of them.
    static constexpr double kStageMs = 60.0;

    void SetSampleRate(double sampleRate) noexcept { m_a = std::exp(-1000.0 / (kStageMs * sampleRate)); }
    void SetTarget(double target) noexcept { m_target = target; }
    // Jumps to the target (after Prepare or Reset).
    void Settle() noexcept { m_first = m_second = m_target; }
    double GetTarget() const noexcept { return m_target; }

    double Next() noexcept {
        m_first = m_target + m_a * (m_first - m_target);
        m_second = m_first + m_a * (m_second - m_first);
        return m_second;
    }

private:
    double m_a = 0.0;
    double m_target = 0.0;
    double m_first = 0.0;
    double m_second = 0.0;
};
