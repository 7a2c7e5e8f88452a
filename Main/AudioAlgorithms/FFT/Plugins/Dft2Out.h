// Synthesis: inverse-transforms FSIG, undoes the centring, applies the dual
// window and the engine's gain and overlap-adds every channel's frame into
// its output accumulator.
#pragma once

#include "FFT/Plugin.h"

namespace ora::fft {

class Dft2Out final : public Plugin {
public:
    Dft2Out() : Plugin(plugin::OUTPUT) {}
    const char* Name() const override { return "Dft2Out"; }
    bool Configure(Frame& frame, const Context& context) override;
    void Process(Frame& frame, Context& context) noexcept override;
};

}  // namespace ora::fft
