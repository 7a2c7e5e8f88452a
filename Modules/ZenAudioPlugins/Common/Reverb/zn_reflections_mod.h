// The early-reflection taps with slow modulation: each tap's read position
// moves by depth_k x sin(phase_k) samples, read between neighbouring samples
// by linear interpolation. Tap k's sine runs at (1 + k/32) / period, so the
// taps drift apart and never beat together. At 1 to 1.5 Hz the deepest
// setting the plug-in offers (about 4 samples) bends the pitch by under 1.5
// cents and the default one by a fraction of a cent: a livelier room, not
// vibrato. Depth changes glide; a new set of tap
// delays replaces the old one by a linear cross-fade (a set arriving during a
// fade waits for it to end; only the newest waiting set is kept).
#pragma once

#include <cstddef>
#include <cstdint>

#include "zn_reflections.h"
#include "zn_reflections_mod_param.h"

namespace zen::reverb {

class zn_reflections_mod : public zn_reflections {
public:
    using DelayLines = zn_reflections_mod_param::DelayLines;
    // Depth glide, samples per sample.
    static constexpr float kDepthGlide = 1.0f / 4096.0f;

    // Memory for the longest tap and the deepest modulation; the
    // modulation's rates follow `sampleRate`. Allocates.
    void Dimension(std::uint32_t inputs, float sampleRate);
    // Delays outside [1, MaxLength] and depths outside [0, MaxDepth] are
    // clamped; a longer length is a programming error (assertion).
    void Configure(const zn_reflections_mod_param& param) noexcept;
    void Reset() noexcept;
    void Process(const float* in, float* lanes, std::size_t frames) noexcept;

    std::uint32_t Delay(std::uint32_t tap) const { return m_next[tap]; }
    float Depth(std::uint32_t tap) const { return m_depth[tap]; }
    bool Fading() const { return m_fade < 1.0f; }

private:
    float Tap(std::uint32_t k, float delay) const noexcept;
    void StartFade() noexcept;

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
    float m_cos[kTaps] = {}, m_sin[kTaps] = {};
    float m_rotCos[kTaps] = {}, m_rotSin[kTaps] = {};
    std::uint32_t m_sinceRenormalised = 0;
    bool m_configured = false;
};

}  // namespace zen::reverb
