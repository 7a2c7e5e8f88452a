#include "DeviceBuffers.h"

#include <algorithm>

namespace zen::host {

DeviceBuffers::DeviceBuffers(std::uint32_t channels, std::uint32_t blockSize)
    : m_samples(static_cast<std::size_t>(channels) * blockSize), m_pointers(channels), m_blockSize(blockSize) {
    for (std::uint32_t c = 0; c < channels; ++c)
        m_pointers[c] = m_samples.data() + static_cast<std::size_t>(c) * blockSize;
}

void DeviceBuffers::Clear(std::uint32_t frames) {
    for (float* channel : m_pointers) std::fill(channel, channel + std::min(frames, m_blockSize), 0.0f);
}

}  // namespace zen::host
