// Lanes of two second-order sections in series, each lane with its own
// coefficients, state and buffer, in double precision, per sample:
//   w = g x + c0 w2 + c1 w1;  y = w + c2 w2 + c3 w1;  w2 = w1;  w1 = (w + 1e-18) - 1e-18
// The first section's output is rounded to float on its way into the
// second, as in BiquadPair. Filter banks whose lanes differ (the low and high
// halves of a crossover, its all-pass corrections) run side by side: the
// vector forms take two or four lanes at a time. No fused forms, so every
// form gives the reference result bit for bit.
#pragma once

#include <cstddef>

#include "Algorithms/simd/BiquadLanesKernels.h"
#include "System/DispatchSettings.h"

namespace ora::numeric {

class BiquadLanes {
public:
    BiquadLanes();

    // Each of `laneCount` lanes over `count` samples of its own buffer, in
    // place. No two lanes may share a buffer.
    void Process(BiquadLane* const* lanes, float* const* buffers, std::size_t laneCount,
                 std::size_t count) const noexcept {
        m_kernel(lanes, buffers, laneCount, count);
    }

    system::KernelForm GetForm() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }

private:
    system::KernelForm m_form;
    kernels::BiquadLanesKernel m_kernel;
};

}  // namespace ora::numeric
