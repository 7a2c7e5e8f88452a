#include "FFT/TimeMap.h"

#include <algorithm>

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

}  // namespace ora::fft
