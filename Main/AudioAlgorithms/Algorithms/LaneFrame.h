// The 16-float lane frame that the reverb's delay network and its kernels
// work on: one float per delay line (or per output channel), 64 bytes, so a
// frame is four 128-bit or two 256-bit vectors.
#pragma once

#include <cstddef>

namespace ora::numeric {

constexpr std::size_t kLaneCount = 16;

// Added to and taken from recursive state: values that would turn denormal vanish.
constexpr float kDenormalGuard = 1e-18f;

}  // namespace ora::numeric
