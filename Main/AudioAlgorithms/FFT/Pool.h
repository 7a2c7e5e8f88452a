// The vectors a frame's variables live in. Every vector is taken from the
// pool when a pipeline is configured and given back when its frame is
// cleared, so processing frames never allocates.
#pragma once

#include <array>
#include <cstddef>

#include "System/AlignedBuffer.h"

namespace ora::fft {

class Pool {
public:
    static constexpr std::size_t kCapacity = 256;

    Pool() = default;
    // Traces "~Pool(): all vectors freed" or "some vectors not freed".
    ~Pool();
    Pool(const Pool&) = delete;
    Pool& operator=(const Pool&) = delete;

    // A zeroed, aligned vector of `floats` elements; null when the pool is
    // full or memory runs out.
    float* Allocate(std::size_t floats);
    // False for a pointer the pool did not hand out (or already took back).
    bool Free(float* vector);

    std::size_t InUse() const { return m_inUse; }

private:
    std::array<AlignedBuffer<float>, kCapacity> m_vectors;
    std::array<bool, kCapacity> m_taken{};
    std::size_t m_inUse = 0;
};

}  // namespace ora::fft
