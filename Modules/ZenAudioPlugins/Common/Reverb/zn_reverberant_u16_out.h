// Output stage of the late reverberation: the 16 delay outputs through the
// late gain matrix (channels x 16, gliding like every zn_matrixing) to one
// lane per channel, then each channel's tone correction, a one-pole low-pass
// of unit DC gain whose gain at Nyquist is (1 - t) / (1 + t) = alpha: the
// tail's onset is as much darker as its highs decay faster.
#pragma once

#include <cstddef>
#include <cstdint>

#include "Algorithms/Lpfm16.h"
#include "zn_matrixing.h"
#include "zn_reverberant_u16_out_param.h"

namespace zen::reverb {

class zn_reverberant_u16_out {
public:
    static constexpr std::uint32_t kLanes = zn_reverberant_u16_out_param::kLanes;
    // t = 1 would hold the filter still; it stops just short.
    static constexpr float kMaxTone = 0.9999f;

    // At most 16 channels. Allocates.
    void Dimension(std::uint32_t channels);
    void Configure(const zn_reverberant_u16_out_param& param) noexcept;
    void Reset() noexcept;

    // `frames` 16-lane frames d to 16-lane frames with channel ch in lane ch
    // (lanes past the channel count are 0).
    void Process(const float* d, float* out, std::size_t frames) noexcept;

    std::uint32_t Channels() const { return m_matrix.Outputs(); }
    const ora::numeric::Lpfm16& Tone() const { return m_tone; }

private:
    zn_matrixing m_matrix;
    ora::numeric::Lpfm16 m_tone;
};

}  // namespace zen::reverb
