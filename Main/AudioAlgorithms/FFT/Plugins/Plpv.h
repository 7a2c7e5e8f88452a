// Peak-locked phase vocoder. The strongest spectral peaks (at most MaxPeak,
// each above 10^Log10Eps of the frame's largest magnitude) advance their
// phase along TGRAD over the synthesis hop; every other bin belongs to the
// peak whose region it lies in (regions meet at the deepest bin between two
// peaks) and keeps its analysis phase offset from that peak, so each
// partial's main lobe stays coherent. Bins below the threshold (all bins
// of a frame without peaks) keep their analysis phase: they are too quiet to
// matter, and a bin that rises from silence then starts coherent with its
// neighbours instead of with whatever phase it drifted to.
#pragma once

#include <cstdint>
#include <vector>

#include "FFT/Plugin.h"

namespace ora::fft {

class Plpv final : public Plugin {
public:
    // Capacity of the peak list: the largest MaxPeak any caller may set.
    static constexpr std::size_t kPeakCapacity = 256;

    Plpv() : Plugin(plugin::PROCESS) {}
    const char* Name() const override { return "Plpv"; }
    bool Configure(Frame& frame, const Context& context) override;
    void Process(Frame& frame, Context& context) noexcept override;

    void SetEnabled(bool enabled) { m_enabled = enabled; }
    bool IsEnabled() const { return m_enabled; }
    void SetLog10Threshold(float log10Eps);
    void SetMaxPeaks(std::size_t count);

    // The peaks of the last row processed, by bin (for inspection).
    const std::vector<std::int32_t>& Peaks() const { return m_peaks; }

private:
    std::size_t FindPeaks(const float* mag) noexcept;
    void ProcessRow(const float* mag, const float* phase, const float* tgrad, float* psi, double hop) noexcept;

    bool m_enabled = false;
    float m_threshold = 1e-4f;
    float m_eps = 0.0f;  // the threshold of the row being processed
    std::size_t m_maxPeaks = 50;
    std::size_t m_bins = 0;
    std::vector<std::int32_t> m_candidates;
    std::vector<std::int32_t> m_peaks;
    std::vector<float> m_peakPhase;
};

}  // namespace ora::fft
