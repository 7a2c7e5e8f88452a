#include "RangeLaw.h"

#include <algorithm>

#include "LevellingSettings.h"

namespace zen::host {

RangeLaw::RangeLaw(const LevellingSettings& settings) {
    for (std::uint32_t p = 0; p < LevellingSettings::kRangePoints; ++p) {
        const float in = settings.Get(LevellingSettings::kFirstRangePoint + 2 * p);
        if (in > LevellingSettings::kNoRangePoint)
            m_points.emplace_back(in, settings.Get(LevellingSettings::kFirstRangePoint + 2 * p + 1));
    }
    std::sort(m_points.begin(), m_points.end());
}

double RangeLaw::Gain(double loudness) const {
    if (m_points.empty()) return 0.0;
    if (loudness <= m_points.front().first) return m_points.front().second;
    for (std::size_t i = 1; i < m_points.size(); ++i) {
        const auto& [x0, y0] = m_points[i - 1];
        const auto& [x1, y1] = m_points[i];
        // Two points at one In: the step is taken at that In.
        if (loudness <= x1) return x1 > x0 ? y0 + (y1 - y0) * (loudness - x0) / (x1 - x0) : y1;
    }
    return m_points.back().second;
}

}  // namespace zen::host
