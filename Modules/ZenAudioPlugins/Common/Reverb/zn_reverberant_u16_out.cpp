#include "zn_reverberant_u16_out.h"

#include <algorithm>

namespace zen::reverb {

void zn_reverberant_u16_out::Dimension(std::uint32_t channels, std::uint32_t maxFrames) {
    m_matrix.Dimension(kLanes, std::min(channels, kLanes));
    m_tone.Reset();
    m_maxFrames = std::max(maxFrames, 1u);
    m_rows.Resize(kLanes * m_maxFrames);
    m_frames.Resize(kLanes * m_maxFrames);
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
    // Only the channels' lanes move; the others hold 0 throughout.
    float* lanes = m_frames.data();
    for (std::uint32_t ch = 0; ch < Channels(); ++ch) {
        const float* row = m_rows.data() + ch * m_maxFrames;
        for (std::size_t f = 0; f < frames; ++f) lanes[f * kLanes + ch] = row[f];
    }
    m_tone.Process(lanes, lanes, frames);
    for (std::uint32_t ch = 0; ch < Channels(); ++ch)
        for (std::size_t f = 0; f < frames; ++f) out[ch][f] = lanes[f * kLanes + ch];
}

}  // namespace zen::reverb
