// Analysis: reads a frame of every channel from the input history, applies
// the analysis window, centres it on sample 0 of the transform (so phases
// are measured at the frame's centre) and transforms it into FSIG.
//
// With the time-weighted transform on, it also transforms the frames of the
// reconstructed rows (the channels, or their sum for a shared row) weighted
// by the window times the time from the frame's centre, into CFEAT: the
// ratio of the two spectra tells where in the frame each bin's energy sits.
#pragma once

#include "FFT/Plugin.h"

namespace ora::fft {

class In2Dft final : public Plugin {
public:
    In2Dft() : Plugin(plugin::INPUT) {}
    const char* Name() const override { return "In2Dft"; }
    bool Configure(Frame& frame, const Context& context) override;
    void Process(Frame& frame, Context& context) noexcept override;

    // Before Configure.
    void SetTimeWeighted(bool on) { m_timeWeighted = on; }

private:
    // Window times input into the transform layout, centred on sample 0.
    static void Centre(const float* samples, const float* window, float* t, std::size_t n, std::size_t m) noexcept;

    bool m_timeWeighted = false;
    AlignedBuffer<float> m_frame;
    AlignedBuffer<float> m_sum;         // the channels' frames summed, for a shared row
    AlignedBuffer<float> m_timeWindow;  // window times (sample - centre)
    AlignedBuffer<float> m_weighted;    // this frame's time weighting
};

}  // namespace ora::fft
