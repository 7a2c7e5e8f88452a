#include "zn_reverberant_u15.h"

#include <algorithm>

namespace zen::reverb {

void zn_reverberant_u15::Dimension(std::uint32_t channels, std::uint32_t maxLength, std::uint32_t maxFrames) {
    m_lines.Dimension(kLines, maxLength);
    m_out.Dimension(channels);
    m_maxFrames = std::max(maxFrames, 1u);
    m_d.Resize(static_cast<std::size_t>(m_maxFrames) * kLanes);
    m_m.Resize(static_cast<std::size_t>(m_maxFrames) * kLanes);
    Reset();
}

bool zn_reverberant_u15::LengthsDiffer(const zn_reverberant_u15_core_param& core) const {
    for (std::uint32_t i = 0; i < kLines; ++i)
        if (std::max(core.lengths(i), 1u) != m_lines.Length(i)) return true;
    return false;
}

void zn_reverberant_u15::Configure(const zn_reverberant_u15_param& param, bool withLengths) {
    if (withLengths && LengthsDiffer(param.core)) {
        std::uint32_t lengths[kLines];
        for (std::uint32_t i = 0; i < kLines; ++i) lengths[i] = param.core.lengths(i);
        m_lines.SetLengths(lengths);
    }
    float c[kLanes], g[kLanes];
    for (std::uint32_t i = 0; i < kLanes; ++i) {
        c[i] = param.core.coefficients(i);
        g[i] = param.core.gains(i);
    }
    m_damping.SetCoefficients(c, g);
    m_out.Configure(param.out);
}

void zn_reverberant_u15::Reset() noexcept {
    m_lines.Clear();
    m_damping.Reset();
    m_out.Reset();
    m_d.Clear();
    m_m.Clear();
}

void zn_reverberant_u15::Process(const float* u, float* out, std::size_t frames) noexcept {
    const std::size_t chunkLimit = std::min<std::size_t>(m_lines.Shortest(), m_maxFrames);
    while (frames > 0) {
        const std::size_t n = std::min(frames, chunkLimit);
        m_lines.Read(m_d.data(), kLanes, n);
        m_out.Process(m_d.data(), out, n);
        m_mix.Process(m_d.data(), u, m_m.data(), n);
        m_damping.Process(m_m.data(), m_m.data(), n);
        m_lines.Write(m_m.data(), kLanes, n);
        u += n * kLanes;
        out += n * kLanes;
        frames -= n;
    }
}

}  // namespace zen::reverb
