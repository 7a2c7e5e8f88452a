// "I/O Interface Settings": the device bridge's device, rate, block size and
// channel counts, and the routing of device inputs to studio channels and of
// bus channels to device outputs.
#pragma once

#include <array>
#include <cstddef>
#include <string>

#include "HostCore/Settings/SettingsDocument.h"

namespace zen::host {

class IOInterfaceDocument {
public:
    static constexpr std::size_t kMaximumChannels = 32;

    enum Section : std::size_t { kDeviceSection, kInputSection, kOutputSection };
    enum DeviceField : std::size_t { kDevice, kSampleRate, kBlockSize, kInputs, kOutputs, kInputFile, kOutputFile };
    enum Device : int { kNullDevice, kClockedNullDevice, kFileDevice };
    enum InputField : std::size_t { kInputChannel };   // studio channel, 0 = not routed
    enum OutputField : std::size_t { kOutputSource };  // bus channel, 0 = silent

    struct Interface {
        Device device = kClockedNullDevice;
        int sampleRate = 48000;
        int blockSize = 512;
        int inputs = 2;
        int outputs = 2;
        std::string inputFile;
        std::string outputFile;
        std::array<int, kMaximumChannels> inputRouting{};   // device input -> studio channel, 0 = none
        std::array<int, kMaximumChannels> outputRouting{};  // device output <- bus channel, 0 = silent
    };

    static const DocumentSchema& Schema();
    static Interface Read(const SettingsDocument& document);
};

}  // namespace zen::host
