#include "FFT/TimeMap.h"

#include <algorithm>
#include <cmath>

namespace ora::fft {

bool TimeMap::Add(double analysis, double synthesis) {
    if (m_count == kCapacity) return false;
    m_analysis[m_count] = analysis;
    m_synthesis[m_count] = synthesis;
    ++m_count;
    return true;
}

double TimeMap::operator()(double analysis) const {
    if (m_count == 0) return analysis;
    if (m_count == 1) return m_synthesis[0] + (analysis - m_analysis[0]);
    std::size_t i = 1;
    while (i + 1 < m_count && analysis > m_analysis[i]) ++i;
    const double slope = (m_synthesis[i] - m_synthesis[i - 1]) / (m_analysis[i] - m_analysis[i - 1]);
    return m_synthesis[i - 1] + (analysis - m_analysis[i - 1]) * slope;
}

double TimeMap::MaxSlope() const {
    if (m_count < 2) return 1.0;
    double slope = 0.0;
    for (std::size_t i = 1; i < m_count; ++i)
        slope = std::max(slope, (m_synthesis[i] - m_synthesis[i - 1]) / (m_analysis[i] - m_analysis[i - 1]));
    return slope;
}

bool TimeMap::IsLine(double& slope, double& offset) const {
    if (m_count < 2) {
        slope = 1.0;
        offset = m_count == 1 ? m_synthesis[0] - m_analysis[0] : 0.0;
        return true;
    }
    slope = (m_synthesis[1] - m_synthesis[0]) / (m_analysis[1] - m_analysis[0]);
    offset = m_synthesis[0] - slope * m_analysis[0];
    for (std::size_t i = 2; i < m_count; ++i)
        if (std::abs(offset + slope * m_analysis[i] - m_synthesis[i]) > 1e-9 * (1.0 + std::abs(m_synthesis[i])))
            return false;
    return true;
}

}  // namespace ora::fft
