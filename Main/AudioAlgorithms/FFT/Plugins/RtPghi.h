// Real-time phase-gradient heap integration. Each frame's phases are
// integrated from its strongest coefficients outwards: a coefficient of the
// previous frame passes its phase forward in time (along TGRAD over the
// synthesis hop), a coefficient of this frame passes it to its neighbours
// in frequency (along FGRAD_LEFT/RIGHT), always taking the largest
// magnitude first. Coefficients below the tolerance (relative to the
// frame's largest magnitude) keep their analysis phase: they are too quiet
// to matter and integrating them would only spread error.
#pragma once

#include <cstdint>
#include <vector>

#include "FFT/Plugin.h"

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
    struct Entry {
        float magnitude;
        std::int32_t bin;
        bool previous;  // from the previous frame
    };
    void HeapPush(Entry e) noexcept;
    Entry HeapPop() noexcept;
    void ProcessRow(std::size_t row, const float* mag, const float* phase, const float* tgrad, const float* left,
                    const float* right, float* psi, double hop) noexcept;

    bool m_enabled = true;
    float m_tolerance = 1e-6f;
    std::size_t m_bins = 0;
    std::vector<Entry> m_heap;
    std::size_t m_heapSize = 0;
    std::vector<std::int32_t> m_order;
    std::vector<std::uint8_t> m_done;
    AlignedBuffer<float> m_prevMag;
};

}  // namespace ora::fft
