// Peak-locked phase vocoder. The strongest spectral peaks (at most MaxPeak,
// each above 10^Log10Eps of the frame's largest magnitude) advance their
// phase along TGRAD over the synthesis hop; every other bin belongs to the
// peak whose region it lies in (regions meet at the deepest bin between two
// peaks) and takes its phase from the peak's along the frame's frequency
// steps (FGRAD_RIGHT: the analysis phase offsets, with the time of each bin
// stretched), so each partial's main lobe stays coherent.
//
// A peak far louder than its bin was a frame earlier is new: it has no
// history to continue, so it takes its phase from the strongest peak along
// the frequency steps, as the partials of an onset must to stay together.
// Bins below the threshold keep their analysis phase: they are too quiet to
// matter. A frame without peaks takes its phases along the steps from its
// first bin.
#pragma once

#include <cstdint>
#include <vector>

#include "FFT/Plugin.h"

namespace ora::fft {

class Plpv final : public Plugin {
public:
    // Capacity of the peak list: the largest MaxPeak any caller may set.
    static constexpr std::size_t kPeakCapacity = 256;
    // A peak this many times its bin's magnitude in the previous frame (20 dB) is new.
    static constexpr float kNewPeakRise = 10.0f;

    Plpv() : Plugin(plugin::PROCESS) {}
    const char* Name() const override { return "Plpv"; }
    bool Configure(Frame& frame, const Context& context) override;
    void Reset() noexcept override;
    void Process(Frame& frame, Context& context) noexcept override;

    void SetEnabled(bool enabled) { m_enabled = enabled; }
    bool IsEnabled() const { return m_enabled; }
    void SetLog10Threshold(float log10Eps);
    void SetMaxPeaks(std::size_t count);

    // The peaks of the last row processed, by bin (for inspection).
    const std::vector<std::int32_t>& Peaks() const { return m_peaks; }

private:
    std::size_t FindPeaks(const float* mag) noexcept;
    void ProcessRow(const float* mag, const float* phase, const float* tgrad, const float* right, float* psi,
                    float* prevMag, double hop) noexcept;

    bool m_enabled = false;
    float m_threshold = 1e-4f;
    float m_eps = 0.0f;  // the threshold of the row being processed
    std::size_t m_maxPeaks = 50;
    std::size_t m_bins = 0;
    std::vector<std::int32_t> m_candidates;
    AlignedBuffer<float> m_padded;  // a row's magnitudes between two bins of -1 each side
    std::vector<std::int32_t> m_peaks;
    std::vector<float> m_peakPhase;
    std::vector<double> m_steps;    // running sum of the frequency steps of one row
    AlignedBuffer<float> m_prevMag;  // per row
};

}  // namespace ora::fft
