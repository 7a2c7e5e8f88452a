// Analysis: reads a frame of every channel from the input history, applies
// the analysis window, centres it on sample 0 of the transform (so phases
// are measured at the frame's centre) and transforms it into FSIG.
#pragma once

#include "FFT/Plugin.h"

namespace ora::fft {

class In2Dft final : public Plugin {
public:
    In2Dft() : Plugin(plugin::INPUT) {}
    const char* Name() const override { return "In2Dft"; }
    bool Configure(Frame& frame, const Context& context) override;
    void Process(Frame& frame, Context& context) noexcept override;

private:
    AlignedBuffer<float> m_frame;
};

}  // namespace ora::fft
