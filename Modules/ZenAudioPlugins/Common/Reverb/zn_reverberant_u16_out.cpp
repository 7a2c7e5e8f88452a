#include "zn_reverberant_u16_out.h"

#include <algorithm>

namespace zen::reverb {

void zn_reverberant_u16_out::Dimension(std::uint32_t channels) {
    m_matrix.Dimension(kLanes, std::min(channels, kLanes));
    m_tone.Reset();
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

void zn_reverberant_u16_out::Process(const float* d, float* out, std::size_t frames) noexcept {
    if (Channels() < kLanes)
        for (std::size_t f = 0; f < frames; ++f) std::fill(out + f * kLanes + Channels(), out + (f + 1) * kLanes, 0.0f);
    m_matrix.Process(d, kLanes, 1, out, kLanes, 1, frames);
    m_tone.Process(out, out, frames);
}

}  // namespace zen::reverb
