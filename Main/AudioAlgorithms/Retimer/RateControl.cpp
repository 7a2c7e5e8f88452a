#include "Retimer/RateControl.h"

#include <algorithm>
#include <cmath>

namespace ora::retimer {

std::int64_t rate_control::LeastLatency(std::size_t frameLength, double minRatio, std::size_t lookahead) {
    // The last frame the reader needs is centred at most half a frame plus
    // the look-ahead ahead of it in stretched time: that is that much over
    // minRatio in input time, and the frame reaches half a frame beyond.
    const double half = static_cast<double>(frameLength) / 2.0;
    return static_cast<std::int64_t>(half + std::ceil((half + static_cast<double>(lookahead)) / minRatio)) + kMargin;
}

std::int64_t rate_control::Latency(const Param& param, std::int64_t least) {
    return std::max(least + param.m_ExtraLatency, param.m_LatencyOverride);
}

void rate_control::Configure(const Param& param, std::int64_t latency, double minRatio, double maxRatio) {
    m_glide = param.m_Immediate != 0 ? 1.0 : std::clamp(static_cast<double>(param.m_Glide), 1e-6, 1.0);
    m_minRatio = minRatio;
    m_maxRatio = maxRatio;
    m_latency = Latency(param, latency);
    m_origin = param.m_Origin;
    m_rate = m_target = std::clamp(static_cast<double>(param.m_Rate), minRatio, maxRatio);
}

void rate_control::Reset(double ratio) noexcept {
    m_target = std::clamp(ratio, m_minRatio, m_maxRatio);
    m_rate = m_target;
}

void rate_control::SetTarget(double ratio) noexcept { m_target = std::clamp(ratio, m_minRatio, m_maxRatio); }

}  // namespace ora::retimer
