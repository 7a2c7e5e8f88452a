// Two second-order sections in series on each of several lanes (channels),
// one set of coefficients per section shared by every lane, in double
// precision, per sample and lane:
//   w = g x + c0 w2 + c1 w1;  y = w + c2 w2 + c3 w1;  w2 = w1;  w1 = (w + 1e-18) - 1e-18
// The first section's output is rounded to float on its way into the second,
// as if each section ran over the block on its own. The lanes run through
// the BiquadLanes kernels (its forms, bit for bit the reference result),
// each lane given the shared sections.
#pragma once

#include <cstddef>

#include "Algorithms/BiquadLanes.h"
#include "Algorithms/simd/BiquadPairKernels.h"

namespace ora::numeric {

class BiquadPair {
public:
    // `sections[0]` then `sections[1]` over `count` samples of each of
    // `laneCount` (at most BiquadPairState::kMaxLanes) buffers, in place.
    void Process(const BiquadSection* sections, BiquadPairState& state, float* const* lanes, std::size_t laneCount,
                 std::size_t count) const noexcept;

    system::KernelForm GetForm() const { return m_lanes.GetForm(); }
    const char* FormName() const { return m_lanes.FormName(); }

private:
    BiquadLanes m_lanes;
};

}  // namespace ora::numeric
