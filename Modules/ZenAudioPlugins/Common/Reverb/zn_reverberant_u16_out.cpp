#include "zn_reverberant_u16_out.h"

#include <algorithm>

namespace zen::reverb {

void zn_reverberant_u16_out::Dimension(std::uint32_t channels, std::uint32_t maxFrames) {
    m_matrix.Dimension(kLanes, std::min(channels, kLanes));
    m_tone.Reset();
    m_maxFrames = std::max(maxFrames, 1u);
    m_rows.Resize(kLanes * m_maxFrames);
    m_frames.Resize(kLanes * m_maxFrames);
    m_unused.Resize(m_maxFrames);
    for (std::uint32_t k = 0; k < kLanes; ++k) m_rowPointers[k] = m_rows.data() + k * m_maxFrames;
}

void zn_reverberant_u16_out::Configure(const zn_reverberant_u16_out_param& param) noexcept {
    m_matrix.Configure(param.gains);
    float c[kLanes] = {};
    for (std::uint32_t ch = 0; ch < Channels() && ch < param.tone.size(); ++ch)
        c[ch] = -std::clamp(param.tone(ch), 0.0f, kMaxTone);
    m_tone.SetCoefficients(c);
}

void zn_reverberant_u16_out::Reset() noexcept {
    m_matrix.Reset();
    m_tone.Reset();
}

void zn_reverberant_u16_out::Process(const float* d, std::size_t stride, float* const* out,
                                     std::size_t frames) noexcept {
    m_matrix.Process(d, 1, stride, m_rows.data(), 1, m_maxFrames, frames);
    m_transpose.ToFrames(m_rowPointers, m_frames.data(), frames);
    m_tone.Process(m_frames.data(), m_frames.data(), frames);
    float* rows[kLanes];
    for (std::uint32_t k = 0; k < kLanes; ++k) rows[k] = k < Channels() ? out[k] : m_unused.data();
    m_transpose.FromFrames(m_frames.data(), rows, frames);
}

}  // namespace zen::reverb
