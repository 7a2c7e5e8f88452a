// Loudness range (EBU Tech 3342) over any length: the spread of the
// short-term loudness (3 s windows every 100 ms) between its 10th and 95th
// percentiles, counting only windows above the absolute gate (-70 LUFS) and
// a relative gate 20 LU below their mean. Constant memory, exact as
// LoudnessHistogram says.
#pragma once

#include "LoudnessHistogram.h"

namespace zen {

class LoudnessRange {
public:
    static constexpr double kRelativeGate = -20.0;  // LU
    static constexpr double kLowPercentile = 0.10;
    static constexpr double kHighPercentile = 0.95;

    // A short-term window's power (weighted mean square over the channels).
    void AddShortTerm(double power) noexcept { m_windows.Add(power); }
    void Clear() noexcept { m_windows.Clear(); }

    // LU; 0 while no window lies above the gates.
    double Range() const noexcept;
    // The two percentiles in LUFS; -inf while there are none.
    double Low() const noexcept { return Percentile(kLowPercentile); }
    double High() const noexcept { return Percentile(kHighPercentile); }

private:
    double Gate() const noexcept;
    double Percentile(double fraction) const noexcept;

    LoudnessHistogram m_windows;
};

}  // namespace zen
