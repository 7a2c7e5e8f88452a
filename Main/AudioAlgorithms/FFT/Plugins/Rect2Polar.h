// FSIG to magnitude (SFEAT), squared magnitude (MAG2) and phase (PHASE_IN)
// per channel. With a shared row, that row describes all channels together:
// its magnitude is their total, its phase that of their sum (of the first
// channel where the sum cancels).
#pragma once

#include "FFT/Plugin.h"

namespace ora::fft {

class Rect2Polar final : public Plugin {
public:
    Rect2Polar() : Plugin(plugin::PROCESS) {}
    const char* Name() const override { return "Rect2Polar"; }
    bool Configure(Frame& frame, const Context& context) override;
    void Process(Frame& frame, Context& context) noexcept override;
};

}  // namespace ora::fft
