// Phase derivatives of every reconstructed row, for the phase
// reconstructions that follow:
//   TGRAD        time derivative (instantaneous frequency, rad/sample) to
//                advance a bin's phase from the previous frame to this one;
//   FGRAD_RIGHT  phase step from bin k to k + 1 (rad), FGRAD_LEFT from k - 1
//                to k, FGRAD their mean;
//   MAG_LOG      the natural log of the magnitude.
// Two estimates:
//   PG  from magnitudes alone, through the relations that hold for a
//       Gaussian window (the Hann window is treated as the Gaussian of
//       lambda = 0.25645 N^2): needs no trustworthy phase history, so it
//       copes with onsets and non-stationary frames;
//   PV  from analysis phase differences, between frames for TGRAD and
//       between bins for the frequency steps: exact for steady partials.
// "Auto" takes its frequency steps from this frame's phases (they need no
// history) and its time derivative from the phase history, except where
// more than a quarter of the frame's energy is new (positive spectral flux
// against the previous frame: onsets, noise), where the previous frame's
// phases say nothing about this one and the magnitudes are used. When the
// analysis hop equals the synthesis hop nothing is stretched and PV gives
// back the input exactly, so "Auto" stays with PV.
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
    bool UsePg(std::size_t row, const float* mag2, std::size_t analysisHop, std::size_t synthesisHop) const noexcept;

    Mode m_mode = Mode::Auto;
    std::size_t m_bins = 0;
    AlignedBuffer<float> m_prevLog;
    AlignedBuffer<float> m_prevPhase;
    AlignedBuffer<float> m_prevMag2;
    AlignedBuffer<float> m_prevPgTgrad;
    AlignedBuffer<float> m_fgrad;  // PG frequency derivative of one row
    std::vector<std::uint8_t> m_hasPrev;
};

}  // namespace ora::fft
