#include "zn_reverberant_u15.h"

#include <algorithm>
#include <cmath>

namespace zen::reverb {

void zn_reverberant_u15::Dimension(std::uint32_t channels, std::uint32_t maxLength, std::uint32_t maxFrames,
                                   float sampleRate) {
    m_glideFrames = std::max(1.0, kGlideSeconds * sampleRate);
    m_lines.Dimension(kLines, maxLength);
    m_maxFrames = std::max(maxFrames, 1u);
    m_out.Dimension(channels, m_maxFrames);
    const std::size_t size = static_cast<std::size_t>(m_maxFrames) * kLanes;
    m_dRows.Resize(size);
    m_wRows.Resize(size);
    m_d.Resize(size);
    m_m.Resize(size);
    for (std::uint32_t k = 0; k < kLanes; ++k) {
        m_dRowPointers[k] = m_dRows.data() + k * m_maxFrames;
        m_wRowPointers[k] = m_wRows.data() + k * m_maxFrames;
    }
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
    bool changed = false;
    for (std::uint32_t i = 0; i < kLanes; ++i) {
        changed |= m_targetC[i] != param.core.coefficients(i) || m_targetG[i] != param.core.gains(i);
        m_targetC[i] = param.core.coefficients(i);
        m_targetG[i] = param.core.gains(i);
    }
    if (m_settled) {
        m_settled = false;
        std::copy(m_targetC, m_targetC + kLanes, m_c);
        std::copy(m_targetG, m_targetG + kLanes, m_g);
        m_damping.SetCoefficients(m_c, m_g);
        m_gliding = false;
    } else if (changed) {
        m_gliding = true;
    }
    m_out.Configure(param.out);
}

void zn_reverberant_u15::Glide(std::size_t frames) noexcept {
    const auto k = static_cast<float>(1.0 - std::exp(-static_cast<double>(frames) / m_glideFrames));
    bool settled = true;
    for (std::uint32_t i = 0; i < kLanes; ++i) {
        m_c[i] += k * (m_targetC[i] - m_c[i]);
        m_g[i] += k * (m_targetG[i] - m_g[i]);
        if (std::fabs(m_targetC[i] - m_c[i]) < 1e-6f && std::fabs(m_targetG[i] - m_g[i]) < 1e-6f) {
            m_c[i] = m_targetC[i];
            m_g[i] = m_targetG[i];
        } else {
            settled = false;
        }
    }
    m_damping.SetCoefficients(m_c, m_g);
    m_gliding = !settled;
}

void zn_reverberant_u15::Reset() noexcept {
    std::copy(m_targetC, m_targetC + kLanes, m_c);
    std::copy(m_targetG, m_targetG + kLanes, m_g);
    m_damping.SetCoefficients(m_c, m_g);
    m_gliding = false;
    m_settled = true;
    m_lines.Clear();
    m_damping.Reset();
    m_out.Reset();
    m_dRows.Clear();
    m_d.Clear();
    m_m.Clear();
}

void zn_reverberant_u15::Process(const float* u, float* const* out, std::size_t frames) noexcept {
    const std::size_t chunkLimit = std::min<std::size_t>(m_lines.Shortest(), m_maxFrames);
    float* outs[kLanes];
    const std::uint32_t channels = m_out.Channels();
    for (std::size_t done = 0; done < frames;) {
        std::size_t n = std::min(frames - done, chunkLimit);
        if (m_gliding) {
            n = std::min<std::size_t>(n, kGlideChunk);
            Glide(n);
        }
        for (std::uint32_t ch = 0; ch < channels; ++ch) outs[ch] = out[ch] + done;
        m_lines.Read(m_dRows.data(), m_maxFrames, n);
        m_out.Process(m_dRows.data(), m_maxFrames, outs, n);
        m_transpose.ToFrames(m_dRowPointers, m_d.data(), n);
        m_mix.Process(m_d.data(), u + done * kLanes, m_m.data(), n);
        m_damping.Process(m_m.data(), m_m.data(), n);
        m_transpose.FromFrames(m_m.data(), m_wRowPointers, n);
        m_lines.Write(m_wRows.data(), m_maxFrames, n);
        done += n;
    }
}

}  // namespace zen::reverb
