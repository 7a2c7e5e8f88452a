// A device without hardware: silent inputs, outputs discarded, blocks run
// back to back as fast as the callback allows. Measures processing cost.
#pragma once

#include "AudioDevice.h"
#include "DeviceBuffers.h"

namespace zen::host {

class NullDevice : public AudioDevice {
public:
    explicit NullDevice(const DeviceFormat& format);

    std::string Name() const override { return "null"; }
    std::uint64_t Run(AudioCallback& callback, std::uint64_t frames) override;

protected:
    // One block: clears the buffers and calls the callback.
    void RunBlock(AudioCallback& callback, std::uint32_t frames);

private:
    DeviceBuffers m_inputs;
    DeviceBuffers m_outputs;
};

}  // namespace zen::host
