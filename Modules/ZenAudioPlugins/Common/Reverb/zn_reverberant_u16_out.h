// Output stage of the late reverberation: the 16 delay outputs through the
// late gain matrix (channels x 16, gliding like every zn_matrixing) to one
// signal per channel, then each channel's tone correction, a one-pole
// low-pass of unit DC gain whose gain at Nyquist is (1 - t) / (1 + t) =
// alpha: the tail's onset is as much darker as its highs decay faster. The
// matrix runs along time; the tone correction runs across channels, one
// 16-lane frame (channel ch in lane ch) at a time.
#pragma once

#include <cstddef>
#include <cstdint>

#include "Algorithms/Lpfm16.h"
#include "System/AlignedBuffer.h"
#include "zn_matrixing.h"
#include "zn_reverberant_u16_out_param.h"

namespace zen::reverb {

class zn_reverberant_u16_out {
public:
    static constexpr std::uint32_t kLanes = zn_reverberant_u16_out_param::kLanes;
    // t = 1 would hold the filter still; it stops just short.
    static constexpr float kMaxTone = 0.9999f;

    // At most 16 channels, blocks of up to `maxFrames`. Allocates.
    void Dimension(std::uint32_t channels, std::uint32_t maxFrames);
    void Configure(const zn_reverberant_u16_out_param& param) noexcept;
    void Reset() noexcept;

    // `frames` frames of the 16 delay outputs (lane i at d + i * stride) to
    // one buffer per channel.
    void Process(const float* d, std::size_t stride, float* const* out, std::size_t frames) noexcept;

    std::uint32_t Channels() const { return m_matrix.Outputs(); }
    const ora::numeric::Lpfm16& Tone() const { return m_tone; }

private:
    zn_matrixing m_matrix;
    ora::numeric::Lpfm16 m_tone;
    ora::AlignedBuffer<float> m_rows;    // per channel
    ora::AlignedBuffer<float> m_frames;  // 16-lane frames; lanes past the channels stay 0
    std::size_t m_maxFrames = 0;
};

}  // namespace zen::reverb
