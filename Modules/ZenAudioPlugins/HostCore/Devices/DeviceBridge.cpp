#include "DeviceBridge.h"

#include "ClockedNullDevice.h"
#include "FileDevice.h"

namespace zen::host {

std::unique_ptr<AudioDevice> DeviceBridge::Open(const IOInterfaceDocument::Interface& settings) {
    DeviceFormat format;
    format.sampleRate = settings.sampleRate;
    format.blockSize = static_cast<std::uint32_t>(settings.blockSize);
    format.inputs = static_cast<std::uint32_t>(settings.inputs);
    format.outputs = static_cast<std::uint32_t>(settings.outputs);
    switch (settings.device) {
        case IOInterfaceDocument::kNullDevice: return std::make_unique<NullDevice>(format);
        case IOInterfaceDocument::kClockedNullDevice: return std::make_unique<ClockedNullDevice>(format);
        case IOInterfaceDocument::kFileDevice:
            return std::make_unique<FileDevice>(settings.inputFile, settings.outputFile, format);
    }
    return std::make_unique<NullDevice>(format);
}

}  // namespace zen::host
