#include "NullDevice.h"

#include <algorithm>

namespace zen::host {

NullDevice::NullDevice(const DeviceFormat& format)
    : AudioDevice(format), m_inputs(format.inputs, format.blockSize), m_outputs(format.outputs, format.blockSize) {}

void NullDevice::RunBlock(AudioCallback& callback, std::uint32_t frames) {
    m_inputs.Clear(frames);
    m_outputs.Clear(frames);
    callback.ProcessBlock(m_inputs.ConstPointers(), m_outputs.Pointers(), frames);
}

std::uint64_t NullDevice::Run(AudioCallback& callback, std::uint64_t frames) {
    for (std::uint64_t done = 0; done < frames;) {
        const auto n = static_cast<std::uint32_t>(std::min<std::uint64_t>(m_format.blockSize, frames - done));
        RunBlock(callback, n);
        done += n;
    }
    return frames;
}

}  // namespace zen::host
