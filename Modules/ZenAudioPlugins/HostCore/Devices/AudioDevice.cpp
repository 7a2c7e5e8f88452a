#include "AudioDevice.h"

#include "HostCore/HostError.h"

namespace zen::host {

namespace {

constexpr int kMinimumRate = 8000;
constexpr int kMaximumRate = 384000;
constexpr std::uint32_t kMaximumBlock = 1u << 20;
constexpr std::uint32_t kMaximumChannels = 256;

}  // namespace

AudioDevice::AudioDevice(const DeviceFormat& format) : m_format(format) {
    if (format.sampleRate < kMinimumRate || format.sampleRate > kMaximumRate)
        throw HostError("a device cannot run at " + std::to_string(format.sampleRate) + " Hz");
    if (format.blockSize < 1 || format.blockSize > kMaximumBlock)
        throw HostError("a device cannot run blocks of " + std::to_string(format.blockSize) + " frames");
    if (format.inputs > kMaximumChannels || format.outputs > kMaximumChannels)
        throw HostError("a device has at most " + std::to_string(kMaximumChannels) + " channels each way");
}

}  // namespace zen::host
