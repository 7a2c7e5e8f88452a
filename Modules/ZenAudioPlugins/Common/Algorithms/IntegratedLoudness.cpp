#include "IntegratedLoudness.h"

#include <limits>

namespace zen {

double IntegratedLoudness::RelativeGate() const noexcept {
    if (m_blocks.Count() == 0) return -std::numeric_limits<double>::infinity();
    return LoudnessHistogram::Lufs(m_blocks.Above(LoudnessHistogram::kAbsoluteGate).meanPower) + kRelativeGate;
}

double IntegratedLoudness::Loudness() const noexcept {
    if (m_blocks.Count() == 0) return -std::numeric_limits<double>::infinity();
    const LoudnessHistogram::Selection gated = m_blocks.Above(RelativeGate());
    if (gated.count == 0) return -std::numeric_limits<double>::infinity();
    return LoudnessHistogram::Lufs(gated.meanPower);
}

}  // namespace zen
