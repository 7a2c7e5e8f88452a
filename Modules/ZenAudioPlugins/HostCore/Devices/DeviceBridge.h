// Opens the device the "I/O Interface Settings" document describes, at its
// rate, block size and channel counts.
#pragma once

#include <memory>

#include "AudioDevice.h"
#include "HostCore/Settings/Documents/IOInterfaceDocument.h"

namespace zen::host {

class DeviceBridge {
public:
    // Throws HostError when the device cannot be opened (a file it cannot read or write).
    static std::unique_ptr<AudioDevice> Open(const IOInterfaceDocument::Interface& settings);
};

}  // namespace zen::host
