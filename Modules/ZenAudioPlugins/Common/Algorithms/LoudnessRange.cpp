#include "LoudnessRange.h"

#include <cmath>
#include <limits>

namespace zen {

double LoudnessRange::Gate() const noexcept {
    return LoudnessHistogram::Lufs(m_windows.Above(LoudnessHistogram::kAbsoluteGate).meanPower) + kRelativeGate;
}

double LoudnessRange::Percentile(double fraction) const noexcept {
    if (m_windows.Count() == 0) return -std::numeric_limits<double>::infinity();
    const double gate = Gate();
    const std::uint64_t count = m_windows.Above(gate).count;
    if (count == 0) return -std::numeric_limits<double>::infinity();
    // The value at the rounded position in ascending order, as Tech 3342 sorts them.
    const auto rank = static_cast<std::uint64_t>(std::llround(static_cast<double>(count - 1) * fraction));
    return m_windows.LoudnessAtRank(gate, rank);
}

double LoudnessRange::Range() const noexcept {
    const double low = Low();
    const double high = High();
    return std::isfinite(low) && std::isfinite(high) ? high - low : 0.0;
}

}  // namespace zen
