#include "Support/NoiseSource.h"

#include <algorithm>

namespace zenbench {

NoiseSource::NoiseSource(std::uint32_t channels, std::size_t blockLength)
    : source(channels, std::vector<float>(static_cast<std::size_t>(kSampleRate))),
      work(channels, std::vector<float>(blockLength)),
      block(blockLength) {
    std::uint32_t seed = 12345;
    for (auto& channel : source)
        for (float& v : channel) {
            seed = seed * 1664525u + 1013904223u;
            v = static_cast<float>(seed) / 2147483648.0f - 1.0f;
        }
    for (auto& channel : work) pointers.push_back(channel.data());
}

float* const* NoiseSource::Next() {
    for (std::size_t c = 0; c < work.size(); ++c)
        std::copy_n(source[c].begin() + static_cast<std::ptrdiff_t>(position), block, work[c].begin());
    position = (position + block) % (source[0].size() - block);
    return pointers.data();
}

}  // namespace zenbench
