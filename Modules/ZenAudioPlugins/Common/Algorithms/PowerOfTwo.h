// Sizes of ring buffers and analysis frames that wrap with a mask.
#pragma once

#include <cstdint>

namespace zen {

// The smallest power of two at or above n (1 for n = 0).
inline std::uint32_t NextPowerOfTwo(std::uint32_t n) {
    std::uint32_t p = 1;
    while (p < n) p *= 2;
    return p;
}

}  // namespace zen
