// Phase derivatives of every reconstructed row, for the phase
// reconstructions that follow:
//   TGRAD        time derivative (instantaneous frequency, rad/sample) to
//                advance a bin's phase from the previous frame to this one;
//   FGRAD_RIGHT  phase step from bin k to k + 1 (rad), FGRAD_LEFT from k - 1
//                to k;
//   MAG_LOG      the natural log of the magnitude.
// The time derivative has two estimates:
//   PG  from magnitudes alone, through the relation that holds for a
//       Gaussian window (the Hann window is treated as the Gaussian of
//       lambda = 0.25645 N^2): needs no trustworthy phase history, so it
//       copes with onsets and non-stationary frames;
//   PV  from analysis phase differences between frames: exact for steady
//       partials.
// "Auto" takes the phase history, except where more than a quarter of the
// frame's energy is new (positive spectral flux against the previous frame:
// onsets, noise), where the previous frame's phases say nothing about this
// one and the magnitudes are used. When the analysis hop equals the
// synthesis hop nothing is stretched and PV gives back the input exactly,
// so "Auto" stays with PV.
//
// The frequency steps need no history: they are this frame's own phase
// differences, with the time at which each bin's energy sits in the frame
// (from In2Dft's time-weighted transform) moved to where that time belongs
// in the synthesis (the context's time map, or the stretch times it): an
// event a time d from an analysis centre belongs a stretch times d from the
// synthesis centre, or it would land off its place in the stretched stream
// by the share of d the stretch adds or removes. Phase steps of pi between
// side lobes carry no time and stay as they are.
// MASK holds one bit per row: set when that row's time derivative came from
// the magnitudes in this frame.
#pragma once

#include <cstdint>
#include <vector>

#include "FFT/Plugin.h"

namespace ora::fft {

class PhaseGrad final : public Plugin {
public:
    enum class Mode : int { PG = 0, PV = 1, Auto = 2 };
    // Share of the frame's energy that must be new for "Auto" to take PG.
    static constexpr double kOnsetShare = 0.25;
    // Variance of the Gaussian the Hann window stands for, in N^2 / (2 pi).
    static constexpr double kHannLambda = 0.25645;

    PhaseGrad() : Plugin(plugin::PROCESS) {}
    const char* Name() const override { return "PhaseGrad"; }
    bool Configure(Frame& frame, const Context& context) override;
    void Reset() noexcept override;
    void Process(Frame& frame, Context& context) noexcept override;

    void SetMode(Mode mode) { m_mode = mode; }
    Mode GetMode() const { return m_mode; }

private:
    bool UsePg(std::size_t row, const float* mag2, const Context& context) const noexcept;
    // Per bin: how far the time its energy sits at from the frame's centre
    // moves in the synthesis (the shift the frequency steps add), and the
    // trust in it (the magnitude; 0 for bins too weak to tell).
    void StretchShift(const Frame& frame, const Context& context, std::size_t row, float* shift,
                      float* weight) noexcept;

    Mode m_mode = Mode::Auto;
    std::size_t m_bins = 0;
    AlignedBuffer<float> m_prevPhase;
    AlignedBuffer<float> m_prevMag2;
    AlignedBuffer<float> m_prevPgTgrad;
    AlignedBuffer<float> m_shift;  // of one row
    AlignedBuffer<float> m_weight;  // of one row
    AlignedBuffer<float> m_pgNow;   // of one row
    AlignedBuffer<float> m_advance;  // a steady partial's phase advance over the hop, per bin
    std::vector<std::uint8_t> m_hasPrev;
};

}  // namespace ora::fft
