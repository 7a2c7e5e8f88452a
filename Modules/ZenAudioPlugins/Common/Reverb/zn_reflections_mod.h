// The early-reflection taps with slow modulation: each tap's read position
// moves by depth_k x sin(phase_k) samples, read between neighbouring samples
// by linear interpolation. Tap k's sine runs at (1 + k/32) / period, so the
// taps drift apart and never beat together. At 1 to 1.5 Hz the deepest
// setting the plug-in offers (about 4 samples) bends the pitch by under 1.5
// cents and the default one by a fraction of a cent: a livelier room, not
// vibrato. Depth changes glide; a new set of tap
// delays replaces the old one by a linear cross-fade (a set arriving during a
// fade waits for it to end; only the newest waiting set is kept).
//
// Settled (no fade, depths at their targets), a block runs tap by tap on
// the kernels: the phasors for the whole run, then each tap's interpolated
// reads along time. Frames of a fade or a depth glide run one by one.
#pragma once

#include <cstddef>
#include <cstdint>

#include "Algorithms/LaneTranspose.h"
#include "Algorithms/ModulatedTap.h"
#include "Algorithms/Rotor16.h"
#include "System/AlignedBuffer.h"
#include "zn_reflections.h"
#include "zn_reflections_mod_param.h"

namespace zen::reverb {

class zn_reflections_mod : public zn_reflections {
public:
    using DelayLines = zn_reflections_mod_param::DelayLines;
    // Depth glide, samples per sample.
    static constexpr float kDepthGlide = 1.0f / 4096.0f;

    // Memory for the longest tap and the deepest modulation, in blocks of
    // up to `maxFrames`; the modulation's rates follow `sampleRate`. Allocates.
    void Dimension(std::uint32_t inputs, float sampleRate, std::uint32_t maxFrames = 1024);
    // Delays outside [1, MaxLength] and depths outside [0, MaxDepth] are
    // clamped; a longer length is a programming error (assertion).
    void Configure(const zn_reflections_mod_param& param) noexcept;
    void Reset() noexcept;
    // As zn_reflections::Process.
    void Process(const float* in, std::size_t inStride, float* lanes, std::size_t laneStride,
                 std::size_t frames) noexcept;

    std::uint32_t Delay(std::uint32_t tap) const { return m_next[tap]; }
    float Depth(std::uint32_t tap) const { return m_depth[tap]; }
    bool Fading() const { return m_fade < 1.0f; }

private:
    float Tap(std::uint32_t k, float delay, std::uint32_t position) const noexcept;
    void StartFade() noexcept;
    bool Settled() const noexcept;
    // One frame at `position`, any state.
    void ProcessFrame(std::uint32_t position, float* lanes, std::size_t laneStride) noexcept;
    // `count` settled frames from `position`, which must not wrap.
    void ProcessSettled(std::uint32_t position, float* lanes, std::size_t laneStride, std::size_t count) noexcept;
    void AfterFrames(std::size_t count) noexcept;

    float m_sampleRate = 48000.0f;
    float m_periodMs = 1000.0f;
    float m_fadeStep = 0.001953125f;
    std::uint32_t m_previous[kTaps] = {};  // delays fading out
    std::uint32_t m_next[kTaps] = {};      // delays fading in (or running)
    std::uint32_t m_waiting[kTaps] = {};   // the set after the fade
    bool m_hasWaiting = false;
    float m_fade = 1.0f;  // 0..1, 1 = no fade
    float m_depth[kTaps] = {};
    float m_depthTarget[kTaps] = {};
    // Each tap's sine as a rotating phasor.
    ora::numeric::Rotor16State m_rotor;
    std::uint32_t m_sinceRenormalised = 0;
    bool m_configured = false;

    ora::numeric::Rotor16 m_rotorKernel;
    ora::numeric::LaneTranspose m_transpose;
    ora::numeric::ModulatedTap m_tap;
    ora::AlignedBuffer<float> m_sineFrames;  // 16-lane frames
    ora::AlignedBuffer<float> m_sines;       // per tap, along time
    float* m_sineRows[kTaps] = {};
};

}  // namespace zen::reverb
