// Real-time phase-gradient heap integration. Each frame's phases are
// integrated from its strongest coefficients outwards: a coefficient of the
// previous frame passes its phase forward in time (along TGRAD over the
// synthesis hop), a coefficient of this frame passes it to its neighbours
// in frequency (along FGRAD_LEFT/RIGHT), always taking the largest
// magnitude first (to 0.09 dB: see MagnitudeQueue). Coefficients below the
// tolerance (relative to the frame's largest magnitude) keep their analysis
// phase: they are too quiet to matter and integrating them would only
// spread error.
#pragma once

#include <cstdint>
#include <vector>

#include "FFT/Plugin.h"
#include "FFT/Plugins/MagnitudeQueue.h"

namespace ora::fft {

class RtPghi final : public Plugin {
public:
    RtPghi() : Plugin(plugin::PROCESS) {}
    const char* Name() const override { return "RtPghi"; }
    bool Configure(Frame& frame, const Context& context) override;
    void Reset() noexcept override;
    void Process(Frame& frame, Context& context) noexcept override;

    void SetEnabled(bool enabled) { m_enabled = enabled; }
    bool IsEnabled() const { return m_enabled; }
    // Tolerance as a base-10 logarithm relative to the largest magnitude.
    void SetLog10Tolerance(float log10Tol);

private:
    void ProcessRow(std::size_t row, const float* mag, const float* phase, const float* tgrad, const float* left,
                    const float* right, float* psi, double hop) noexcept;

    bool m_enabled = true;
    float m_tolerance = 1e-6f;
    std::size_t m_bins = 0;
    MagnitudeQueue m_queue;  // this frame's coefficients, and the previous frame's
    MagnitudeQueue m_fresh;  // this frame's, for starts where nothing leads in
    std::vector<std::uint8_t> m_done;
    AlignedBuffer<float> m_prevMag;
    std::vector<float> m_prevLargest;  // per row
};

}  // namespace ora::fft
