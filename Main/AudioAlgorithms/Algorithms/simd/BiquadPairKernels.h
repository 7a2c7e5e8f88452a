// The second-order section and the lane states shared by BiquadPair and
// BiquadLanes. Free of intrinsics.
#pragma once

#include <cstddef>

namespace ora::numeric {

// Direct form II with the numerator normalised to b0.
struct BiquadSection {
    double c0 = 0.0;  // -a2/a0
    double c1 = 0.0;  // -a1/a0
    double c2 = 0.0;  // b2/b0
    double c3 = 0.0;  // b1/b0
    double g = 1.0;   // b0/a0
};

struct BiquadPairState {
    static constexpr std::size_t kMaxLanes = 16;
    double w1[2][kMaxLanes] = {};  // [section][lane], newest
    double w2[2][kMaxLanes] = {};
};

}  // namespace ora::numeric
