// "I/O Interface Settings": the device bridge's device, rate, block size and
// channel counts, and the routing of device inputs to studio channels and of
// bus channels to device outputs.
#pragma once

#include <cstddef>

#include "HostCore/Settings/SettingsDocument.h"

namespace zen::host {

class IOInterfaceDocument {
public:
    static constexpr std::size_t kMaximumChannels = 32;

    enum Section : std::size_t { kDeviceSection, kInputSection, kOutputSection };
    enum DeviceField : std::size_t { kDevice, kSampleRate, kBlockSize, kInputs, kOutputs, kInputFile, kOutputFile };
    enum Device : int { kNullDevice, kClockedNullDevice, kFileDevice };
    enum InputField : std::size_t { kInputChannel };    // studio channel, 0 = not routed
    enum OutputField : std::size_t { kOutputSource };   // bus channel, 0 = silent

    static const DocumentSchema& Schema();
};

}  // namespace zen::host
