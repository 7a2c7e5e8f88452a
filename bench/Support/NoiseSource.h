// A second of full-scale noise per channel, walked block by block so that
// the input keeps changing: what the algorithm benchmarks process.
#pragma once

#include <cstdint>
#include <vector>

#include "Support/Realtime.h"

namespace zenbench {

struct NoiseSource {
    explicit NoiseSource(std::uint32_t channels, std::size_t block = kBlock);
    // The next block, in buffers the caller may change.
    float* const* Next();

    std::vector<std::vector<float>> source, work;
    std::vector<float*> pointers;
    std::size_t block;
    std::size_t position = 0;
};

}  // namespace zenbench
