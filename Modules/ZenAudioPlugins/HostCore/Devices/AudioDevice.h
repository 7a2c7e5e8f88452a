// The device bridge: where a host's audio comes from and where it goes,
// block by block. A device calls its AudioCallback with the inputs it read
// and output buffers to fill, at its rate and block size.
#pragma once

#include <cstdint>
#include <string>

namespace zen::host {

struct DeviceFormat {
    int sampleRate = 48000;
    std::uint32_t blockSize = 512;
    std::uint32_t inputs = 2;
    std::uint32_t outputs = 2;
};

class AudioCallback {
public:
    virtual ~AudioCallback() = default;
    // inputs[c][i] for c < format.inputs, outputs[c][i] for c < format.outputs,
    // i < frames <= blockSize; outputs arrive zeroed. The device's thread;
    // the real-time rules hold (no allocation, locks or I/O).
    virtual void ProcessBlock(const float* const* inputs, float* const* outputs, std::uint32_t frames) noexcept = 0;
};

class AudioDevice {
public:
    explicit AudioDevice(const DeviceFormat& format);
    virtual ~AudioDevice() = default;
    AudioDevice(const AudioDevice&) = delete;
    AudioDevice& operator=(const AudioDevice&) = delete;

    virtual std::string Name() const = 0;
    const DeviceFormat& Format() const { return m_format; }

    // Drives the callback on the calling thread for `frames` frames (the
    // last block may be shorter) and answers the frames run. Throws
    // HostError when the device fails.
    virtual std::uint64_t Run(AudioCallback& callback, std::uint64_t frames) = 0;

protected:
    DeviceFormat m_format;
};

}  // namespace zen::host
