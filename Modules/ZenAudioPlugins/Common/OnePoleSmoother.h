// One-pole smoother with a time constant in milliseconds:
//   a = exp(-2*pi / (T * fs * 0.001)), b = 1 - a,  y = a*y + b*x.
// Every smoother enters a process-wide list at construction, so that a change
// of sample rate refreshes all coefficients at once (RefreshAll). A fresh
// smoother (a = 0, b = 1) follows its input at once until the first refresh.
#pragma once

#include <atomic>

namespace zen {

class OnePoleSmoother {
public:
    explicit OnePoleSmoother(int timeConstantMs);
    ~OnePoleSmoother();

    OnePoleSmoother(const OnePoleSmoother&) = delete;
    OnePoleSmoother& operator=(const OnePoleSmoother&) = delete;

    int GetTimeConstantMs() const { return m_timeConstantMs; }
    double GetA() const { return m_a.load(std::memory_order_relaxed); }
    double GetB() const { return m_b.load(std::memory_order_relaxed); }

    // Recomputes a and b for a sample rate in Hz.
    void SetSampleRate(double sampleRate);

    // One step of the smoother's own state toward x; audio thread.
    double Next(double x) noexcept {
        m_state = GetA() * m_state + GetB() * x;
        return m_state;
    }
    double GetState() const { return m_state; }
    void SetState(double state) { m_state = state; }

    // Refreshes every registered smoother for a sample rate. UI thread.
    static void RefreshAll(double sampleRate);

private:
    const int m_timeConstantMs;
    std::atomic<double> m_a{0.0};
    std::atomic<double> m_b{1.0};
    double m_state = 0.0;
};

}  // namespace zen
