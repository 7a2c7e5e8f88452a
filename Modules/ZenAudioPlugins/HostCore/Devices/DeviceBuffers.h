// The per-channel blocks a device hands its callback, allocated once.
#pragma once

#include <cstdint>
#include <vector>

namespace zen::host {

class DeviceBuffers {
public:
    DeviceBuffers(std::uint32_t channels, std::uint32_t blockSize);

    float* const* Pointers() { return m_pointers.data(); }
    const float* const* ConstPointers() const { return m_pointers.data(); }
    float* Channel(std::uint32_t channel) { return m_pointers[channel]; }
    std::uint32_t Channels() const { return static_cast<std::uint32_t>(m_pointers.size()); }
    void Clear(std::uint32_t frames);

private:
    std::vector<float> m_samples;
    std::vector<float*> m_pointers;
    std::uint32_t m_blockSize;
};

}  // namespace zen::host
