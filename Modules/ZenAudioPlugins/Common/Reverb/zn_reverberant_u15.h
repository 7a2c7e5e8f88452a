// The late reverberation: 15 delay lines tuned to the room's modes, mixed
// every sample by the orthogonal U15 matrix and damped per line, read out
// through the output stage. Runs in chunks no longer than the shortest line,
// so that every read of a chunk precedes the writes that replace it:
//   d = lines' outputs;  out = stage(d);  m = U (d + u);  w = damp(m);  lines <- w.
// Lines and the output stage work along time (one row per lane), the mixing
// and damping kernels across lanes (16-lane frames); the chunk is transposed
// between the two.
#pragma once

#include <cstddef>
#include <cstdint>

#include "Algorithms/LaneTranspose.h"
#include "Algorithms/Lpf16.h"
#include "Algorithms/U15p.h"
#include "System/AlignedBuffer.h"
#include "zn_delaylines.h"
#include "zn_reverberant_u15_param.h"
#include "zn_reverberant_u16_out.h"

namespace zen::reverb {

class zn_reverberant_u15 {
public:
    static constexpr std::uint32_t kLanes = zn_reverberant_u15_core_param::kLanes;
    static constexpr std::uint32_t kLines = zn_reverberant_u15_core_param::kLines;
    // New gains and damping glide in (a one-pole over about 10 ms, stepped
    // every kGlideChunk frames), so a change of decay never steps the lines'
    // output.
    static constexpr double kGlideSeconds = 0.01;
    static constexpr std::uint32_t kGlideChunk = 32;

    // Lines able to hold `maxLength` samples, `channels` outputs (at most 16)
    // and chunks of up to `maxFrames`. Allocates.
    void Dimension(std::uint32_t channels, std::uint32_t maxLength, std::uint32_t maxFrames, float sampleRate);
    // Gains, damping and the output stage; the first settings after
    // Dimension or Reset apply at once, later ones glide. New lengths (when
    // `withLengths`) clear the lines: owners fade the output around that.
    // Lengths beyond the dimensioned ones grow the lines (this allocates).
    void Configure(const zn_reverberant_u15_param& param, bool withLengths = true);
    bool LengthsDiffer(const zn_reverberant_u15_core_param& core) const;
    void Reset() noexcept;

    // `frames` 16-lane input frames u to one output buffer per channel.
    void Process(const float* u, float* const* out, std::size_t frames) noexcept;

    const zn_delaylines& Lines() const { return m_lines; }
    const ora::numeric::Lpf16& Damping() const { return m_damping; }

private:
    zn_delaylines m_lines;
    ora::numeric::U15p m_mix;
    ora::numeric::Lpf16 m_damping;
    zn_reverberant_u16_out m_out;
    ora::numeric::LaneTranspose m_transpose;
    ora::AlignedBuffer<float> m_dRows;  // delay outputs per lane, lane 15 = 0
    ora::AlignedBuffer<float> m_wRows;  // damped, per lane (lane 15 unused)
    ora::AlignedBuffer<float> m_d;      // delay outputs as frames
    ora::AlignedBuffer<float> m_m;      // mixed, then damped
    const float* m_dRowPointers[kLanes] = {};
    float* m_wRowPointers[kLanes] = {};
    void Glide(std::size_t frames) noexcept;

    std::uint32_t m_maxFrames = 0;
    float m_c[kLanes] = {}, m_g[kLanes] = {};  // running
    float m_targetC[kLanes] = {}, m_targetG[kLanes] = {};
    bool m_gliding = false;
    bool m_settled = true;  // the next settings apply at once
    double m_glideFrames = 480.0;
};

}  // namespace zen::reverb
