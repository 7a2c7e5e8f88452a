// Two second-order sections in series on each of several lanes (channels),
// one set of coefficients per section shared by every lane, in double
// precision, per sample and lane:
//   w = g x + c0 w2 + c1 w1;  y = w + c2 w2 + c3 w1;  w2 = w1;  w1 = (w + 1e-18) - 1e-18
// The first section's output is rounded to float on its way into the second,
// as if each section ran over the block on its own. The vector forms run
// lanes side by side (two or four doubles); no fused forms, so every form
// gives the reference result bit for bit.
#pragma once

#include <cstddef>

#include "Algorithms/simd/BiquadPairKernels.h"
#include "System/DispatchSettings.h"

namespace ora::numeric {

class BiquadPair {
public:
    BiquadPair();

    // `sections[0]` then `sections[1]` over `count` samples of each of
    // `laneCount` (at most BiquadPairState::kMaxLanes) buffers, in place.
    void Process(const BiquadSection* sections, BiquadPairState& state, float* const* lanes, std::size_t laneCount,
                 std::size_t count) const noexcept {
        m_kernel(sections, state, lanes, laneCount, count);
    }

    system::KernelForm GetForm() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }

private:
    system::KernelForm m_form;
    kernels::BiquadPairKernel m_kernel;
};

}  // namespace ora::numeric
