// Magnitude and reconstructed phase (PHASE_START) back to FSIG. With a
// shared row every channel's bin turns by that row's change of phase (its
// reconstructed phase less its analysis phase), so the phase differences
// between channels, and with them the stereo image, come through unchanged.
#pragma once

#include "FFT/Plugin.h"

namespace ora::fft {

class Polar2Rect final : public Plugin {
public:
    Polar2Rect() : Plugin(plugin::PROCESS) {}
    const char* Name() const override { return "Polar2Rect"; }
    bool Configure(Frame& frame, const Context& context) override;
    void Process(Frame& frame, Context& context) noexcept override;

private:
    AlignedBuffer<Complex> m_turn;  // the shared row's unit phasors
};

}  // namespace ora::fft
